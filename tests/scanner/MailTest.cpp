#include <gmock/gmock.h>

#include <cerrno>

#include "scanner/NVXScanner.h"
#include "tests/support/TestPlatform.h"

namespace norvex {
namespace {

using ::testing::ElementsAre;
using ::testing::IsEmpty;

const Location kHome = Location::folder("/Users/user");

using Paths = std::set<std::string>;

TEST(ImapMailboxContent, FindsTheMarkerInTheNamesOfTwoLayouts) {
  const std::string mail = "/Users/user/Library/Mail/";
  const struct {
    const char* claim;
    std::vector<TreeItem> mailFolder;
    Paths found;
  } rows[] = {
      {"an empty mail folder", {}, {}},
      {"one of two names", {folder("V2", {folder("IMAP-a@b"), folder("POP-c")})}, {mail + "IMAP-a@b"}},
      {"the marker anywhere",
       {folder("V2", {folder("old IMAP-a"), folder("x.IMAP-")})},
       {mail + "old IMAP-a", mail + "x.IMAP-"}},
      {"another case is no marker",
       {folder("V2", {folder("imap-a"), folder("Imap-b"), folder("IMAP_c")})},
       {}},
      {"one name in both layouts",
       {folder("V2", {folder("IMAP-a")}), folder("V3", {folder("IMAP-a")})},
       {mail + "IMAP-a"}},
      {"names of both layouts",
       {folder("V2", {folder("IMAP-a")}), folder("V3", {folder("IMAP-b")})},
       {mail + "IMAP-a", mail + "IMAP-b"}},
      {"other layouts are not looked at",
       {folder("V1", {folder("IMAP-a")}), folder("V4", {folder("IMAP-b")}), folder("v2", {folder("IMAP-c")}),
        folder("IMAP-d")},
       {}},
      {"files and hidden entries count",
       {folder("V3", {file("IMAP-f", 1), folder(".IMAP-h")})},
       {mail + "IMAP-f", mail + ".IMAP-h"}},
      {"only one level is looked at", {folder("V2", {folder("x", {folder("IMAP-a")})})}, {}},
      {"an unreadable layout lists nothing",
       {folder("V2", {folder("IMAP-a")}).unreadable(EACCES), folder("V3", {folder("IMAP-b")})},
       {mail + "IMAP-b"}},
      {"a layout that is a file lists nothing", {file("V2", 1)}, {}},
  };
  for (const auto& row : rows) {
    TestPlatform world;
    world.files.put("/Users/user/Library", folder("Mail", row.mailFolder));
    EXPECT_EQ(NVXScanner().imapMailboxContent(kHome), row.found) << row.claim;
    EXPECT_THAT(world.systemLog.lines, IsEmpty()) << row.claim;
  }
}

TEST(ImapMailboxContent, OfAHomeWithoutMailIsEmpty) {
  TestPlatform world;
  EXPECT_THAT(NVXScanner().imapMailboxContent(kHome), IsEmpty());
  EXPECT_THAT(world.calls.all(),
              ElementsAre("names /Users/user/Library/Mail/V2", "names /Users/user/Library/Mail/V3"));
}

TEST(ImapMailboxContent, NormalisesThePathOfTheMailFolder) {
  for (const char* home : {"/Users/user/", "/Users//user", "/Users/./user", "/Users/x/../user"}) {
    TestPlatform world;
    world.files.put("/Users/user/Library/Mail/V2", folder("IMAP-a"));
    EXPECT_THAT(NVXScanner().imapMailboxContent(Location::folder(home)),
                ElementsAre("/Users/user/Library/Mail/IMAP-a"))
        << home;
  }
}

}  // namespace
}  // namespace norvex
