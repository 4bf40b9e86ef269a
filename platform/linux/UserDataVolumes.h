// Which of the mounted file systems hold user data.
//
// Called on the thread of the run.
#pragma once

#include <functional>
#include <string>
#include <vector>

#include "platform/Result.h"

namespace norvex {

// Whether there is a folder at the path. False when that cannot be told: a volume that the user cannot reach
// is none of his.
using FolderTest = std::function<bool(const std::string&)>;
bool isReachableFolder(const std::string& path);

// The mount points of the local file systems that hold user data, by the table of mounts at `mountInfoPath`:
// one for each file system (device number), its shortest, in byte order. Left out are
//  - kinds of file systems that are not listed in the source: pseudo, network, read-only images;
//  - an overlay anywhere but at "/", where it is the system's own (live systems, containers);
//  - read-only loop devices, which carry images as well, and EFI system partitions;
//  - mount points that are no folder or that a later mount hides.
// Fails when the table cannot be read; lines of it that make no sense are passed over.
Result<std::vector<std::string>> userDataVolumes(const std::string& mountInfoPath,
                                                 const FolderTest& isFolder = isReachableFolder);

}  // namespace norvex
