#include "tool/Faults.h"

#include "tool/SafeText.h"

namespace norvex {
void Faults::add(const std::string& place, const std::string& reason, const std::string& message) {
  err_.tell(safeText(place) + ": " + message);
  JsonDocument fault;
  setText(fault, "path", place);
  fault["reason"] = reason;
  fault["message"] = message;
  list_.push_back(std::move(fault));
}

void Faults::add(const std::string& volume, const StoreFault& fault) {
  add(volume, reasonText(fault.kind), fault.message);
}

}  // namespace norvex
