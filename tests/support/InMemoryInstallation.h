// An installation whose kind the test decides.
#pragma once

#include "platform/Installation.h"
#include "tests/support/CallJournal.h"

namespace norvex {

class InMemoryInstallation final : public Installation {
 public:
  explicit InMemoryInstallation(CallJournal& calls) : calls_(calls) {}

  bool isInternalInstall() override {
    calls_.add("isInternalInstall");
    return isInternal;
  }

  bool isInternal = false;

 private:
  CallJournal& calls_;
};

}  // namespace norvex
