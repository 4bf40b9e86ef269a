// Files made of boxes, written as one nested expression:
//
//   box("moov", {box("udta", {box("meta", {version0, box("ilst", {item("purd")})})})})
//
// Plain values. Long runs of zeros take no memory, so that files of gigabytes are cheap.
#pragma once

#include <cstddef>
#include <cstdint>
#include <initializer_list>
#include <span>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "platform/MediaMetadataReader.h"
#include "platform/linux/ByteSource.h"

namespace norvex {

class Bytes {
 public:
  Bytes() = default;
  Bytes(std::string text);
  Bytes(const char* text) : Bytes(std::string(text)) {}
  static Bytes zeros(std::uint64_t count);

  std::uint64_t size() const { return size_; }
  void append(const Bytes& other);
  // Copies what begins at `offset`; the number of bytes copied.
  std::size_t copy(std::uint64_t offset, std::span<char> buffer) const;
  // All of it in memory. Only for a file of modest size.
  std::string text() const;

  // The same bytes with those from `offset` on replaced by `text`, which lies within the first run.
  Bytes withText(std::size_t offset, std::string_view text) const;
  Bytes shortenedTo(std::uint64_t size) const;

 private:
  // Zeros where there is no text.
  struct Run {
    std::uint64_t begin = 0;
    std::uint64_t size = 0;
    std::string text;
  };
  std::vector<Run> runs_;
  std::uint64_t size_ = 0;
};

using Parts = std::initializer_list<Bytes>;

Bytes joined(Parts parts);
Bytes repeated(std::size_t times, const Bytes& bytes);
std::string bigEndianText(std::uint64_t number, int width);

// A box with a 32-bit size, with a 64-bit one, and one whose size of 0 stands for "to the end of the file".
Bytes box(std::string_view type, Parts parts);
Bytes wideBox(std::string_view type, Parts parts);
Bytes openBox(std::string_view type, Parts parts);

// A box whose header says `size`, whatever there is.
Bytes boxClaiming(std::uint32_t size, std::string_view type, Parts parts);
Bytes wideBoxClaiming(std::uint64_t size, std::string_view type, Parts parts);

// Version 0 and no flags, with which some boxes begin.
extern const Bytes version0;

Bytes item(std::string_view key);
Bytes freeForm(std::string_view domain, std::string_view name);
// The box that a metadata box begins with.
Bytes handler();
// A movie box with a track and the given items where players write them.
Bytes movie(Parts items);
Bytes movieHeader();
Bytes track(std::uint64_t tables);
Bytes fileType();

// Reads Bytes and counts what it was asked for.
class BytesSource final : public ByteSource {
 public:
  explicit BytesSource(Bytes bytes) : bytes_(std::move(bytes)) {}

  std::uint64_t size() const override { return bytes_.size(); }
  std::size_t read(std::uint64_t offset, std::span<char> buffer) override;

  // From now on the reads with this number (from 1) and later ones yield nothing.
  void failFrom(std::size_t read) { failFrom_ = read; }

  std::size_t reads() const { return reads_; }
  std::size_t bytesRead() const { return bytesRead_; }

 private:
  Bytes bytes_;
  std::size_t failFrom_ = SIZE_MAX;
  std::size_t reads_ = 0;
  std::size_t bytesRead_ = 0;
};

// Keys for a comparison that fails with readable words: numbers as their four characters, texts in quotes.
std::vector<std::string> shown(const std::vector<MediaItemKey>& keys);

}  // namespace norvex
