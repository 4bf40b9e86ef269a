#include "index/AccumulatedSizes.h"

#include <limits>

namespace norvex {
namespace {

// `sum` is never negative, so what is left up to the limit fits an unsigned number.
std::int64_t saturatedSum(std::int64_t sum, std::uint64_t size) {
  constexpr std::int64_t limit = std::numeric_limits<std::int64_t>::max();
  const auto room = static_cast<std::uint64_t>(limit - sum);
  return size > room ? limit : sum + static_cast<std::int64_t>(size);
}

}  // namespace

void AccumulatedSizes::add(StoragePosition position, std::uint64_t size) {
  std::int64_t& sum = values_[static_cast<std::size_t>(position)];
  sum = saturatedSum(sum, size);
}

void AccumulatedSizes::merge(const AccumulatedSizes& other) {
  for (std::size_t position = 0; position < values_.size(); ++position) {
    values_[position] = saturatedSum(values_[position], static_cast<std::uint64_t>(other.values_[position]));
  }
}

}  // namespace norvex
