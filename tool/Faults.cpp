#include "tool/Faults.h"

#include <array>

#include "tool/SafeText.h"

namespace norvex {
namespace {

// In the order of StoreFault::Kind.
constexpr std::array<const char*, 5> kReasons{"missing", "unfinished", "damaged", "tooNew", "unreadable"};

}  // namespace

void Faults::add(const std::string& place, const std::string& reason, const std::string& message) {
  err_.tell(safeText(place) + ": " + message);
  JsonDocument fault;
  setText(fault, "path", place);
  fault["reason"] = reason;
  fault["message"] = message;
  list_.push_back(std::move(fault));
}

void Faults::add(const std::string& volume, const StoreFault& fault) {
  add(volume, kReasons[static_cast<std::size_t>(fault.kind)], fault.message);
}

}  // namespace norvex
