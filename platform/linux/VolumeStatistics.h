// What a volume's own bookkeeping says, for a path of any length.
//
// Used on any thread.
#pragma once

#include <sys/statvfs.h>

#include <string>

#include "platform/Result.h"

namespace norvex {

// Of the volume that `path` lies on; a link is followed. Fails with the errno value when the path leads
// nowhere.
Result<struct statvfs> volumeStatistics(const std::string& path);

}  // namespace norvex
