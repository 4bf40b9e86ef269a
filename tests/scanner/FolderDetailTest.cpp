#include <gmock/gmock.h>

#include <cerrno>

#include "scanner/NVXScanner.h"
#include "tests/scanner/ScanWorld.h"

namespace norvex {
namespace {

using ::testing::IsEmpty;

// The six figures of one folder; "" stands for all of them being 0.
struct Detail {
  int bytes, folders, files, objects, packages, inPackages;
};

std::string text(const std::string& prefix, const Detail& detail) {
  const std::pair<const char*, int> figures[] = {
      {"FolderSize", detail.bytes},      {"DirectoryCount", detail.folders},
      {"FileCount", detail.files},       {"FilesystemObjectCount", detail.objects},
      {"PackageCount", detail.packages}, {"PackageContentsFilesystemObjectCount", detail.inPackages},
  };
  std::string line;
  for (const auto& [name, value] : figures) {
    if (value != 0) line += (line.empty() ? "" : " ") + prefix + name + "=" + std::to_string(value);
  }
  return line;
}

const struct {
  const char* claim;
  std::vector<TreeItem> contents;
  Detail detail;
} kRows[] = {
    {"an empty folder", {}, {}},
    {"files and folders", {file("a", 1), folder("b", {file(".c", 2), folder("d")})}, {3, 2, 2, 4, 0, 0}},
    {"a package with two files", {package("A.app", {file("x", 5), file("y", 6)})}, {11, 1, 2, 3, 1, 2}},
    {"a file after a package is outside it",
     {package("A.app", {file("x", 5)}), file("z", 6)},
     {11, 1, 2, 3, 1, 1}},
    {"a folder after a package is outside it, and so is what follows",
     {package("A.app", {file("x", 5)}), folder("b", {file("y", 1)})},
     {6, 2, 2, 4, 1, 1}},
    {"an empty package swallows its neighbour", {package("A.app"), package("B.app")}, {0, 2, 0, 2, 2, 1}},
    {"a package swallows its neighbour, whatever it holds itself",
     {package("A.app", {file("x", 1)}), package("B.app", {file("y", 2)})},
     {3, 2, 2, 4, 2, 3}},
    {"a file between two packages keeps them apart",
     {package("A.app"), file("B", 1), package("C.app")},
     {1, 2, 1, 3, 2, 0}},
    {"folders inside a package count as its contents",
     {package("A.app", {folder("c", {file("x", 1)}), file("d", 2)})},
     {3, 2, 2, 4, 1, 3}},
    {"what follows an inner package is outside the outer one",
     {package("A.app", {package("B.app", {file("x", 1)}), file("y", 2), file("z", 4)})},
     {7, 2, 3, 5, 2, 2}},
    {"an inner package counts as contents of the outer one",
     {package("A.app", {folder("c", {package("B.app", {file("x", 1)})})})},
     {1, 3, 1, 4, 2, 3}},
    {"the outer package is left at the depth of the inner one",
     {package("A.app", {folder("c", {package("B.app")}), folder("d", {file("x", 1)})})},
     {1, 4, 1, 5, 2, 2}},
    {"a package below a folder",
     {folder("b", {package("A.app", {file("x", 1)}), file("y", 1)})},
     {2, 2, 2, 4, 1, 1}},
    {"a file without a size counts with 0", {file("a", 5).withoutTotalSize()}, {0, 0, 1, 1, 0, 0}},
    {"a link is a file of its own size", {link("l", "/", 1)}, {1, 0, 1, 1, 0, 0}},
};

TEST(FolderDetail, CountsTheDesktop) {
  for (const auto& row : kRows) {
    ScanWorld world;
    world.installation.isInternal = true;
    world.files.put("/Users/user", folder("Desktop", row.contents));
    EXPECT_EQ(figures(NVXScanner().scan(), {"desktop", "documents"}), text("desktop", row.detail))
        << row.claim;
    EXPECT_THAT(world.systemLog.lines, IsEmpty()) << row.claim;
  }
}

TEST(FolderDetail, CountsTheDocumentsInTheSameWay) {
  for (const auto& row : kRows) {
    ScanWorld world;
    world.installation.isInternal = true;
    world.files.put("/Users/user", folder("Documents", row.contents));
    EXPECT_EQ(figures(NVXScanner().scan(), {"desktop", "documents"}), text("documents", row.detail))
        << row.claim;
  }
}

TEST(FolderDetail, StartsTheDocumentsOutsideThePackageThatEndedTheDesktop) {
  ScanWorld world;
  world.installation.isInternal = true;
  world.files.put("/Users/user", folder("Desktop", {package("Z.app")}));
  world.files.put("/Users/user", folder("Documents", {package("A.app")}));
  EXPECT_EQ(figures(NVXScanner().scan(), {"desktop", "documents"}),
            text("desktop", {0, 1, 0, 1, 1, 0}) + " " + text("documents", {0, 1, 0, 1, 1, 0}));
}

TEST(FolderDetail, PassesOverWhatCannotBeRead) {
  ScanWorld world;
  world.installation.isInternal = true;
  world.files.put("/Users/user",
                  folder("Desktop", {file("a", 1).withoutAttributes(EACCES),
                                     file("b", 2).failing(ResourceKey::TotalFileSize, EIO), file("c", 4)}));
  EXPECT_EQ(figures(NVXScanner().scan(), {"desktop"}), text("desktop", {4, 0, 1, 1, 0, 0}));
  EXPECT_EQ(world.systemLog.lines.size(), 2U);
}

TEST(FolderDetail, IsNotMeasuredOnAnOrdinaryInstallation) {
  ScanWorld world;
  world.files.put("/Users/user", folder("Desktop", {file("a", 1)}));
  world.files.put("/Users/user", folder("Documents", {package("A.app")}));
  EXPECT_EQ(figures(NVXScanner().scan(), {"desktop", "documents"}), "");
  for (const auto& walk : world.directoryEnumeration.walks) {
    EXPECT_TRUE(walk.rootPath.ends_with("Downloads") || walk.rootPath.ends_with("Backup")) << walk.rootPath;
  }
}

}  // namespace
}  // namespace norvex
