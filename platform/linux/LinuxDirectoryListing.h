// One level of a folder, as the kernel lists it.
#pragma once

#include "platform/DirectoryListing.h"

namespace norvex {

class LinuxDirectoryListing final : public DirectoryListing {
 public:
  std::optional<std::vector<std::string>> names(const std::string& folderPath) override;
};

}  // namespace norvex
