// The kernel's model name, any bytes, or the errno value with which it is refused.
#pragma once

#include <cstddef>
#include <span>
#include <string>

#include "platform/SystemControl.h"
#include "tests/support/CallJournal.h"

namespace norvex {

class InMemorySystemControl final : public SystemControl {
 public:
  explicit InMemorySystemControl(CallJournal& calls) : calls_(calls) {}

  // The buffer is never left as it was found: what lies behind the name's end, and all of it after a failure,
  // is rubbish.
  int sysctl(std::span<const int> name, void* buffer, std::size_t* length) override;

  std::string modelName = "Model1,1";
  // Not 0: every call fails with it.
  int failure = 0;
  // The buffer size that the last call came with.
  std::size_t lastLength = 0;

 private:
  CallJournal& calls_;
};

}  // namespace norvex
