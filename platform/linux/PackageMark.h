// Which folders are marked as packages, whatever their names.
//
// Used on any thread.
#pragma once

namespace norvex {

// Whether the open folder carries the mark that makes any folder a package. No, when that cannot be read.
bool isMarkedAsPackage(int folder);

}  // namespace norvex
