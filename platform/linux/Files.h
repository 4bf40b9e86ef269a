// The few things that several Linux roles do with files.
//
// Called on any thread. Nothing here waits without a limit on anything but the disk itself.
#pragma once

#include <chrono>
#include <cstddef>
#include <string>
#include <string_view>

#include "platform/Result.h"

namespace norvex {

// The first bytes of the regular file at `path`, at most `limit` of them. A link is followed. Fails with the
// errno value; with EISDIR for a folder and EINVAL for anything else that is no regular file. Such things are
// not read from, and a FIFO that nobody writes to is not waited for.
Result<std::string> readStartOfFile(const std::string& path, std::size_t limit);

// The whole of the regular file at `path`. As above; fails with EFBIG when it has more than `limit` bytes.
Result<std::string> readWholeFile(const std::string& path, std::size_t limit);

// Makes the folder `path` and those above it that are missing, each with mode 0700 and safe against a loss of
// power. Folders that exist are left as they are. 0, or the errno value.
int makePrivateFolders(const std::string& path);

// Writes all of `text` at the descriptor's place. 0, or the errno value; part of the text may be written
// then.
int writeAll(int descriptor, std::string_view text);

// Brings the entries of the folder `path` to the disk. 0, or the errno value.
int syncFolder(const std::string& path);

// Takes the exclusive advisory lock of an open file, which ends when the file is closed, also by the death of
// the process. False when others have held it for `limit` or when the file system has no such locks.
bool lockWithin(int descriptor, std::chrono::milliseconds limit);

}  // namespace norvex
