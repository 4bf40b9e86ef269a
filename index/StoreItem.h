// One item as it goes into a store.
#pragma once

#include <cstdint>
#include <optional>
#include <string_view>

#include "index/ContentTypes.h"

namespace norvex {

struct StoreItem {
  std::int64_t parent = 0;
  std::string_view name;
  TypeId type = 0;
  std::optional<std::int64_t> size;  // bytes; none for folders
  std::int64_t mtime = 0;            // nanoseconds since 1970
};

}  // namespace norvex
