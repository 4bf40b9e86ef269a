// The user's home folder, as it was when the process started.
#pragma once

#include "platform/UserFolders.h"
#include "platform/linux/XdgFolders.h"

namespace norvex {

class LinuxUserFolders final : public UserFolders {
 public:
  explicit LinuxUserFolders(const XdgFolders& folders) : home_(folders.home) {}

  const std::string& home() const override { return home_; }

 private:
  std::string home_;
};

}  // namespace norvex
