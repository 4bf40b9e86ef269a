// What the kernel's files say about memory being short.
//
// Pure functions of a file's text; any thread.
#pragma once

#include <chrono>
#include <cstdint>
#include <optional>
#include <string_view>

namespace norvex {

// For how long, since the system or the control group started, work has waited for memory.
struct StallTotals {
  std::chrono::microseconds some{};  // at least one task waited
  std::chrono::microseconds full{};  // all tasks waited at once
};

// Of a memory.pressure file. Absent when one of the two lines or its total is missing or no number.
std::optional<StallTotals> stallTotalsIn(std::string_view pressureFile);

// The share of the memory that is left for use, in thousandths: MemAvailable of MemTotal in a meminfo file.
// Absent when one is missing or no number, or there is no memory at all.
std::optional<std::uint64_t> availablePermilleIn(std::string_view memoryInfo);

}  // namespace norvex
