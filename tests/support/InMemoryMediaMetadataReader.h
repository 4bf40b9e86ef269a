// Media files as lists of item keys; every other path is no media file, unless a test says what all others
// are.
#pragma once

#include <map>
#include <string>
#include <vector>

#include "platform/MediaMetadataReader.h"
#include "tests/support/CallJournal.h"

namespace norvex {

class InMemoryMediaMetadataReader final : public MediaMetadataReader {
 public:
  explicit InMemoryMediaMetadataReader(CallJournal& calls) : calls_(calls) {}

  std::vector<MediaItemKey> itemKeys(const Location& file) override {
    calls_.add("itemKeys " + file.path());
    const auto found = keysOfFile.find(file.path());
    return found == keysOfFile.end() ? keysOfOthers : found->second;
  }

  std::map<std::string, std::vector<MediaItemKey>> keysOfFile;
  std::vector<MediaItemKey> keysOfOthers;

 private:
  CallJournal& calls_;
};

}  // namespace norvex
