// A small volume on disk, a folder for its index, and a companion command whose output is kept.
#pragma once

#include <atomic>
#include <cstdint>
#include <sstream>
#include <string>
#include <vector>

#include "InMemoryAgentJob.h"
#include "InMemoryAgentJournal.h"
#include "index/StoreFolder.h"
#include "tests/support/CallJournal.h"
#include "tests/support/InMemoryBackupSettings.h"
#include "tests/support/InMemoryByteCountFormatter.h"
#include "tests/support/InMemoryClock.h"
#include "tests/support/TreeOnDisk.h"
#include "tool/ToolWorld.h"

namespace norvex {

class ToolTestWorld {
 public:
  // 2023-11-14 22:13:20 UTC, the moment of the store's check; "now" is two minutes later.
  static constexpr std::int64_t kIndexed = 1'700'000'000;

  // The volume: an image of 4000 bytes, a text of 1000, a folder "sub" with a file that has an attribute of
  // its own and one whose name holds a line feed. `style` is of both outputs.
  explicit ToolTestWorld(const ConsoleStyle& style = {});

  std::string volume() const { return tree.path(); }

  // Crawls the volume into its store, which was checked at kIndexed.
  void index() const;

  // What the backup settings say from now on.
  void include(std::vector<std::string> volumes);

  // Replaces the store by bytes that are none.
  void damage() const;

  std::string storeBytes() const;  // the file's content

  // What was written so far, with "<volume>" and "<cache>" in the place of the two folders' paths.
  std::string output() const { return withoutPaths(outText.str()); }
  std::string errors() const { return withoutPaths(errText.str()); }

  ondisk::TreeOnDisk tree;
  ondisk::TreeOnDisk cache;
  CallJournal calls;
  InMemoryBackupSettings settings{calls};
  InMemoryByteCountFormatter byteCounts;
  InMemoryClock clock;
  InMemoryAgentJournal journal;
  InMemoryAgentJob job;
  std::atomic<bool> cancelled{false};
  std::ostringstream outText, errText;
  Console out, err;
  StoreFolder stores{cache.path()};
  ToolWorld world;

 private:
  std::string withoutPaths(std::string text) const;
};

}  // namespace norvex
