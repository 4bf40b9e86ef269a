#include "tests/support/CallJournal.h"

#include <algorithm>
#include <utility>

namespace norvex {

void CallJournal::add(std::string call) {
  const std::lock_guard lock(mutex_);
  calls_.push_back(std::move(call));
}

std::vector<std::string> CallJournal::all() const {
  const std::lock_guard lock(mutex_);
  return calls_;
}

std::vector<std::string> CallJournal::of(std::initializer_list<std::string_view> operations) const {
  std::vector<std::string> chosen;
  for (const std::string& call : all()) {
    const std::string_view operation = std::string_view(call).substr(0, call.find(' '));
    if (std::find(operations.begin(), operations.end(), operation) != operations.end())
      chosen.push_back(call);
  }
  return chosen;
}

}  // namespace norvex
