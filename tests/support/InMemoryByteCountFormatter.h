// Byte counts as plain decimals, the same in every locale.
#pragma once

#include <cstdint>
#include <string>

#include "platform/ByteCountFormatter.h"

namespace norvex {

class InMemoryByteCountFormatter final : public ByteCountFormatter {
 public:
  std::string string(std::uint64_t bytes) const override { return std::to_string(bytes) + " bytes"; }
};

}  // namespace norvex
