// The line that shows how far an update of an index has come.
//
// Made for one volume's update. show() is called by the crawl's thread while the maker waits.
#pragma once

#include <cstdint>
#include <string>

#include "index/Crawl.h"
#include "tool/ProgressLine.h"
#include "tool/ToolWorld.h"

namespace norvex {

class UpdateProgress {
 public:
  // `expectedItems`: how many there were the last time, 0 when that is not known. Both references outlive
  // this object.
  UpdateProgress(ToolWorld& world, const std::string& volume, std::uint64_t expectedItems);

  // Writes the line anew when the last one is old enough.
  void show(const CrawlFigures& figures);

 private:
  void write(const CrawlFigures& figures);

  ToolWorld& world_;
  const std::string& volume_;
  const std::uint64_t expectedItems_;
  ProgressLine line_;
};

}  // namespace norvex
