// A small media file with a purchase in it, to try a reader on; gone with the object.
//
// On one thread at a time.
#pragma once

#include <string>
#include <utility>
#include <vector>

#include "platform/Location.h"
#include "platform/MediaMetadataReader.h"
#include "platform/Result.h"

namespace norvex {

class MediaProbe {
 public:
  // Writes the file, under a name that nothing had, readable for the user alone.
  static Result<MediaProbe> in(const std::string& folder);

  MediaProbe(MediaProbe&& other) noexcept : path_(std::exchange(other.path_, "")) {}
  MediaProbe& operator=(MediaProbe&&) = delete;
  MediaProbe(const MediaProbe&) = delete;
  MediaProbe& operator=(const MediaProbe&) = delete;
  ~MediaProbe();

  Location file() const { return Location::file(path_); }

  // What a reader finds in it.
  static std::vector<MediaItemKey> keys();

 private:
  explicit MediaProbe(std::string path) : path_(std::move(path)) {}

  std::string path_;
};

}  // namespace norvex
