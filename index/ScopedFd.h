// The descriptors of the crawl and of the store's writer: a FileDescriptor whose number is called get().
#pragma once

#include "platform/FileDescriptor.h"

namespace norvex {

class ScopedFd final : public FileDescriptor {
 public:
  using FileDescriptor::FileDescriptor;

  int get() const { return number(); }
};

}  // namespace norvex
