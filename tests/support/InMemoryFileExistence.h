// Existence in the in-memory file tree.
#pragma once

#include <string>

#include "platform/FileExistence.h"
#include "tests/support/CallJournal.h"
#include "tests/support/InMemoryFileTree.h"

namespace norvex {

class InMemoryFileExistence final : public FileExistence {
 public:
  InMemoryFileExistence(CallJournal& calls, const InMemoryFileTree& tree) : calls_(calls), tree_(tree) {}

  bool exists(const std::string& path) override {
    calls_.add("exists " + path);
    return tree_.follow(path) != nullptr;
  }

 private:
  CallJournal& calls_;
  const InMemoryFileTree& tree_;
};

}  // namespace norvex
