// Whether the kernel finds something at a path.
#pragma once

#include "platform/FileExistence.h"

namespace norvex {

class LinuxFileExistence final : public FileExistence {
 public:
  bool exists(const std::string& path) override;
};

}  // namespace norvex
