#include "platform/linux/MarkerFileInstallation.h"

#include <sys/stat.h>

namespace norvex {

bool MarkerFileInstallation::isInternalInstall() {
  struct stat status {};
  return ::stat(markerPath_.c_str(), &status) == 0;
}

}  // namespace norvex
