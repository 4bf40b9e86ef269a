// The home folder of a made-up user.
#pragma once

#include <string>

#include "platform/UserFolders.h"

namespace norvex {

class InMemoryUserFolders final : public UserFolders {
 public:
  const std::string& home() const override { return homeFolder; }

  std::string homeFolder = "/Users/user";
};

}  // namespace norvex
