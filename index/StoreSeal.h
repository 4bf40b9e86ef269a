// The seal at the end of a store file: its length and a checksum over its bytes, so that a store that has
// lost or changed a byte since it was written is told from a whole one before anything in it is believed.
//
// SQLite ignores what follows the last page that the file's header counts, so the seal is invisible to it.
// Used by the store's writer and reader, on any thread.
#pragma once

#include <cstddef>

#include "platform/Result.h"

namespace norvex {

inline constexpr std::size_t kStoreSealBytes = 24;

// Appends the seal to an open, complete file. Reads back all that was written.
Result<void> sealStore(int fd);

// Succeeds when the file ends in the seal of what stands before it; otherwise kStoreDamaged.
Result<void> checkStoreSeal(int fd);

}  // namespace norvex
