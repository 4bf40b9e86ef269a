// The line that shows how far a scan has come, and which of its queries did not start.
//
// Made for one scan, on the main thread.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include "tool/ProgressLine.h"
#include "tool/ToolWorld.h"
#include "tool/WatchedMetadataIndex.h"

namespace norvex {

class ScanProgress final : public QueryWatcher {
 public:
  // `volumes`: how many are to be measured. `world` outlives this object.
  ScanProgress(ToolWorld& world, std::size_t volumes);

  void queryStarts(const std::string& volume, bool started) override;
  void matchIsRead(std::size_t index, std::size_t count) override;
  void queryEnds() override { ++queriesDone_; }

  // An item of a walk through a folder is being looked at.
  void itemIsWalked();

  // Makes room for another line on the terminal.
  void makeRoom() { line_.erase(); }

  // The volumes of which a query could not be started.
  const std::vector<std::string>& refused() const { return refused_; }

 private:
  void showWhenDue();

  ToolWorld& world_;
  const std::size_t queries_;  // of the whole scan
  std::size_t queriesDone_ = 0;
  double doneOfQuery_ = 0;  // 0 to 1
  std::uint64_t items_ = 0;
  std::string place_;
  std::vector<std::string> refused_;
  ProgressLine line_;
};

}  // namespace norvex
