#include "index/FolderRules.h"

#include <algorithm>
#include <array>

#include "index/AsciiCase.h"
#include "index/SparseAttributes.h"

namespace norvex {
namespace {

constexpr std::string_view applicationEndings[] = {".app", ".appdir"};
constexpr std::string_view systemFlatpakInstallation = "/var/lib/flatpak";
constexpr std::string_view snapFolder = "/var/lib/snapd/snaps";
constexpr std::array<std::string_view, 3> maildirFolders = {"cur", "new", "tmp"};
constexpr std::string_view cacheTagSignature = "Signature: 8a477f597d28d172789f06886806bc55";
static_assert(cacheTagSignature.size() == kCacheTagSignatureSize);

}  // namespace

bool isApplicationBundleName(std::string_view name) {
  return std::any_of(std::begin(applicationEndings), std::end(applicationEndings),
                     [&](std::string_view ending) { return endsWithIgnoringCase(name, ending); });
}

std::vector<std::string> flatpakInstallations(std::string_view dataHome) {
  return {std::string(systemFlatpakInstallation), std::string(dataHome) + "/flatpak"};
}

bool isFlatpakDeployment(std::string_view folderPath, std::span<const std::string> installations) {
  constexpr std::string_view applications = "/app/";
  return std::any_of(installations.begin(), installations.end(), [&](const std::string& installation) {
    if (!folderPath.starts_with(installation)) return false;
    const std::string_view below = folderPath.substr(installation.size());
    if (!below.starts_with(applications)) return false;
    const std::string_view id = below.substr(applications.size());
    return !id.empty() && id.find('/') == std::string_view::npos;
  });
}

bool isInstalledSnap(std::string_view folderPath, std::string_view name) {
  return folderPath == snapFolder && endsWithIgnoringCase(name, ".snap");
}

void MaildirSigns::seeFolder(std::string_view name) {
  for (std::size_t sign = 0; sign < maildirFolders.size(); ++sign) {
    if (name == maildirFolders[sign]) seen_ |= 1U << sign;
  }
}

bool isMaildirMessageFolder(std::string_view name) {
  return name == "cur" || name == "new";
}

bool isValidCacheTag(const CacheTag& tag) {
  return tag.isRegularFile && !tag.isInVolumeRoot && tag.firstBytes.starts_with(cacheTagSignature);
}

bool refusesBackup(std::string_view robotsBackupValue) {
  return withoutTerminator(robotsBackupValue) == "false";
}

}  // namespace norvex
