// Byte counts as text, with the digit grouping and the decimal separator of a locale.
#pragma once

#include <string>

#include "platform/ByteCountFormatter.h"

namespace norvex {

class LocaleByteCountFormatter final : public ByteCountFormatter {
 public:
  // `localeName` as for setlocale; "" is the user's own, from the environment. A locale that the system does
  // not have counts as "C": no grouping, a point. Made while no other thread uses locales; leaves the
  // process's and the thread's locale as they are.
  explicit LocaleByteCountFormatter(const std::string& localeName = "");

  // Rounds half to even on the shown digits. The unit is chosen before rounding, so that a size just below a
  // unit stays in the smaller one: 999,999 is "1000 KB", or "1,000 KB" where thousands are grouped.
  std::string string(std::uint64_t bytes) const override;

  // A whole number with the locale's grouping of its digits.
  std::string grouped(std::uint64_t number) const;

 private:
  std::string decimalSeparator_ = ".";  // in UTF-8, as the next one
  std::string thousandsSeparator_;
  std::string grouping_;  // as in lconv: sizes of the groups from the right, the last one repeats
};

}  // namespace norvex
