// Facts about files and folders as statx tells them, and about volumes as statvfs does.
//
// The two kinds of values differ about a link: a volume's values are those of the volume that the link leads
// to, as with df; all others are the link's own. Any thread may call.
#pragma once

#include <mutex>

#include "platform/ResourceValues.h"
#include "platform/linux/NamedStreams.h"

namespace norvex {

class LinuxResourceValues final : public ResourceValues {
 public:
  Result<std::optional<ResourceValue>> value(const Location& location, ResourceKey key) override;
  Result<ResourceValueTable> values(const Location& location, std::span<const ResourceKey> keys) override;

 private:
  class Request;

  std::mutex streamsLock_;
  NamedStreams streams_;  // guarded by the lock
};

}  // namespace norvex
