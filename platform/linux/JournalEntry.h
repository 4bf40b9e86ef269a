// One entry for the system's journal, in the form in which the journal takes it.
//
// A plain value; any thread.
#pragma once

#include <string>
#include <string_view>

namespace norvex {

class JournalEntry {
 public:
  // Names are of A-Z, 0-9 and _, at most 64 bytes, and begin with a letter: the journal drops other fields
  // without a word. Values are any bytes.
  void add(std::string_view name, std::string_view value);

  const std::string& bytes() const { return bytes_; }

 private:
  std::string bytes_;
};

}  // namespace norvex
