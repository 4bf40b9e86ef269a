#include "index/StoreSeal.h"

#include <gtest/gtest.h>
#include <unistd.h>

#include <cstdint>
#include <cstdio>
#include <memory>
#include <vector>

#include "index/StoreDatabase.h"

namespace norvex {
namespace {

// Longer than the pieces in which the checksum is made, and no multiple of anything.
constexpr std::size_t kLength = (std::size_t{5} << 20U) + 3;
constexpr off_t kMiB = off_t{1} << 20U;

class StoreSeal : public testing::Test {
 protected:
  StoreSeal() {
    std::vector<unsigned char> bytes(kLength);
    std::uint32_t state = 1;
    for (unsigned char& byte : bytes)
      byte = static_cast<unsigned char>((state = state * 1664525 + 1013904223) >> 24U);
    EXPECT_EQ(::pwrite(fd(), bytes.data(), bytes.size(), 0), static_cast<ssize_t>(kLength));
    EXPECT_TRUE(sealStore(fd()).ok());
  }

  int fd() const { return ::fileno(file_.get()); }

  void flipBit(off_t offset) const {
    unsigned char byte = 0;
    ASSERT_EQ(::pread(fd(), &byte, 1, offset), 1);
    byte ^= 0x10U;
    ASSERT_EQ(::pwrite(fd(), &byte, 1, offset), 1);
  }

  bool isDamaged() const {
    const Result<void> checked = checkStoreSeal(fd());
    return !checked && checked.error().code == kStoreDamaged;
  }

 private:
  struct Closer {
    void operator()(std::FILE* file) const { std::fclose(file); }
  };
  std::unique_ptr<std::FILE, Closer> file_{std::tmpfile()};
};

TEST_F(StoreSeal, HoldsAFileThatHasNotChanged) {
  EXPECT_TRUE(checkStoreSeal(fd()).ok());
}

TEST_F(StoreSeal, TellsOneChangedBitWhereverItIs) {
  const off_t last = static_cast<off_t>(kLength) - 1;
  for (const off_t offset :
       {off_t{0}, 2 * kMiB - 1, 2 * kMiB, 4 * kMiB + 12'345, last, last + 1, last + 20}) {
    SCOPED_TRACE(offset);
    flipBit(offset);
    EXPECT_TRUE(isDamaged());
    flipBit(offset);
    EXPECT_TRUE(checkStoreSeal(fd()).ok());
  }
}

TEST_F(StoreSeal, TellsPiecesThatHaveChangedPlaces) {
  std::vector<char> first(static_cast<std::size_t>(2 * kMiB)), second(first.size());
  ASSERT_EQ(::pread(fd(), first.data(), first.size(), 0), 2 * kMiB);
  ASSERT_EQ(::pread(fd(), second.data(), second.size(), 2 * kMiB), 2 * kMiB);
  ASSERT_EQ(::pwrite(fd(), second.data(), second.size(), 0), 2 * kMiB);
  ASSERT_EQ(::pwrite(fd(), first.data(), first.size(), 2 * kMiB), 2 * kMiB);
  EXPECT_TRUE(isDamaged());
}

TEST_F(StoreSeal, TellsAFileThatHasLostItsEnd) {
  for (const off_t length : {static_cast<off_t>(kLength + kStoreSealBytes) - 1, static_cast<off_t>(kLength),
                             3 * kMiB, off_t{10}, off_t{0}}) {
    SCOPED_TRACE(length);
    ASSERT_EQ(::ftruncate(fd(), length), 0);
    EXPECT_TRUE(isDamaged());
  }
}

}  // namespace
}  // namespace norvex
