#include "media/Boxes.h"

#include <algorithm>
#include <stdexcept>
#include <utility>

namespace norvex {

const Bytes version0 = Bytes(std::string(4, '\0'));

Bytes::Bytes(std::string text) : size_(text.size()) {
  if (size_ > 0) runs_.push_back(Run{0, size_, std::move(text)});
}

Bytes Bytes::zeros(std::uint64_t count) {
  Bytes bytes;
  if (count > 0) bytes.runs_.push_back(Run{0, count, {}});
  bytes.size_ = count;
  return bytes;
}

void Bytes::append(const Bytes& other) {
  for (const Run& run : other.runs_) {
    if (!run.text.empty() && !runs_.empty() && !runs_.back().text.empty()) {
      runs_.back().text += run.text;
      runs_.back().size += run.size;
    } else {
      runs_.push_back(Run{size_, run.size, run.text});
    }
    size_ += run.size;
  }
}

std::size_t Bytes::copy(std::uint64_t offset, std::span<char> buffer) const {
  std::size_t copied = 0;
  auto run = std::upper_bound(runs_.begin(), runs_.end(), offset,
                              [](std::uint64_t at, const Run& candidate) { return at < candidate.begin; });
  if (run != runs_.begin()) --run;
  for (; run != runs_.end() && copied < buffer.size(); ++run) {
    const std::uint64_t start = offset + copied - run->begin;
    if (start >= run->size) break;
    const auto length =
        static_cast<std::size_t>(std::min<std::uint64_t>(run->size - start, buffer.size() - copied));
    const auto target = buffer.subspan(copied, length);
    std::fill(target.begin(), target.end(), '\0');
    if (!run->text.empty()) run->text.copy(target.data(), length, static_cast<std::size_t>(start));
    copied += length;
  }
  return copied;
}

std::string Bytes::text() const {
  if (size_ > (1U << 26U)) throw std::length_error("these bytes are not meant to be held in memory");
  std::string all(static_cast<std::size_t>(size_), '\0');
  copy(0, all);
  return all;
}

Bytes Bytes::withText(std::size_t offset, std::string_view text) const {
  Bytes changed = *this;
  changed.runs_.at(0).text.replace(offset, text.size(), text);
  return changed;
}

Bytes Bytes::shortenedTo(std::uint64_t size) const {
  std::string all = text();
  all.resize(static_cast<std::size_t>(size));
  return all;
}

Bytes joined(Parts parts) {
  Bytes all;
  for (const Bytes& part : parts) all.append(part);
  return all;
}

Bytes repeated(std::size_t times, const Bytes& bytes) {
  Bytes all;
  for (std::size_t i = 0; i < times; ++i) all.append(bytes);
  return all;
}

std::string bigEndianText(std::uint64_t number, int width) {
  std::string text;
  for (int byte = width - 1; byte >= 0; --byte) text += static_cast<char>(number >> (8 * byte) & 0xFFU);
  return text;
}

Bytes boxClaiming(std::uint32_t size, std::string_view type, Parts parts) {
  return joined({bigEndianText(size, 4) + std::string(type), joined(parts)});
}

Bytes wideBoxClaiming(std::uint64_t size, std::string_view type, Parts parts) {
  return boxClaiming(1, type, {bigEndianText(size, 8), joined(parts)});
}

Bytes box(std::string_view type, Parts parts) {
  const std::uint64_t size = 8 + joined(parts).size();
  if (size > UINT32_MAX) throw std::length_error("a box of this size has to be a wide one");
  return boxClaiming(static_cast<std::uint32_t>(size), type, parts);
}

Bytes wideBox(std::string_view type, Parts parts) {
  return wideBoxClaiming(16 + joined(parts).size(), type, parts);
}

Bytes openBox(std::string_view type, Parts parts) {
  return boxClaiming(0, type, parts);
}

Bytes item(std::string_view key) {
  return box(key, {box("data", {bigEndianText(1, 4), version0, "a value"})});
}

Bytes freeForm(std::string_view domain, std::string_view name) {
  return box("----",
             {box("mean", {version0, std::string(domain)}), box("name", {version0, std::string(name)}),
              box("data", {bigEndianText(1, 4), version0, "a value"})});
}

Bytes handler() {
  return box("hdlr", {version0, version0, "mdir", Bytes::zeros(13)});
}

Bytes movieHeader() {
  return box("mvhd", {Bytes::zeros(100)});
}

Bytes track(std::uint64_t tables) {
  return box("trak", {box("tkhd", {Bytes::zeros(84)}), box("mdia", {Bytes::zeros(tables)})});
}

Bytes movie(Parts items) {
  return box("moov", {movieHeader(), track(300),
                      box("udta", {box("meta", {version0, handler(), box("ilst", items)})})});
}

Bytes fileType() {
  return box("ftyp", {"M4A ", version0, "M4A isom"});
}

std::size_t BytesSource::read(std::uint64_t offset, std::span<char> buffer) {
  ++reads_;
  if (reads_ >= failFrom_) return 0;
  const std::size_t copied = bytes_.copy(offset, buffer);
  bytesRead_ += copied;
  return copied;
}

std::vector<std::string> shown(const std::vector<MediaItemKey>& keys) {
  std::vector<std::string> all;
  for (const MediaItemKey& key : keys) {
    const auto* code = std::get_if<std::uint32_t>(&key);
    all.push_back(code != nullptr ? bigEndianText(*code, 4) : '"' + std::get<std::string>(key) + '"');
  }
  return all;
}

}  // namespace norvex
