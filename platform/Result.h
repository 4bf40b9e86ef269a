// Values that can fail. No exception leaves a room: an operation that can fail returns a Result, its caller
// decides what a failure means and is the one who logs it.
//
// Used by every room, on any thread. Plain values, owned by whoever holds them.
#pragma once

#include <string>
#include <system_error>
#include <utility>
#include <variant>

namespace norvex {

// Why an operation failed: a code (an errno value wherever the operating system gave one) and its text for a
// log line.
struct Error {
  int code = 0;
  std::string description;
};

// The error that stands for an errno value. This is the one place where errno becomes text: the C library's
// own words for it, whatever the user's language.
inline Error systemError(int errnoValue) {
  return Error{errnoValue, std::generic_category().message(errnoValue)};
}

// Either a value or the Error that kept it from being made. Never both, never neither.
template <typename Value>
class [[nodiscard]] Result {
 public:
  Result(Value value) : content_(std::in_place_index<0>, std::move(value)) {}
  Result(Error error) : content_(std::in_place_index<1>, std::move(error)) {}

  bool ok() const { return content_.index() == 0; }
  explicit operator bool() const { return ok(); }

  // Only when ok().
  const Value& value() const& { return std::get<0>(content_); }
  Value& value() & { return std::get<0>(content_); }
  Value&& value() && { return std::get<0>(std::move(content_)); }

  // Only when not ok().
  const Error& error() const { return std::get<1>(content_); }

 private:
  std::variant<Value, Error> content_;
};

// The outcome of an operation that has nothing to return but may fail.
template <>
class [[nodiscard]] Result<void> {
 public:
  Result() = default;
  Result(Error error) : error_(std::move(error)), failed_(true) {}

  bool ok() const { return !failed_; }
  explicit operator bool() const { return ok(); }

  // Only when not ok().
  const Error& error() const { return error_; }

 private:
  Error error_;
  bool failed_ = false;
};

}  // namespace norvex
