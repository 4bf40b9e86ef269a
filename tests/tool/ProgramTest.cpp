// The program itself: how it ends, and what its signals do. The volume is the machine's "/", of which a test
// sees no more than the beginning of a crawl; the index is in a temporary folder.
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <signal.h>

#include <atomic>
#include <fstream>
#include <iterator>
#include <optional>

#include "RunningTool.h"
#include "index/ContentTypes.h"
#include "index/CrawlVolume.h"
#include "index/StoreFolder.h"
#include "index/StoreReader.h"
#include "index/StoreWriter.h"
#include "tests/support/TreeOnDisk.h"

namespace norvex {
namespace {

using ::testing::HasSubstr;

class NorvexctlProgram : public ::testing::Test {
 protected:
  // A store of "/" that says that there is nothing but its root.
  void publishOldStore() {
    ASSERT_TRUE(stores.prepare().ok());
    auto writer = StoreWriter::create(stores.unfinishedPath("/"), never);
    ASSERT_TRUE(writer.ok());
    const ContentTypes types = ContentTypes::load({});
    const TypeId type = types.ofFolder("", false);
    const auto root = writer.value().add({0, {}, type, std::nullopt, 0});
    writer.value().addFolder(root, root + 1, 0, StoreFolderState::sorted);
    writer.value().addType(type, types.type(type));
    const auto fileSystem = fileSystemIdAt("/");
    ASSERT_TRUE(fileSystem.ok());
    ASSERT_TRUE(writer.value().finish({"/", fileSystem.value(), 0, 0, 0, {}}, 1'700'000'000).ok());
    ASSERT_TRUE(stores.publish("/").ok());
    ASSERT_TRUE(StoreReader::open(stores, "/").ok());
  }

  std::string store() const {
    std::ifstream file(stores.storePath("/"), std::ios::binary);
    return {std::istreambuf_iterator<char>(file), {}};
  }

  bool hasUnfinishedStore() const { return std::ifstream(stores.unfinishedPath("/")).good(); }

  const ondisk::TreeOnDisk folder;
  const StoreFolder stores{folder.path("cache/norvex")};
  const std::atomic<bool> never{false};
};

TEST_F(NorvexctlProgram, LeavesTheOldIndexWhenASignalStopsTheUpdate) {
  publishOldStore();
  for (const int signal : {SIGINT, SIGTERM}) {
    const std::string before = store();
    RunningTool tool(folder.path(), {"index", "update", "/"}, RunningTool::ErrorsGoTo::terminal);
    ASSERT_TRUE(tool.waitForError("items/s")) << tool.errors();
    tool.signal(signal);
    EXPECT_EQ(tool.wait(), 1);
    EXPECT_THAT(tool.errors(),
                HasSubstr("norvexctl: /: not indexed: stopped; the index that it has is as it was"));
    EXPECT_EQ(store(), before);
    EXPECT_FALSE(hasUnfinishedStore());
  }
}

TEST_F(NorvexctlProgram, SaysThatItWaitsForAnotherUpdateAndCanBeStoppedThen) {
  publishOldStore();
  const std::string before = store();
  const auto otherUpdate = StoreLock::take(stores.lockPath("/"), false, never);
  ASSERT_TRUE(otherUpdate.ok());
  RunningTool tool(folder.path(), {"index", "update", "/"});
  ASSERT_TRUE(tool.waitForError("another update of this volume is under way; waiting")) << tool.errors();
  tool.signal(SIGINT);
  EXPECT_EQ(tool.wait(), 1);
  EXPECT_EQ(store(), before);
}

TEST_F(NorvexctlProgram, EndsWithTheStatusOfWhatHappened) {
  publishOldStore();
  const struct {
    std::vector<std::string> arguments;
    int status;
  } cases[] = {
      {{"--help"}, 0},
      {{"index", "status", "/"}, 0},
      {{"index", "query", "a == 1", "--volume", "/"}, 0},
      {{"index", "show", "/"}, 0},
      {{"index", "status", "/not/there"}, 1},
      {{"index", "update", "/not/there"}, 1},
      {{"index", "show", "/not/there"}, 1},
      {{"index", "query", "a =="}, 2},
      {{"index", "nonsense"}, 2},
      {{}, 2},
  };
  for (const auto& each : cases) {
    RunningTool tool(folder.path(), each.arguments);
    EXPECT_EQ(tool.wait(), each.status) << ::testing::PrintToString(each.arguments) << tool.errors();
  }
}

TEST_F(NorvexctlProgram, FailsOverBackupSettingsThatMakeNoSenseAndNamesTheLine) {
  folder.add(".", {ondisk::folder("config", {ondisk::folder("chronel")})});
  std::ofstream(folder.path("config/chronel/backup.conf")) << "[Backup]\nnonsense\n";
  RunningTool tool(folder.path(), {"index", "update"});
  EXPECT_EQ(tool.wait(), 1);
  EXPECT_THAT(tool.errors(), HasSubstr("chronel/backup.conf:2:"));
}

}  // namespace
}  // namespace norvex
