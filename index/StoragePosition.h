// The positions of a volume's accumulated sizes: what a byte on a volume is counted as.
//
// Used by the types, the crawler and the store, on any thread. The numbers are those of the store attribute
// and never change; readers of older stores rely on them.
#pragma once

#include <cstddef>
#include <cstdint>

namespace norvex {

enum class StoragePosition : std::uint8_t {
  messages = 0,
  libraries = 1,
  archives = 2,
  diskImages = 3,
  fonts = 4,
  sourceCode = 5,
  movies = 6,
  applications = 7,
  databases = 8,
  music = 9,
  pdf = 10,
  text = 11,
  images = 12,
  wordProcessing = 13,
  spreadsheets = 14,
  presentations = 15,
  contactsAndCalendars = 16,
  other = 17,
};

inline constexpr std::size_t kStoragePositionCount = 18;

}  // namespace norvex
