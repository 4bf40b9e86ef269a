// Gives every file of a corpus to its fuzz target, with any compiler. A target that finds something aborts.
#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <vector>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size);

namespace {

std::vector<std::uint8_t> bytesOf(const std::filesystem::path& path) {
  std::ifstream file(path, std::ios::binary);
  return {std::istreambuf_iterator<char>(file), std::istreambuf_iterator<char>()};
}

TEST(Corpus, HoldsNothingThatATargetFailsOn) {
  std::size_t count = 0;
  for (const auto& entry : std::filesystem::directory_iterator(NORVEX_FUZZ_CORPUS)) {
    SCOPED_TRACE(entry.path().string());
    const auto bytes = bytesOf(entry.path());
    EXPECT_EQ(LLVMFuzzerTestOneInput(bytes.data(), bytes.size()), 0);
    // And every beginning of it, as a writer that was cut off would have left it.
    const std::size_t step = std::max<std::size_t>(1, bytes.size() / 64);
    for (std::size_t length = 0; length < bytes.size(); length += step) {
      EXPECT_EQ(LLVMFuzzerTestOneInput(bytes.data(), length), 0);
    }
    ++count;
  }
  EXPECT_GT(count, 0U) << "no seeds in " << NORVEX_FUZZ_CORPUS;
}

}  // namespace
