// A catalog with the counts that the test gives it; it fails at the step that the test names, else at the
// first step for a path that it does not know.
#pragma once

#include <cstdint>
#include <map>
#include <string>

#include "platform/VolumeCatalog.h"
#include "tests/support/CallJournal.h"

namespace norvex {

class InMemoryVolumeCatalog final : public VolumeCatalog {
 public:
  enum class Step { none, makeReference, volumeOf, objectCounts };

  explicit InMemoryVolumeCatalog(CallJournal& calls) : calls_(calls) {}

  std::int32_t makeReference(const std::string& path, FileReference& file) override {
    calls_.add("makeReference " + path);
    if (failingStep == Step::makeReference || !countsOfVolume.contains(path)) return -43;
    file.path = path;
    return 0;
  }

  std::int16_t volumeOf(const FileReference& file, VolumeReference& volume) override {
    calls_.add("volumeOf " + file.path);
    if (failingStep == Step::volumeOf) return -35;
    volume.root = file.path;
    return 0;
  }

  std::int16_t objectCounts(const VolumeReference& volume, VolumeObjectCounts& counts) override {
    calls_.add("objectCounts " + volume.root);
    if (failingStep == Step::objectCounts) return -36;
    counts = countsOfVolume.at(volume.root);
    return 0;
  }

  std::map<std::string, VolumeObjectCounts> countsOfVolume;
  Step failingStep = Step::none;

 private:
  CallJournal& calls_;
};

}  // namespace norvex
