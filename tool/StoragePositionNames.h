// What people and readers of JSON call the positions of a volume's accumulated sizes.
#pragma once

#include <array>

#include "index/StoragePosition.h"

namespace norvex {

struct StoragePositionName {
  const char* label;  // for people
  const char* key;    // in JSON; never changes
};

// In the order of the positions.
inline constexpr std::array<StoragePositionName, kStoragePositionCount> kStoragePositionNames{{
    {"Mail and messages", "messages"},
    {"Libraries", "libraries"},
    {"Archives", "archives"},
    {"Disk images", "diskImages"},
    {"Fonts", "fonts"},
    {"Source code", "sourceCode"},
    {"Movies", "movies"},
    {"Applications", "applications"},
    {"Databases", "databases"},
    {"Music", "music"},
    {"PDF documents", "pdf"},
    {"Text", "text"},
    {"Images", "images"},
    {"Word processing", "wordProcessing"},
    {"Spreadsheets", "spreadsheets"},
    {"Presentations", "presentations"},
    {"Contacts, calendars", "contactsAndCalendars"},
    {"Other", "other"},
}};

}  // namespace norvex
