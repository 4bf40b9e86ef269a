#include "index/MimeGlobs.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <random>
#include <string>
#include <vector>

#include "index/GlobPattern.h"

namespace norvex {
namespace {

// The type of a name; empty when it has none.
std::string typeOf(const MimeGlobs& globs, std::string_view name) {
  const auto number = globs.typeOfName(name);
  return number ? globs.types().at(*number) : "";
}

MimeGlobs globsOf(std::initializer_list<std::string_view> databases) {
  MimeGlobs globs;
  for (const std::string_view database : databases) globs.addDatabase(database);
  return globs;
}

struct ConflictCase {
  std::string_view claim;
  std::string_view database;
  std::string_view name;
  std::string_view type;
};

TEST(MimeGlobs, DecidesBetweenEntriesByWeightThenLengthThenLine) {
  constexpr ConflictCase cases[] = {
      {"weight before line", "50:t/low:*.a\n60:t/high:*.a\n", "x.a", "t/high"},
      {"weight before length", "50:t/long:*.tar.gz\n60:t/short:*.gz\n", "x.tar.gz", "t/short"},
      {"length before line", "50:t/short:*.gz\n50:t/long:*.tar.gz\n", "x.tar.gz", "t/long"},
      {"line at last", "50:t/first:*.a\n50:t/second:*.a\n", "x.a", "t/first"},
      {"suffix of weight over whole name", "50:t/name:make.a\n80:t/suffix:*.a\n", "make.a", "t/suffix"},
      {"whole name is longer", "50:t/suffix:*.a\n50:t/name:make.a\n", "make.a", "t/name"},
      {"wildcard that is longer", "50:t/suffix:*.so\n50:t/wild:lib*.s[o]\n", "libx.so", "t/wild"},
      {"wildcard of less weight", "50:t/suffix:*.so\n10:t/wild:lib*.s[o]\n", "libx.so", "t/suffix"},
      {"wildcard by its line", "50:t/one:ab*.c\n50:t/two:a*.cc\n", "ab.cc", "t/two"},
      {"wildcards of equal length", "50:t/one:a*[c]\n50:t/two:[a]*c\n", "abc", "t/one"},
      {"the weight 0 is a weight", "0:t/zero:*.a\n", "x.a", "t/zero"},
      {"the weight 100 is the highest", "99:t/less:*.a\n100:t/most:*.a\n", "x.a", "t/most"},
      {"a suffix begins at any dot", "50:t/a:*.b.c\n", "a.b.c", "t/a"},
      {"a suffix is the end of the name", "50:t/a:*.b\n", "a.b.c", ""},
      {"a suffix may be the whole name", "50:t/a:*.b\n", ".b", "t/a"},
      {"a suffix needs its dot", "50:t/a:*.b\n", "b", ""},
      {"nothing fits", "50:t/a:*.b\n", "x", ""},
      {"an empty name", "50:t/a:*\n", "", ""},
      {"a last line without an end", "50:t/a:*.b", "x.b", "t/a"},
  };
  for (const ConflictCase& each : cases) {
    EXPECT_EQ(typeOf(globsOf({each.database}), each.name), each.type) << each.claim;
  }
}

TEST(MimeGlobs, LooksForTheNameAsItIsBeforeItsSmallLetters) {
  constexpr ConflictCase cases[] = {
      {"capitals fit small patterns", "50:t/a:*.jpg\n", "X.JPG", "t/a"},
      {"so they do for whole names", "50:t/a:makefile\n", "Makefile", "t/a"},
      {"and for wildcards", "10:t/a:readme*\n", "README.first", "t/a"},
      {"a pattern with capitals fits small names", "50:t/a:*.JPG\n", "x.jpg", "t/a"},
      {"exact case wins against more weight", "80:t/small:*.c\n50:t/big:*.C:cs\n", "x.C", "t/big"},
      {"small names do not meet exact capitals", "50:t/big:*.C:cs\n80:t/small:*.c\n", "x.c", "t/small"},
      {"exact small letters refuse capitals", "50:t/a:core:cs\n", "CORE", ""},
      {"exact whole names fit themselves", "50:t/a:core:cs\n", "core", "t/a"},
      {"exact wildcards refuse other cases", "50:t/a:[x]Y*:cs\n", "xy", ""},
      {"exact wildcards fit themselves", "50:t/a:[x]Y*:cs\n", "xYz", "t/a"},
      {"an exact entry hides no other one", "60:t/a:*.c:cs\n50:t/b:*.c\n", "x.C", "t/b"},
      {"the flag among others", "50:t/a:core:xx,cs\n", "Core", ""},
      {"unknown flags say nothing", "50:t/a:core:xx\n", "Core", "t/a"},
      {"fields of the future say nothing", "50:t/a:core::more:fields\n", "Core", "t/a"},
  };
  for (const ConflictCase& each : cases) {
    EXPECT_EQ(typeOf(globsOf({each.database}), each.name), each.type) << each.claim;
  }
}

TEST(MimeGlobs, IgnoresTheRepetitionOfACaseSensitiveLine) {
  const MimeGlobs globs = globsOf({"50:text/x-c++src:*.C:cs\n50:text/x-c++src:*.C\n50:text/x-csrc:*.c\n"});
  EXPECT_EQ(typeOf(globs, "a.C"), "text/x-c++src");
  EXPECT_EQ(typeOf(globs, "a.c"), "text/x-csrc");
}

TEST(MimeGlobs, IgnoresALineThatIsNoEntry) {
  const std::string longPattern = "*." + std::string(MimeGlobs::kMaximumPatternLength, 'x');
  const std::vector<std::string> lines = {
      "",
      ":",
      ":::",
      "50",
      "50:",
      "50:t/a",
      "50:t/a:",
      "50::*.x",
      "50:ta:*.x",
      "50:t/:*.x",
      "50:/a:*.x",
      "50:t/a/b:*.x",
      "50:t a/b:*.x",
      "50:t/\xC3\xA9:*.x",
      "t/a:*.x",
      ":t/a:*.x",
      "-1:t/a:*.x",
      "+1:t/a:*.x",
      " 50:t/a:*.x",
      "50 :t/a:*.x",
      "5x:t/a:*.x",
      "101:t/a:*.x",
      "99999999999999999999:t/a:*.x",
      "#50:t/a:*.x",
      "# 50:t/a:*.x",
      "50:t/a:a/*.x",
      "50:t/a:*.x\r",
      std::string("50:t/a:*.x\0", 11),
      "50:t/a:*.x\x7f",
      "50:t/a:" + longPattern,
      "50:t/" + std::string(300, 'a') + ":*.x",
  };
  for (const std::string& line : lines) {
    const MimeGlobs globs = globsOf({line + "\n50:t/good:*.good\n"});
    EXPECT_EQ(globs.patternCount(), 1U) << line;
    EXPECT_EQ(typeOf(globs, "a.x"), "") << line;
    EXPECT_EQ(typeOf(globs, "a.good"), "t/good") << line;
  }
}

TEST(MimeGlobs, TakesAPatternAsLongAsANameCanBe) {
  const std::string pattern(MimeGlobs::kMaximumPatternLength, 'x');
  EXPECT_EQ(typeOf(globsOf({"50:t/a:" + pattern}), pattern), "t/a");
}

TEST(MimeGlobs, AnEarlierDatabaseWinsOnlyWhereAllElseIsEqual) {
  EXPECT_EQ(typeOf(globsOf({"50:t/user:*.a\n", "50:t/system:*.a\n"}), "x.a"), "t/user");
  EXPECT_EQ(typeOf(globsOf({"50:t/user:*.a\n", "60:t/system:*.a\n"}), "x.a"), "t/system");
  EXPECT_EQ(typeOf(globsOf({"50:t/user:*.a\n", "50:t/system:*.b.a\n"}), "x.b.a"), "t/system");
}

TEST(MimeGlobs, NoGlobsKeepsLaterDatabasesFromATypeOnly) {
  const MimeGlobs globs = globsOf({
      "50:t/a:*.system\n",
      "50:t/a:*.own\n0:t/a:__NOGLOBS__\n50:t/b:*.b\n",
      "90:t/a:*.late\n90:t/b:*.bb\n",
  });
  EXPECT_EQ(typeOf(globs, "x.system"), "t/a");
  EXPECT_EQ(typeOf(globs, "x.own"), "t/a");
  EXPECT_EQ(typeOf(globs, "x.late"), "");
  EXPECT_EQ(typeOf(globs, "x.bb"), "t/b");
  EXPECT_EQ(typeOf(globs, "__NOGLOBS__"), "");
}

TEST(MimeGlobs, SurvivesBytesThatAreNoDatabase) {
  std::mt19937 random(7);
  for (int round = 0; round < 200; ++round) {
    std::string bytes(4096, '\0');
    for (char& byte : bytes) byte = static_cast<char>(random() & 0xFFU);
    // Something that looks like entries, with anything in between.
    for (std::size_t at = 0; at < bytes.size(); at += 64) bytes.replace(at, 7, "\n50:t/a");
    MimeGlobs globs = globsOf({bytes});
    globs.addDatabase("50:t/good:*.good\n");
    EXPECT_EQ(typeOf(globs, "a.good"), "t/good");
  }
}

TEST(MimeGlobs, SurvivesOneHugeLine) {
  const std::string huge(8 << 20, 'x');
  const MimeGlobs globs =
      globsOf({"50:t/a:*." + huge + "\n50:" + huge + "/a:*.b\n" + huge + "\n50:t/c:*.c\n"});
  EXPECT_EQ(globs.patternCount(), 1U);
  EXPECT_EQ(typeOf(globs, "x.c"), "t/c");
}

TEST(MimeGlobs, LimitsItsTypesAndItsWildcards) {
  std::string database;
  for (std::size_t number = 0; number < MimeGlobs::kMaximumTypes + 10; ++number) {
    database += "50:t/" + std::to_string(number) + ":*.e" + std::to_string(number) + "\n";
  }
  for (std::size_t number = 0; number < MimeGlobs::kMaximumWildcards + 10; ++number) {
    database += "50:t/0:w" + std::to_string(number) + "-*\n";
  }
  const MimeGlobs globs = globsOf({database});
  EXPECT_EQ(globs.types().size(), MimeGlobs::kMaximumTypes);
  EXPECT_EQ(globs.patternCount(), MimeGlobs::kMaximumTypes + MimeGlobs::kMaximumWildcards);
  EXPECT_EQ(typeOf(globs, "a.e59999"), "t/59999");
  EXPECT_EQ(typeOf(globs, "a.e60000"), "");
  EXPECT_EQ(typeOf(globs, "w1023-"), "t/0");
  EXPECT_EQ(typeOf(globs, "w1024-"), "");
}

TEST(MimeGlobs, TakesNamesOfAnyLength) {
  const MimeGlobs globs = globsOf({"50:t/a:*.jpg\n"});
  for (const std::size_t length : {1U, 255U, 1020U, 1024U, 5000U}) {
    EXPECT_EQ(typeOf(globs, std::string(length, 'X') + ".JPG"), "t/a") << length;
    EXPECT_EQ(typeOf(globs, std::string(length, '.')), "") << length;
  }
}

// --- against the rules written down as plainly as can be

struct PlainEntry {
  unsigned weight;
  std::string type;
  std::string pattern;
};

std::string plainTypeOf(const std::vector<PlainEntry>& entries, std::string name) {
  const auto bestFor = [&](const std::string& text) {
    const PlainEntry* best = nullptr;
    for (const PlainEntry& entry : entries) {
      if (!globMatches(entry.pattern, text)) continue;
      const bool better = best == nullptr || entry.weight > best->weight ||
                          (entry.weight == best->weight && entry.pattern.size() > best->pattern.size());
      if (better) best = &entry;
    }
    return best;
  };
  const PlainEntry* best = bestFor(name);
  if (best == nullptr) {
    std::transform(name.begin(), name.end(), name.begin(),
                   [](char c) { return c >= 'A' && c <= 'Z' ? static_cast<char>(c + 32) : c; });
    best = bestFor(name);
  }
  return best == nullptr ? "" : best->type;
}

std::string randomText(std::mt19937& random, std::string_view letters, std::size_t longest) {
  std::string text(1 + random() % longest, ' ');
  for (char& letter : text) letter = letters[random() % letters.size()];
  return text;
}

TEST(MimeGlobs, AgreesWithTheRulesOnRandomDatabases) {
  std::mt19937 random(42);
  std::size_t found = 0;
  for (int round = 0; round < 300; ++round) {
    std::vector<PlainEntry> entries;
    std::string database;
    for (unsigned number = 0; number < 12; ++number) {
      const std::string prefix = random() % 2 == 0 ? "*." : "";
      PlainEntry entry{static_cast<unsigned>(random() % 3) * 10, "t/" + std::to_string(number),
                       prefix + randomText(random, random() % 2 == 0 ? "ab." : "ab.*?[]-!\\", 5)};
      database += std::to_string(entry.weight) + ":" + entry.type + ":" + entry.pattern + "\n";
      entries.push_back(std::move(entry));
    }
    const MimeGlobs globs = globsOf({database});
    for (int each = 0; each < 100; ++each) {
      const std::string name = randomText(random, "abA.-", 6);
      const std::string type = typeOf(globs, name);
      ASSERT_EQ(type, plainTypeOf(entries, name)) << name << " in\n" << database;
      if (!type.empty()) ++found;
    }
  }
  EXPECT_GT(found, 5000U);
}

}  // namespace
}  // namespace norvex
