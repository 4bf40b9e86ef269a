// Walks of everything below a folder.
//
// A walk is made, advanced and destroyed on one thread. Several walks may go on at once on different threads.
#pragma once

#include <cstdint>
#include <functional>
#include <memory>
#include <span>

#include "platform/Location.h"
#include "platform/ResourceValues.h"
#include "platform/Result.h"

namespace norvex {

// One walk. Depth first, a folder before its contents, siblings in byte order of their names, so that every
// walk of an unchanged tree is the same. Hidden items and the contents of packages are included, links are
// not followed, the root itself is not yielded.
class DirectoryEnumerator {
 public:
  virtual ~DirectoryEnumerator() = default;

  // The next item, or nullptr when there is none. The item carries the facts that were asked for
  // (Location::facts); its attributes may be unreadable, which reading them tells. The walk owns the
  // location; it is valid until the next call and may be copied. An item that vanishes before the walk
  // reaches it is left out.
  virtual const Location* next() = 0;

  // The depth of the item that next() yielded last: 1 for the root's direct children.
  virtual std::uint64_t level() const = 0;
};

class DirectoryEnumeration {
 public:
  // Told of a folder that cannot be read (the root included), on the thread that advances the walk. True: go
  // on past it. False: end the walk.
  using ErrorHandler = std::function<bool(const Location&, const Error&)>;

  virtual ~DirectoryEnumeration() = default;

  // Begins a walk below `root`. `prefetch` names the values that the caller is going to read of each item.
  // Cannot fail itself: a root that cannot be read goes to the error handler and yields nothing.
  virtual std::unique_ptr<DirectoryEnumerator> enumerator(const Location& root,
                                                          std::span<const ResourceKey> prefetch,
                                                          ErrorHandler errorHandler) = 0;
};

}  // namespace norvex
