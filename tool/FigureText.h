// Moments, durations and counts as people and programs read them.
//
// Any thread. The user's time zone is the environment's TZ.
#pragma once

#include <chrono>
#include <cstdint>
#include <functional>
#include <string>

namespace norvex {

// "2026-11-21 07:03:11 +0000", in the user's time zone.
std::string localTime(std::int64_t secondsSince1970);

// "2026-11-21T07:03:11Z"
std::string utcTime(std::int64_t secondsSince1970);

// "3 minutes ago"; "just now" for less than a minute and for what is yet to come.
std::string ageText(std::int64_t seconds);

// "0:07", "12:34", "1:02:03"
std::string elapsedText(std::chrono::duration<double> elapsed);

// "12.3"
std::string secondsText(std::chrono::duration<double> elapsed);

// A whole number with the user's grouping of its digits.
using DigitsText = std::function<std::string(std::uint64_t)>;

// "1 folder", "2,000 folders"; `thing` is the singular.
std::string countText(const DigitsText& digits, std::uint64_t count, const std::string& thing);

}  // namespace norvex
