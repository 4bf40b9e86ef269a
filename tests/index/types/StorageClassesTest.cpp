#include "index/StorageClasses.h"

#include <gtest/gtest.h>

#include <array>
#include <numeric>
#include <random>
#include <string>
#include <vector>

#include "index/AccumulatedSizes.h"

namespace norvex {
namespace {

using Position = StoragePosition;

// Types that the rows name, each row with what is at its edges.
struct TypeCase {
  std::string_view type;
  std::size_t position;
};

constexpr TypeCase typeCases[] = {
    {"application/vnd.appimage", 7},
    {"application/vnd.snap", 7},
    {"com.brixo.sonpix.ipa", 7},
    {"message/rfc822", 0},
    {"application/mbox", 0},
    {"application/vnd.sqlite3", 8},
    {"application/x-sqlite2", 8},
    {"application/vnd.ms-access", 8},
    {"text/vcard", 16},
    {"text/x-vcard", 16},
    {"text/calendar", 16},
    {"text/x-csrc", 5},
    {"text/x-c++hdr", 5},
    {"text/x-python", 5},
    {"text/x-python3", 5},
    {"text/x-java", 5},
    {"text/rust", 5},
    {"text/x-go", 5},
    {"application/x-shellscript", 5},
    {"application/x-perl", 5},
    {"application/x-ruby", 5},
    {"application/x-php", 5},
    {"application/javascript", 5},
    {"text/javascript", 5},
    {"application/json", 5},
    {"application/geo+json", 5},
    {"text/css", 5},
    {"application/xml", 5},
    {"text/xml", 5},
    {"text/x-makefile", 5},
    {"video/mp4", 6},
    {"video/x-mng", 6},
    {"audio/mpeg", 9},
    {"audio/mp4", 9},
    {"audio/ogg", 9},
    {"image/jpeg", 12},
    {"image/svg+xml", 12},
    {"image/vnd.djvu", 12},
    {"application/x-sharedlib", 1},
    {"application/x-object", 1},
    {"application/x-java-archive", 1},
    {"application/x-python-bytecode", 1},
    {"application/zip", 2},
    {"application/gzip", 2},
    {"application/x-tar", 2},
    {"application/x-compressed-tar", 2},
    {"application/x-xz-compressed-tar", 2},
    {"application/x-7z-compressed", 2},
    {"application/vnd.rar", 2},
    {"application/vnd.debian.binary-package", 2},
    {"application/x-cd-image", 3},
    {"application/x-raw-disk-image", 3},
    {"application/x-vmdk-disk", 3},
    {"application/x-qemu-disk", 3},
    {"application/x-hdd-disk", 3},
    {"font/ttf", 4},
    {"application/x-font-type1", 4},
    {"application/pdf", 10},
    {"application/x-gzpdf", 10},
    {"text/plain", 11},
    {"text/markdown", 11},
    {"text/html", 11},
    {"application/xhtml+xml", 11},
    {"text/csv", 11},
    {"text/made-up-tomorrow", 11},
    {"application/msword", 13},
    {"application/vnd.openxmlformats-officedocument.wordprocessingml.document", 13},
    {"application/vnd.oasis.opendocument.text", 13},
    {"application/vnd.oasis.opendocument.text-template", 13},
    {"application/rtf", 13},
    {"text/richtext", 13},
    {"application/epub+zip", 13},
    {"application/postscript", 13},
    {"text/x-tex", 13},
    {"application/vnd.ms-excel", 14},
    {"application/vnd.openxmlformats-officedocument.spreadsheetml.sheet", 14},
    {"application/vnd.oasis.opendocument.spreadsheet", 14},
    {"text/spreadsheet", 14},
    {"application/vnd.ms-powerpoint", 15},
    {"application/vnd.openxmlformats-officedocument.presentationml.presentation", 15},
    {"application/vnd.oasis.opendocument.presentation", 15},
    {"application/x-blender", 17},
    {"application/x-ms-dos-executable", 17},
    {"application/x-trash", 17},
    {"model/obj", 17},
    {"public.data", 17},
    {"", 17},
    // Only whole names count.
    {"application/pdf2", 17},
    {"xtext/plain", 17},
    {"application/jsonx", 17},
};

TEST(StorageClasses, CountsEachTypeAtTheFirstRowThatNamesIt) {
  for (const TypeCase& each : typeCases) {
    EXPECT_EQ(static_cast<std::size_t>(positionOfType(each.type)), each.position) << each.type;
  }
}

ContentType typeAt(Position position, bool isKnown = true) {
  ContentType type;
  type.position = position;
  type.isKnown = isKnown;
  return type;
}

struct ContextCase {
  std::string_view claim;
  ContentType type;
  ItemContext context;
  Position position;
};

TEST(StorageClasses, AsksApplicationsAndMailBeforeTheType) {
  const ContextCase cases[] = {
      {"the type alone", typeAt(Position::images), {}, Position::images},
      {"unknown data", typeAt(Position::other, false), {}, Position::other},
      {"an image in an application",
       typeAt(Position::images),
       {.insideApplication = true},
       Position::applications},
      {"mail in an application",
       typeAt(Position::messages),
       {.insideApplication = true},
       Position::applications},
      {"a Maildir in an application",
       typeAt(Position::other, false),
       {.insideApplication = true, .inMaildir = true},
       Position::applications},
      {"an unnamed program", typeAt(Position::other, false), {.executable = true}, Position::applications},
      {"a script that its name tells",
       typeAt(Position::sourceCode),
       {.executable = true},
       Position::sourceCode},
      {"a known name of no class", typeAt(Position::other), {.executable = true}, Position::other},
      {"an executable message of a Maildir",
       typeAt(Position::other, false),
       {.inMaildir = true, .executable = true},
       Position::applications},
      {"a message of a Maildir", typeAt(Position::other, false), {.inMaildir = true}, Position::messages},
      {"an image in a Maildir", typeAt(Position::images), {.inMaildir = true}, Position::messages},
      {"a phone application in a Maildir",
       typeAt(Position::applications),
       {.inMaildir = true},
       Position::applications},
      {"contacts in a Maildir",
       typeAt(Position::contactsAndCalendars),
       {.inMaildir = true},
       Position::messages},
  };
  for (const ContextCase& each : cases)
    EXPECT_EQ(positionOf(each.type, each.context), each.position) << each.claim;
}

struct RandomFile {
  std::string name;
  ItemContext context;
  std::uint64_t size = 0;
};

std::vector<RandomFile> randomTree(std::mt19937_64& random) {
  constexpr std::string_view endings[] = {"",        ".jpg",  ".MP3", ".mp4", ".c",   ".so.1",
                                          ".tar.gz", ".iso",  ".ttf", ".pdf", ".txt", ".odt",
                                          ".xlsx",   ".odp",  ".vcf", ".mdb", ".eml", ".ipa",
                                          ".exe",    ".snap", "~",    ".m4p", ".vhd", ".unheard-of"};
  std::vector<RandomFile> files(1 + random() % 500);
  for (RandomFile& file : files) {
    file.name = "file" + std::string(endings[random() % std::size(endings)]);
    file.context = {random() % 8 == 0, random() % 8 == 0, random() % 4 == 0};
    file.size = random() % (std::uint64_t{1} << (random() % 48));
  }
  return files;
}

TEST(StorageClasses, TheSumOverThePositionsIsTheSumOverTheFiles) {
  const ContentTypes types = ContentTypes::load({});
  std::mt19937_64 random(3);
  std::array<bool, kStoragePositionCount> met{};
  for (int round = 0; round < 100; ++round) {
    // Two threads' shares, merged.
    AccumulatedSizes shares[2];
    std::uint64_t sum = 0;
    for (const RandomFile& file : randomTree(random)) {
      const Position position = positionOf(types.type(types.ofFile(file.name)), file.context);
      ASSERT_LT(static_cast<std::size_t>(position), kStoragePositionCount);
      met[static_cast<std::size_t>(position)] = true;
      shares[random() % 2].add(position, file.size);
      sum += file.size;
    }
    shares[0].merge(shares[1]);
    const auto& values = shares[0].values();
    EXPECT_EQ(
        std::accumulate(values.begin(), values.end(), std::uint64_t{0},
                        [](std::uint64_t a, std::int64_t b) { return a + static_cast<std::uint64_t>(b); }),
        sum);
  }
  for (std::size_t position = 0; position < met.size(); ++position) EXPECT_TRUE(met[position]) << position;
}

}  // namespace
}  // namespace norvex
