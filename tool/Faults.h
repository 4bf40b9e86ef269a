// What a command could not do: told on standard error as it happens, kept for the JSON document, and decisive
// for the exit status.
//
// Used by the commands, on the main thread.
#pragma once

#include <string>

#include "tool/Console.h"
#include "tool/ExitStatus.h"
#include "tool/JsonText.h"
#include "tool/Volumes.h"

namespace norvex {

class Faults {
 public:
  // `err` outlives this object.
  explicit Faults(Console& err) : err_(err) {}

  // `place`: the volume or path that it is about, as the file system has it. `reason`: the word for it in
  // JSON.
  void add(const std::string& place, const std::string& reason, const std::string& message);
  void add(const std::string& volume, const StoreFault& fault);

  ExitStatus status() const { return list_.empty() ? ExitStatus::success : ExitStatus::failed; }
  const JsonDocument& asJson() const { return list_; }

 private:
  Console& err_;
  JsonDocument list_ = JsonDocument::array();
};

}  // namespace norvex
