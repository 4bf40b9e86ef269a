// The two operations of the record that keep exact figures on the machine. Their arithmetic is pinned to the
// last bit: reports of different machines can only be compared when the same size always has the same text.

#include <algorithm>
#include <array>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <iterator>
#include <limits>
#include <string>

#include "results/NVXScannerResults.h"

namespace norvex {
namespace {

// The powers 1.26^k for k = 0 to 10, the last three rounded to 15 digits. 1.26 is close to the tenth root of
// ten, which makes ten buckets of a decade. Literals, because computed powers differ from them in the last
// bits.
constexpr std::array<double, 11> kSizeBucketFactors = {
    1.0,
    1.26,
    1.5876,
    2.000376,
    2.52047376,
    3.1757969376,
    4.001504141376,
    5.04189521813376,
    6.35278797484854,
    8.00451284830916,
    10.0856861888695,
};

// How many digits of a count are told.
constexpr std::int32_t kLeadingDigits = 2;

// For a whole exponent the double nearest to the exact power. The exponents here run from -18 to 19, and for
// all of them that is what glibc's pow gives; a test holds this, since the standard does not promise it.
double powerOfTen(double wholeExponent) {
  return std::pow(10.0, wholeExponent);
}

// `value` without its fraction; -2^63 when it does not fit. The plain conversion would be undefined there.
std::int64_t truncatedToInt64(double value) {
  constexpr double kLimit = 0x1p63;
  const bool fits = value >= -kLimit && value < kLimit;
  return fits ? static_cast<std::int64_t>(value) : std::numeric_limits<std::int64_t>::min();
}

// All digits of the whole number nearest to `value`, at most 20 of them here.
std::string wholeNumberText(double value) {
  std::array<char, 32> text;
  std::snprintf(text.data(), text.size(), "%.0f", value);
  return text.data();
}

}  // namespace

std::string NVXScannerResults::bucketedStringFromSize(std::uint64_t size) {
  if (size == 0) return "0";
  const auto x = static_cast<double>(size);
  // The power of ten below x, as a whole number on purpose: 0 for x = 1, so that a single byte reads as
  // nothing, and -2^63 above 10^19, where only a difference that went below zero ends up.
  const auto decade = static_cast<double>(truncatedToInt64(powerOfTen(std::ceil(std::log10(x)) - 1)));
  // The last factor is not tested: it bounds whatever the others do not.
  const auto lastFactor = std::prev(kSizeBucketFactors.end());
  const auto factor =
      std::find_if(kSizeBucketFactors.begin(), lastFactor, [&](double f) { return f * decade >= x; });
  return wholeNumberText(decade * *factor);
}

std::string NVXScannerResults::bucketedStringFromCount(std::uint64_t count) {
  if (count == 0) return "0";
  const auto x = static_cast<double>(count);
  const auto magnitude = static_cast<std::int32_t>(std::ceil(std::log10(x)));
  // Inexact for a magnitude above 2. Dividing by it is not the same as multiplying by its inverse.
  const double scale = powerOfTen(kLeadingDigits - magnitude);
  return wholeNumberText(std::round(x * scale) / scale);
}

}  // namespace norvex
