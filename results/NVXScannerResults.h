// NVXScannerResults: every figure of one run, and the run's report.
//
// Made and filled by the scan, one writer at a time; read afterwards by the entry, which owns it until the
// process ends. No lock, no checks: setters store what they are given, sums wrap as unsigned 64-bit numbers
// do.
#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <utility>

namespace norvex {

class NVXScannerResults {
 public:
  // The upper bound, in decimal, of the bucket that holds `size` bytes: ten buckets a decade, so that no
  // exact size leaves the machine. Pure. 0 and 1 give "0"; above about 10^19 the text is negative.
  static std::string bucketedStringFromSize(std::uint64_t size);

  // `count` rounded to its two leading digits, in decimal. Pure.
  static std::string bucketedStringFromCount(std::uint64_t count);

  // Sends the sizes message and the counts message to the diagnostic log, and on an internal installation the
  // folder message too. Changes nothing in the record; cannot fail.
  void logToWendal() const;

  // The record as 92 lines of exact figures for people, each ended by a line feed. Never sent anywhere.
  std::string description() const;

#define NVX_TEXT(name, setName)                            \
  const std::shared_ptr<const std::string>& name() const { \
    return name##_;                                        \
  }                                                        \
  void setName(std::shared_ptr<const std::string> value) { \
    name##_ = std::move(value);                            \
  }
#define NVX_FIGURE(name, setName)     \
  std::uint64_t name() const {        \
    return name##_;                   \
  }                                   \
  void setName(std::uint64_t value) { \
    name##_ = value;                  \
  }
#define NVX_SETTING(name, setName) \
  bool name() const {              \
    return name##_;                \
  }                                \
  void setName(bool value) {       \
    name##_ = value;               \
  }
#include "results/NVXScannerResultsFields.def"
#undef NVX_TEXT
#undef NVX_FIGURE
#undef NVX_SETTING

 private:
#define NVX_TEXT(name, setName) std::shared_ptr<const std::string> name##_;
#define NVX_FIGURE(name, setName) std::uint64_t name##_ = 0;
#define NVX_SETTING(name, setName) bool name##_ = false;
#include "results/NVXScannerResultsFields.def"
#undef NVX_TEXT
#undef NVX_FIGURE
#undef NVX_SETTING
};

}  // namespace norvex
