#include "GoldenFile.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <fstream>
#include <sstream>
#include <stdexcept>
#include <string_view>

namespace norvex {
namespace {

std::string pathOf(const std::string& name) {
  return std::string(NORVEX_GOLDEN_FOLDER) + "/" + name;
}

bool isToBeRewritten() {
  const char* value = std::getenv("NORVEX_REWRITE_GOLDEN");
  return value != nullptr && std::string_view(value) == "1";
}

}  // namespace

std::string readGolden(const std::string& name) {
  std::ifstream file(pathOf(name), std::ios::binary);
  if (!file) throw std::runtime_error("cannot read " + pathOf(name));
  std::ostringstream text;
  text << file.rdbuf();
  return text.str();
}

void expectGolden(const std::string& name, const std::string& text) {
  if (isToBeRewritten()) {
    std::ofstream(pathOf(name), std::ios::binary) << text;
    ADD_FAILURE() << pathOf(name) << " has been rewritten; look at its changes";
    return;
  }
  EXPECT_EQ(readGolden(name), text) << "as against golden/" << name;
}

}  // namespace norvex
