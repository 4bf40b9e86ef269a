// An installation is internal when a marker file says so.
#pragma once

#include <string>
#include <utility>

#include "platform/Installation.h"

namespace norvex {

class MarkerFileInstallation final : public Installation {
 public:
  explicit MarkerFileInstallation(std::string markerPath = "/etc/norvex/internal-install")
      : markerPath_(std::move(markerPath)) {}

  // What the marker contains does not matter. Asked of the file system at every call.
  bool isInternalInstall() override;

 private:
  std::string markerPath_;
};

}  // namespace norvex
