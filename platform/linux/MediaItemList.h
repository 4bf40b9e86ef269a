// The keys of the metadata item list of an MPEG-4 file.
//
// The list is what lies in the boxes movie / user data / metadata / item list. Every box in it is one item,
// and the box's type is the item's key, a number. A free-form item is the exception: its type says only that,
// and its key is a text.
//
// Called by Mpeg4MediaReader on any thread; keeps nothing.
#pragma once

#include <cstddef>
#include <vector>

#include "platform/MediaMetadataReader.h"
#include "platform/linux/ByteSource.h"

namespace norvex {

// Items after which a list is not read any further.
inline constexpr std::size_t maxMediaItems = 256;
// Bytes of each of the two names of a free-form item that go into its key. What is longer is cut.
inline constexpr std::size_t maxMediaKeyPart = 64;

// The keys in the file's order. Empty when the bytes are no such file or carry no list.
//
// Only the first movie box counts: there is one, and looking for another would lead through every fragment of
// a long recording. A box that does not fit its parent ends the walk of that parent; the keys before it
// stand.
//
// The key of a free-form item is its domain and its name joined by ":" ("org.example:MOOD"), or the one that
// is there, or an empty text; bytes as the file has them.
std::vector<MediaItemKey> mediaItemKeys(ByteSource& source);

}  // namespace norvex
