#include "index/ContentTypes.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/stat.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <random>
#include <set>
#include <string>
#include <thread>

#include "index/TypeTables.h"

namespace norvex {
namespace {

namespace fs = std::filesystem;
using testing::ElementsAre;

// A folder of this test's own that goes away with it.
class TemporaryFolder {
 public:
  TemporaryFolder() {
    std::string pattern = (fs::temp_directory_path() / "norvex-types-XXXXXX").string();
    if (::mkdtemp(pattern.data()) == nullptr) std::abort();
    path_ = pattern;
  }
  ~TemporaryFolder() {
    std::error_code ignored;
    fs::remove_all(path_, ignored);
  }
  TemporaryFolder(const TemporaryFolder&) = delete;
  TemporaryFolder& operator=(const TemporaryFolder&) = delete;

  const fs::path& path() const { return path_; }

  // A folder that holds this database.
  fs::path database(const std::string& name, const std::string& text) const {
    fs::create_directories(path_ / name);
    std::ofstream(path_ / name / "globs2", std::ios::binary) << text;
    return path_ / name;
  }

 private:
  fs::path path_;
};

// So many entries that the table that is built in has no part in it.
std::string bulk() {
  std::string text;
  for (int number = 0; number < 500; ++number) {
    text += "50:x-bulk/" + std::to_string(number) + ":*.bulk" + std::to_string(number) + "\n";
  }
  return text;
}

ContentTypes typesOf(const std::string& database) {
  const TemporaryFolder folder;
  return ContentTypes::load({folder.database("mime", database)});
}

std::string fileIdentifier(const ContentTypes& types, std::string_view name) {
  return types.type(types.ofFile(name)).identifier;
}

TEST(ContentTypes, LooksForDatabasesInTheUsersFolderFirst) {
  EXPECT_THAT(ContentTypes::defaultMimeFolders("/home/user/.local/share"),
              ElementsAre(fs::path("/home/user/.local/share/mime"), fs::path("/usr/local/share/mime"),
                          fs::path("/usr/share/mime")));
}

struct FileCase {
  std::string_view name;
  std::string_view identifier;
  std::string_view kind;
  std::vector<std::string> tree;
};

TEST(ContentTypes, DescribesFilesByTheirMimeType) {
  const ContentTypes types = typesOf(bulk() +
                                     "50:image/jpeg:*.jpg\n50:image/x-canon-cr2:*.cr2\n50:audio/mpeg:*.mp3\n"
                                     "50:audio/mp4:*.m4a\n50:video/mp4:*.mp4\n50:video/x-mng:*.mng\n"
                                     "50:text/plain:*.txt\n50:text/x-csharp:*.cs\n50:application/zip:*.zip\n"
                                     "50:application/x-blender:*.blend\n50:image/svg+xml:*.svg\n");
  const std::vector<FileCase> cases = {
      {"a.jpg", "public.jpeg", "JPEG image", {"public.jpeg", "public.image", "public.data", "public.item"}},
      {"a.svg",
       "public.svg-image",
       "SVG image",
       {"public.svg-image", "public.image", "public.data", "public.item"}},
      {"a.cr2",
       "image/x-canon-cr2",
       "CANON-CR2 image",
       {"image/x-canon-cr2", "public.image", "public.data", "public.item"}},
      {"a.mp3", "public.mp3", "MP3 audio", {"public.mp3", "public.audio", "public.data", "public.item"}},
      {"a.m4a",
       "public.mpeg-4-audio",
       "MPEG-4 audio",
       {"public.mpeg-4-audio", "public.audio", "public.data", "public.item"}},
      {"a.mp4",
       "public.mpeg-4",
       "MPEG-4 movie",
       {"public.mpeg-4", "public.movie", "public.data", "public.item"}},
      {"a.mng", "video/x-mng", "MNG movie", {"video/x-mng", "public.video", "public.data", "public.item"}},
      {"a.txt",
       "public.plain-text",
       "Plain text",
       {"public.plain-text", "public.text", "public.data", "public.item"}},
      {"a.cs",
       "text/x-csharp",
       "Source code",
       {"text/x-csharp", "public.text", "public.data", "public.item"}},
      {"a.zip", "public.zip-archive", "ZIP archive", {"public.zip-archive", "public.data", "public.item"}},
      {"a.blend",
       "application/x-blender",
       "Document",
       {"application/x-blender", "public.data", "public.item"}},
      {"a", "public.data", "Document", {"public.data", "public.item"}},
      {"", "public.data", "Document", {"public.data", "public.item"}},
  };
  for (const FileCase& each : cases) {
    const ContentType& type = types.type(types.ofFile(each.name));
    EXPECT_EQ(type.identifier, each.identifier) << each.name;
    EXPECT_EQ(type.kind, each.kind) << each.name;
    EXPECT_EQ(type.tree, each.tree) << each.name;
    EXPECT_EQ(type.isKnown, type.identifier != "public.data") << each.name;
  }
}

struct OwnCase {
  std::string_view name;
  std::string_view identifier;
  std::string_view kind;
};

TEST(ContentTypes, KnowsTheProjectsOwnExtensionsInAnyCaseBeforeEveryDatabase) {
  // A database that claims all of them, with the highest weight, as they are spelt, and by whole names.
  std::string hostile = bulk();
  for (const ExtensionRow& row : ownExtensions()) {
    const std::string extension(row.extension);
    hostile += "100:t/stolen:*." + extension + "\n100:t/stolen:a." + extension + ":cs\n";
  }
  hostile += "100:t/stolen:*.IPA:cs\n";
  const ContentTypes types = typesOf(hostile);
  constexpr OwnCase cases[] = {
      {"a.ipa", "com.brixo.sonpix.ipa", "Phone Application"},
      {"a.IPA", "com.brixo.sonpix.ipa", "Phone Application"},
      {"a.b.Ipa", "com.brixo.sonpix.ipa", "Phone Application"},
      {".ipa", "com.brixo.sonpix.ipa", "Phone Application"},
      {"a.m4p", "public.mpeg-4-audio", "MPEG-4 audio"},
      {"a.M4P", "public.mpeg-4-audio", "MPEG-4 audio"},
      {"a.vmdk", "application/x-vmdk-disk", "Virtual Disk Image"},
      {"a.vdi", "application/x-vdi-disk", "Virtual Disk Image"},
      {"a.vhd", "application/x-vhd-disk", "Virtual Disk Image"},
      {"a.VHDX", "application/x-vhdx-disk", "Virtual Disk Image"},
      {"a.qcow", "application/x-qemu-disk", "Virtual Disk Image"},
      {"a.qcow2", "application/x-qemu-disk", "Virtual Disk Image"},
      {"a.hdd", "application/x-hdd-disk", "Virtual Disk Image"},
      {"a.appimage", "application/vnd.appimage", "Application"},
      {"a.AppImage", "application/vnd.appimage", "Application"},
      {"a.snap", "application/vnd.snap", "Application"},
  };
  for (const OwnCase& each : cases) {
    const ContentType& type = types.type(types.ofFile(each.name));
    EXPECT_EQ(type.identifier, each.identifier) << each.name;
    EXPECT_EQ(type.kind, each.kind) << each.name;
  }
  for (const std::string_view name : {"a.ipa.", "a.ipax", "aipa", "ipa", "a.ip", "a.ipa.txt~"}) {
    EXPECT_NE(fileIdentifier(types, name), "com.brixo.sonpix.ipa") << name;
  }
}

TEST(ContentTypes, NoOtherDiskImageIsAVirtualOne) {
  const ContentTypes types =
      typesOf(bulk() + "50:application/x-raw-disk-image:*.img\n50:application/x-qed-disk:*.qed\n");
  for (const std::string_view name : {"a.img", "a.qed"}) {
    EXPECT_EQ(types.type(types.ofFile(name)).kind, "Disk Image") << name;
  }
}

TEST(ContentTypes, TheTypeOfAnyBytesIsNoKnownType) {
  const ContentTypes types = typesOf(bulk() + "50:application/octet-stream:*.bin\n");
  EXPECT_EQ(types.ofFile("a.bin"), types.ofFile("a"));
  EXPECT_FALSE(types.type(types.ofFile("a.bin")).isKnown);
}

struct FolderCase {
  std::string_view name;
  bool mark;
  std::string_view identifier;
  std::string_view kind;
};

TEST(ContentTypes, FoldersAreFoldersOrTheirPackage) {
  const ContentTypes types = ContentTypes::load({});
  constexpr FolderCase cases[] = {
      {"Pictures", false, "public.folder", "Folder"},
      {"a.jpg", false, "public.folder", "Folder"},
      {"a.ipa", false, "public.folder", "Folder"},
      {"a.hdd", false, "public.folder", "Folder"},
      {"", false, "public.folder", "Folder"},
      {"Pictures", true, "public.package", "Package"},
      {"a.jpg", true, "public.package", "Package"},
      {"Viewer.app", false, "public.application-bundle", "Application"},
      {"Viewer.APP", true, "public.application-bundle", "Application"},
      {"Viewer.AppDir", false, "public.application-bundle", "Application"},
      {"a.bundle", false, "public.bundle", "Bundle"},
      {"a.framework", false, "public.framework", "Framework"},
      {"a.plugin", false, "public.plugin", "Plug-in"},
      {"a.vmwarevm", false, "com.vmware.vm-package", "Virtual Machine"},
      {"a.VMwareVM", false, "com.vmware.vm-package", "Virtual Machine"},
      {"a.pvm", false, "com.parallels.vm.vmpackage", "Virtual Machine"},
      {"a.rtfd", false, "public.rich-text-package", "Rich text document"},
      {"a.picaralibrary", false, "public.photo-library", "Photo Library"},
      {"a.lumvialibrary", false, "public.photo-library", "Photo Library"},
      {"a.sonpixlibrary", false, "public.media-library", "Media Library"},
  };
  for (const FolderCase& each : cases) {
    const ContentType& type = types.type(types.ofFolder(each.name, each.mark));
    EXPECT_EQ(type.identifier, each.identifier) << each.name;
    EXPECT_EQ(type.kind, each.kind) << each.name;
  }
}

TEST(ContentTypes, WhatIsNoFileIsNoData) {
  const ContentTypes types = ContentTypes::load({});
  EXPECT_THAT(types.type(types.ofFolder("a", false)).tree,
              ElementsAre("public.folder", "public.directory", "public.item"));
  EXPECT_THAT(types.type(types.ofFolder("a", true)).tree,
              ElementsAre("public.package", "public.directory", "public.item"));
  EXPECT_THAT(types.type(types.ofFolder("a.pvm", false)).tree,
              ElementsAre("com.parallels.vm.vmpackage", "public.package", "public.directory", "public.item"));
  EXPECT_THAT(types.type(types.symbolicLink()).tree, ElementsAre("public.symlink", "public.item"));
  EXPECT_THAT(types.type(types.other()).tree, ElementsAre("public.special-file", "public.item"));
}

TEST(ContentTypes, EachIdentifierHasOneNumberAndLeadsItsTree) {
  const ContentTypes types = ContentTypes::load(ContentTypes::defaultMimeFolders("/nonexistent"));
  std::set<std::string> identifiers;
  for (std::size_t id = 0; id < types.size(); ++id) {
    const ContentType& type = types.type(static_cast<TypeId>(id));
    EXPECT_TRUE(identifiers.insert(type.identifier).second) << type.identifier;
    ASSERT_FALSE(type.tree.empty());
    EXPECT_EQ(type.tree.front(), type.identifier);
    EXPECT_EQ(type.tree.back(), "public.item") << type.identifier;
    EXPECT_FALSE(type.kind.empty()) << type.identifier;
  }
}

// --- databases

TEST(ContentTypes, UsesItsOwnTableWhereNoDatabaseIsInstalled) {
  const TemporaryFolder folder;
  fs::create_directories(folder.path() / "folder" / "globs2");
  fs::create_directories(folder.path() / "dangling");
  fs::create_symlink("nowhere", folder.path() / "dangling" / "globs2");
  fs::create_directories(folder.path() / "fifo");
  ASSERT_EQ(::mkfifo((folder.path() / "fifo" / "globs2").c_str(), 0600), 0);
  const std::vector<fs::path> databases[] = {
      {},
      {folder.path() / "missing"},
      {folder.path() / "folder"},
      {folder.path() / "dangling"},
      {folder.path() / "fifo"},
      {folder.database("empty", "")},
      {folder.database("comments", "# nothing\n# here\n")},
      {folder.database("lines", "\n\n\n")},
  };
  for (const auto& each : databases) {
    const ContentTypes types = ContentTypes::load(each);
    EXPECT_EQ(fileIdentifier(types, "a.jpg"), "public.jpeg") << testing::PrintToString(each);
    EXPECT_EQ(fileIdentifier(types, "a.MP3"), "public.mp3");
    EXPECT_EQ(fileIdentifier(types, "a.mkv"), "video/x-matroska");
    EXPECT_EQ(fileIdentifier(types, "libc.so.6"), "application/x-sharedlib");
    EXPECT_EQ(fileIdentifier(types, "a.tar.gz"), "application/x-compressed-tar");
  }
}

TEST(ContentTypes, AFewEntriesOfTheUsersOwnAreNoDatabase) {
  const ContentTypes types = typesOf("10:t/mine:*.jpg\n50:t/new:*.new\n0:image/png:__NOGLOBS__\n");
  EXPECT_EQ(fileIdentifier(types, "a.jpg"), "t/mine");
  EXPECT_EQ(fileIdentifier(types, "a.new"), "t/new");
  EXPECT_EQ(fileIdentifier(types, "a.gif"), "public.gif");
  EXPECT_EQ(fileIdentifier(types, "a.png"), "public.data");
}

TEST(ContentTypes, AnInstalledDatabaseStandsAlone) {
  const ContentTypes types = typesOf(bulk());
  EXPECT_EQ(fileIdentifier(types, "a.bulk499"), "x-bulk/499");
  EXPECT_EQ(fileIdentifier(types, "a.jpg"), "public.data");
}

TEST(ContentTypes, FoldersOfDatabasesCountInTheirOrder) {
  const TemporaryFolder folder;
  const fs::path user = folder.database("user", "50:t/user:*.both\n0:t/closed:__NOGLOBS__\n");
  const fs::path system = folder.database("system", bulk() + "50:t/system:*.both\n50:t/closed:*.closed\n");
  const ContentTypes types = ContentTypes::load({user, folder.path() / "missing", system});
  EXPECT_EQ(fileIdentifier(types, "a.both"), "t/user");
  EXPECT_EQ(fileIdentifier(types, "a.closed"), "public.data");
  const ContentTypes reversed = ContentTypes::load({system, user});
  EXPECT_EQ(fileIdentifier(reversed, "a.both"), "t/system");
  EXPECT_EQ(fileIdentifier(reversed, "a.closed"), "t/closed");
}

TEST(ContentTypes, CutsAHugeDatabaseAfterAWholeLine) {
  // The last line that is read ends in the middle of "*.halfway", which would be the entry "*.half".
  const std::string half = "50:t/half:*.half";
  std::string text = "50:t/first:*.first\n";
  const std::size_t fill = ContentTypes::kMaximumDatabaseBytes - text.size() - half.size();
  text += "#" + std::string(fill - 2, 'x') + "\n" + half + "way\n50:t/last:*.last\n";
  const ContentTypes types = typesOf(text);
  EXPECT_EQ(fileIdentifier(types, "a.first"), "t/first");
  EXPECT_EQ(fileIdentifier(types, "a.half"), "public.data");
  EXPECT_EQ(fileIdentifier(types, "a.halfway"), "public.data");
  EXPECT_EQ(fileIdentifier(types, "a.last"), "public.data");
}

TEST(ContentTypes, SurvivesBytesThatAreNoDatabase) {
  std::mt19937 random(11);
  std::string bytes(1 << 20, '\0');
  for (char& byte : bytes) byte = static_cast<char>(random() & 0xFFU);
  const ContentTypes types = typesOf(bytes);
  EXPECT_EQ(fileIdentifier(types, "a.jpg"), "public.jpeg");
}

TEST(ContentTypes, NumbersEveryTypeOfTheLargestDatabase) {
  std::string text;
  for (int number = 0; number < 70000; ++number) {
    text += "50:t/" + std::to_string(number) + ":*.e" + std::to_string(number) + "\n";
  }
  const ContentTypes types = typesOf(text);
  EXPECT_EQ(fileIdentifier(types, "a.e0"), "t/0");
  EXPECT_EQ(fileIdentifier(types, "a.e59999"), "t/59999");
  EXPECT_EQ(fileIdentifier(types, "a.e69999"), "public.data");
  EXPECT_EQ(types.type(types.symbolicLink()).identifier, "public.symlink");
}

TEST(ContentTypes, AreReadByManyThreadsAtOnce) {
  const ContentTypes types = ContentTypes::load({});
  const TypeId expected = types.ofFile("PICTURE.JPG");
  std::vector<std::thread> threads;
  std::vector<int> wrong(4, 0);
  for (std::size_t number = 0; number < wrong.size(); ++number) {
    threads.emplace_back([&, number] {
      for (int round = 0; round < 1000; ++round) {
        if (types.ofFile("PICTURE.JPG") != expected) ++wrong[number];
      }
    });
  }
  for (std::thread& thread : threads) thread.join();
  EXPECT_THAT(wrong, testing::Each(0));
}

TEST(ContentTypes, KnowsCommonNamesByTheInstalledDatabase) {
  if (!fs::exists("/usr/share/mime/globs2")) GTEST_SKIP() << "shared-mime-info is not installed";
  const ContentTypes types = ContentTypes::load({"/usr/share/mime"});
  constexpr OwnCase cases[] = {
      {"a.jpg", "public.jpeg", "JPEG image"},           {"A.JPEG", "public.jpeg", "JPEG image"},
      {"a.heic", "public.heif", "HEIF image"},          {"a.mp3", "public.mp3", "MP3 audio"},
      {"a.m4p", "public.mpeg-4-audio", "MPEG-4 audio"}, {"a.mp4", "public.mpeg-4", "MPEG-4 movie"},
      {"a.mov", "video/quicktime", "QUICKTIME movie"},  {"a.C", "text/x-c++src", "Source code"},
      {"a.c", "public.c-source", "C source code"},      {"libc.so.6", "application/x-sharedlib", "Library"},
      {"ls.1", "application/x-troff-man", "Document"},  {"a.pdf", "public.pdf", "PDF document"},
      {"Makefile", "text/x-makefile", "Source code"},   {"README.first", "text/x-readme", "Text document"},
      {"a~", "application/x-trash", "Document"},        {"a.eml", "public.email-message", "Mail"},
  };
  for (const OwnCase& each : cases) {
    const ContentType& type = types.type(types.ofFile(each.name));
    EXPECT_EQ(type.identifier, each.identifier) << each.name;
    EXPECT_EQ(type.kind, each.kind) << each.name;
  }
}

}  // namespace
}  // namespace norvex
