#include "platform/linux/ProcStatusMemoryInfo.h"

#include <gtest/gtest.h>
#include <sys/mman.h>

#include <cerrno>
#include <cstring>

#include "ScratchFolder.h"

namespace norvex {
namespace {

TEST(ProcStatusMemoryInfo, TakesTheAnonymousAndTheSwappedMemoryInBytes) {
  const ScratchFolder folder;
  ProcStatusMemoryInfo info(
      folder.write("status",
                   "Name:\tRssAnon: 7 kB\nVmRSS:\t    900 kB\nRssAnon:\t     585938 kB\n"
                   "RssFile:\t 12 kB\nVmSwap:\t       3 kB\nThreads:\t1\n"));
  EXPECT_EQ(info.ownProcess().value().internal, 585938U * 1024U);
  EXPECT_EQ(info.ownProcess().value().compressed, 3U * 1024U);
}

TEST(ProcStatusMemoryInfo, FailsInsteadOfGuessing) {
  struct Case {
    const char* status;
    int error;
  };
  const Case cases[] = {
      {"", ENODATA},
      {"RssAnon:\t1 kB\n", ENODATA},
      {"VmSwap:\t1 kB\n", ENODATA},
      {"RssAnon:\tmany kB\nVmSwap:\t1 kB\n", ENODATA},
      {"RssAnon:\t-1 kB\nVmSwap:\t1 kB\n", ENODATA},
      {"RssAnon:\t1 MB\nVmSwap:\t1 kB\n", ENODATA},
      {"RssAnon:\t1 kB\nVmSwap:", ENODATA},
      {"RssAnon:\t99999999999999999999 kB\nVmSwap:\t1 kB\n", EOVERFLOW},
      {"RssAnon:\t18014398509481984 kB\nVmSwap:\t1 kB\n", EOVERFLOW},
  };
  for (const Case& row : cases) {
    const ScratchFolder folder;
    const Result<MemoryUse> use = ProcStatusMemoryInfo(folder.write("status", row.status)).ownProcess();
    ASSERT_FALSE(use) << row.status;
    EXPECT_EQ(use.error().code, row.error) << row.status;
  }
  EXPECT_EQ(ProcStatusMemoryInfo("/nonexistent/status").ownProcess().error().code, ENOENT);
}

TEST(ProcStatusMemoryInfo, SeesTheProcessGrow) {
  constexpr std::size_t kSize = 64UL * 1024 * 1024;
  ProcStatusMemoryInfo info;
  const MemoryUse before = info.ownProcess().value();
  void* memory = ::mmap(nullptr, kSize, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
  ASSERT_NE(memory, MAP_FAILED);
  std::memset(memory, 1, kSize);
  const MemoryUse after = info.ownProcess().value();
  ::munmap(memory, kSize);
  // The kernel counts in batches per thread, and may put some of it out.
  EXPECT_GE(after.internal + after.compressed, before.internal + before.compressed + kSize * 9 / 10);
}

}  // namespace
}  // namespace norvex
