// The calls that all roles of one test got, in one order, so that a test can claim what comes before what.
//
// Written by the in-memory roles, from any thread; read by tests. A call is one line: the operation's name,
// then what matters of its arguments, with blanks between ("setValue LastVersionRun=4", "exit 0").
#pragma once

#include <initializer_list>
#include <mutex>
#include <string>
#include <string_view>
#include <vector>

namespace norvex {

class CallJournal {
 public:
  void add(std::string call);

  std::vector<std::string> all() const;

  // The calls of the operations named, in the order in which they came.
  std::vector<std::string> of(std::initializer_list<std::string_view> operations) const;

 private:
  mutable std::mutex mutex_;
  std::vector<std::string> calls_;
};

}  // namespace norvex
