#include "index/TypeTables.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <set>
#include <string>
#include <vector>

#include "index/GlobPattern.h"
#include "index/MimeGlobs.h"
#include "index/StorageClasses.h"
#include "platform/PackageNames.h"

namespace norvex {
namespace {

bool hasCapitals(std::string_view text) {
  return std::any_of(text.begin(), text.end(), [](char c) { return c >= 'A' && c <= 'Z'; });
}

TEST(TypeTables, RowsOfPositionsStandInTheOrderInWhichTheyDecide) {
  std::vector<std::size_t> order;
  for (const PositionRow& row : positionRows()) order.push_back(static_cast<std::size_t>(row.position));
  EXPECT_THAT(order, testing::ElementsAre(7, 0, 8, 16, 5, 6, 9, 12, 1, 2, 3, 4, 10, 13, 14, 15, 11));
}

TEST(TypeTables, NoRowTakesATypeThatALaterRowNames) {
  for (const PositionRow& row : positionRows()) {
    for (const std::string_view type : row.typePatterns) {
      if (hasGlobCharacters(type)) continue;
      EXPECT_EQ(positionOfType(type), row.position) << type;
    }
  }
}

TEST(TypeTables, NoTypeStandsTwiceInARow) {
  for (const PositionRow& row : positionRows()) {
    for (const std::string_view type : row.typePatterns) {
      const auto covers = [&](std::string_view pattern) {
        return pattern == type || globMatches(pattern, type);
      };
      EXPECT_EQ(std::count_if(row.typePatterns.begin(), row.typePatterns.end(), covers), 1) << type;
    }
  }
}

TEST(TypeTables, OwnExtensionsAreSmallAndUnique) {
  std::set<std::string_view> extensions;
  for (const ExtensionRow& row : ownExtensions()) {
    EXPECT_FALSE(hasCapitals(row.extension)) << row.extension;
    EXPECT_TRUE(extensions.insert(row.extension).second) << row.extension;
  }
}

TEST(TypeTables, PackagesOfTheTableArePackagesByName) {
  for (const PackageRow& row : packageTypes()) {
    EXPECT_TRUE(isPackageName("a" + std::string(row.ending))) << row.ending;
    EXPECT_FALSE(hasCapitals(row.ending)) << row.ending;
  }
}

TEST(TypeTables, WellKnownTypesAndTheirIdentifiersAreUnique) {
  std::set<std::string_view> types;
  std::set<std::string_view> identifiers;
  for (const WellKnownRow& row : wellKnownTypes()) {
    EXPECT_TRUE(types.insert(row.type).second) << row.type;
    EXPECT_FALSE(row.identifier.empty() && row.kind.empty()) << row.type;
    if (row.identifier.empty()) continue;
    EXPECT_TRUE(identifiers.insert(row.identifier).second) << row.identifier;
  }
}

TEST(TypeTables, EveryLineThatIsBuiltInIsAnEntry) {
  const std::string_view lines = builtInGlobs();
  MimeGlobs globs;
  globs.addDatabase(lines);
  EXPECT_EQ(globs.patternCount(), static_cast<std::size_t>(std::count(lines.begin(), lines.end(), '\n')));
}

}  // namespace
}  // namespace norvex
