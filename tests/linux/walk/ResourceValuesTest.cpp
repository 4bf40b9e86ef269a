#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstdio>

#include "platform/linux/LinuxResourceValues.h"
#include "tests/linux/walk/ChildProcess.h"
#include "tests/support/TreeOnDisk.h"

namespace norvex {
namespace {

using ondisk::fifo;
using ondisk::file;
using ondisk::folder;
using ondisk::link;
using ondisk::TreeOnDisk;
using enum ResourceKey;

constexpr ResourceKey kItemKeys[] = {FileSize, TotalFileSize, IsDirectory, IsPackage};

TEST(LinuxResourceValues, TellsFilesFoldersPackagesAndLinksApart) {
  const TreeOnDisk tree({file("file", 5), folder("folder"), folder("A.App"), link("toFolder", "folder"),
                         link("link.app", "A.App"), fifo("pipe"),
                         folder("marked").withAttribute("user.norvex.package", "1"),
                         folder("markedOtherwise").withAttribute("user.norvex.package", "yes"),
                         file("markedFile", 3).withAttribute("user.norvex.package", "1")});
  const std::map<std::string, ResourceValueTable> expected = {
      {"file", {{FileSize, 5}, {TotalFileSize, 5}, {IsDirectory, 0}, {IsPackage, 0}}},
      {"folder", {{IsDirectory, 1}, {IsPackage, 0}}},
      {"folder/", {{IsDirectory, 1}, {IsPackage, 0}}},
      {"A.App", {{IsDirectory, 1}, {IsPackage, 1}}},
      {"A.App/", {{IsDirectory, 1}, {IsPackage, 1}}},
      {"toFolder", {{FileSize, 6}, {TotalFileSize, 6}, {IsDirectory, 0}, {IsPackage, 0}}},
      {"toFolder/", {{FileSize, 6}, {TotalFileSize, 6}, {IsDirectory, 0}, {IsPackage, 0}}},
      {"link.app", {{FileSize, 5}, {TotalFileSize, 5}, {IsDirectory, 0}, {IsPackage, 0}}},
      {"pipe", {{FileSize, 0}, {TotalFileSize, 0}, {IsDirectory, 0}, {IsPackage, 0}}},
      {"marked", {{IsDirectory, 1}, {IsPackage, 1}}},
      {"markedOtherwise", {{IsDirectory, 1}, {IsPackage, 0}}},
      {"markedFile", {{FileSize, 3}, {TotalFileSize, 3}, {IsDirectory, 0}, {IsPackage, 0}}},
  };
  LinuxResourceValues values;
  for (const auto& [name, table] : expected) {
    SCOPED_TRACE(name);
    const Location location = Location::file(tree.path(name));
    EXPECT_EQ(values.values(location, kItemKeys).value(), table);
    for (const ResourceKey key : kItemKeys) {
      const auto known = table.find(key);
      EXPECT_EQ(values.value(location, key).value(),
                known == table.end() ? std::nullopt : std::optional(known->second));
    }
  }
}

TEST(LinuxResourceValues, FailsForWhatIsNotThere) {
  const TreeOnDisk tree({file("file")});
  LinuxResourceValues values;
  for (const ResourceKey key :
       {FileSize, TotalFileSize, IsDirectory, VolumeTotalCapacity, VolumeAvailableCapacity}) {
    EXPECT_EQ(values.value(Location::file(tree.path("missing")), key).error().code, ENOENT);
    EXPECT_EQ(values.value(Location::file(tree.path("file/below")), key).error().code, ENOTDIR);
  }
  EXPECT_EQ(values.value(Location::file(tree.path("missing")), IsDirectory).error().description,
            "No such file or directory");
  EXPECT_EQ(values.values(Location::file(tree.path("missing")), kItemKeys).error().code, ENOENT);
  constexpr ResourceKey kVolumeKeys[] = {VolumeAvailableCapacity, VolumeTotalCapacity};
  EXPECT_EQ(values.values(Location::file(tree.path("missing")), kVolumeKeys).error().code, ENOENT);
}

TEST(LinuxResourceValues, TakesWhatCannotBeToldForNoPackage) {
  const TreeOnDisk tree({folder("closed", {folder("A.app")}).withMode(0)});
  asOrdinaryUser([&] {
    LinuxResourceValues values;
    EXPECT_EQ(values.value(Location::folder(tree.path("closed/A.app")), IsPackage).value(), 0u);
    EXPECT_EQ(values.value(Location::folder(tree.path("closed/A.app")), IsDirectory).error().code, EACCES);
  });
}

TEST(LinuxResourceValues, TakesTheFactsThatAWalkLeft) {
  LinuxResourceValues values;
  Location location = Location::folder("/nowhere");
  ItemFacts facts;
  facts.totalFileSize = 12;
  location.moveToItem(location.path().size(), "/item", facts);
  EXPECT_EQ(values.value(location, TotalFileSize).value(), 12u);
  facts.error = EIO;
  location.moveToItem(0, "/nowhere", facts);
  EXPECT_EQ(values.value(location, TotalFileSize).error().code, EIO);
}

TEST(LinuxResourceValues, AgreesWithDfAboutAVolume) {
  const TreeOnDisk tree({folder("inside"), link("link", "inside")});
  const auto figures = [&](const std::string& path) {
    std::FILE* output = ::popen(("df -B1 --output=size,used '" + path + "' | tail -n 1").c_str(), "r");
    std::pair<unsigned long long, unsigned long long> sizeAndUsed;
    EXPECT_EQ(std::fscanf(output, "%llu %llu", &sizeAndUsed.first, &sizeAndUsed.second), 2);
    ::pclose(output);
    return sizeAndUsed;
  };
  constexpr ResourceKey kKeys[] = {VolumeAvailableCapacity, VolumeTotalCapacity};
  for (const std::string& path :
       {tree.path("inside"), tree.path("link"), std::string("/"), std::string("/dev")}) {
    SCOPED_TRACE(path);
    LinuxResourceValues values;
    // The volume is in use, and df may look before a file comes and after it has gone again.
    constexpr int kMostLooks = 50;
    bool agrees = false;
    for (int look = 0; look < kMostLooks && !agrees; ++look) {
      const auto ofDf = figures(path);
      ResourceValueTable table = values.values(Location::folder(path), kKeys).value();
      const auto used = table[VolumeTotalCapacity] - table[VolumeAvailableCapacity];
      agrees = std::pair<unsigned long long, unsigned long long>(table[VolumeTotalCapacity], used) == ofDf;
    }
    EXPECT_TRUE(agrees);
  }
}

}  // namespace
}  // namespace norvex
