#include "tool/IndexShowCommand.h"

#include <algorithm>
#include <array>
#include <utility>
#include <vector>

#include "platform/Location.h"
#include "tool/AttributeText.h"
#include "tool/Faults.h"
#include "tool/JsonText.h"
#include "tool/SafeText.h"
#include "tool/Volumes.h"

namespace norvex {
namespace {

// The attributes that every item or every volume's root has, in the order in which they are shown.
constexpr std::array<std::string_view, 9> kFixedAttributes{kMDItemPath,
                                                           "kMDItemFSName",
                                                           "kMDItemFSSize",
                                                           "kMDItemFSContentChangeDate",
                                                           "kMDItemContentType",
                                                           "kMDItemContentTypeTree",
                                                           "kMDItemKind",
                                                           kMDStoreLastHealthCheck,
                                                           kMDStoreAccumulatedSizes};

using Attributes = std::vector<std::pair<std::string, MetadataValue>>;

Result<Attributes> attributesOf(StoreReader& store, std::int64_t item) {
  std::vector<std::string> names(kFixedAttributes.begin(), kFixedAttributes.end());
  auto carried = store.carriedAttributes(item);
  if (!carried) return carried.error();
  names.insert(names.end(), carried.value().begin(), carried.value().end());
  Attributes attributes;
  for (std::string& name : names) {
    auto value = store.attribute(item, name);
    if (!value) return value.error();
    if (value.value()) attributes.emplace_back(std::move(name), std::move(*value.value()));
  }
  return attributes;
}

void writeText(ToolWorld& world, const Attributes& attributes) {
  std::size_t nameColumns = 0;
  for (const auto& [name, value] : attributes) nameColumns = std::max(nameColumns, columnsOf(safeText(name)));
  for (const auto& [name, value] : attributes) {
    std::string label = safeText(name);
    for (const std::string& line : attributeLines(name, value, world.byteCounts)) {
      const std::string padding(nameColumns - columnsOf(label) + 2, ' ');
      world.out.stream() << world.out.inked(Console::Ink::dim, label) << padding << line << '\n';
      label.clear();
    }
  }
}

JsonDocument jsonOf(const Attributes& attributes) {
  JsonDocument list = JsonDocument::array();
  for (const auto& [name, value] : attributes) {
    JsonDocument entry;
    setText(entry, "name", name);
    entry.update(jsonValue(value));
    list.push_back(std::move(entry));
  }
  return list;
}

// Empty once something is among the faults.
Attributes find(ToolWorld& world, const std::string& path, const std::string& volume, Faults& faults) {
  const auto store = openStore(world.stores, volume);
  if (const auto* fault = std::get_if<StoreFault>(&store)) {
    faults.add(volume, *fault);
    return {};
  }
  StoreReader& reader = *std::get<0>(store);
  const auto item = reader.itemAt(std::string_view(path).substr(volume.size()));
  if (item && !item.value()) {
    faults.add(path, "noItem",
               "the index of " + safeText(volume) +
                   " has no such item; when it is new, run: " + updateCommand(volume));
    return {};
  }
  auto attributes = item ? attributesOf(reader, *item.value()) : Result<Attributes>(item.error());
  if (attributes) return std::move(attributes).value();
  faults.add(path, "failed", attributes.error().description);
  return {};
}

}  // namespace

ExitStatus runIndexShow(ToolWorld& world, const IndexShowRequest& request) {
  Faults faults(world.err);
  const std::string path = normalizedPath(world.absolute(request.path));
  const std::string volume = volumeOf(world, path);
  const Attributes attributes = find(world, path, volume, faults);
  if (!request.json) {
    writeText(world, attributes);
    return faults.status();
  }
  JsonDocument document;
  document["version"] = kJsonVersion;
  setText(document, "path", path);
  setText(document, "volume", volume);
  document["attributes"] = jsonOf(attributes);
  document["errors"] = faults.asJson();
  world.out.stream() << jsonPage(document);
  return faults.status();
}

}  // namespace norvex
