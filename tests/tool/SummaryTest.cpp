#include "tool/SummaryCommand.h"

#include <gtest/gtest.h>

#include <nlohmann/json.hpp>

#include "GoldenFile.h"
#include "MeasuredWorld.h"
#include "scanner/NVXScanner.h"

namespace norvex {
namespace {

TEST(Summary, WritesTheRecordsOwnLines) {
  MeasuredWorld machine;
  EXPECT_EQ(runSummary(machine.world, {.updateIndex = false}), ExitStatus::success);
  EXPECT_EQ(machine.output(), NVXScanner().scan()->description());
  expectGolden("summary.txt", machine.output());
  EXPECT_EQ(machine.errors(), "");
}

TEST(Summary, JsonHoldsEachFigureWithItsLabel) {
  MeasuredWorld machine;
  EXPECT_EQ(runSummary(machine.world, {.updateIndex = false, .json = true}), ExitStatus::success);
  const auto document = nlohmann::json::parse(machine.output());
  EXPECT_EQ(document["version"], 1);
  ASSERT_EQ(document["figures"].size(), 80U);
  EXPECT_EQ(document["figures"][0]["label"], "Hardware Model Identifier");
  EXPECT_EQ(document["figures"][0]["figure"], "Model1,1");
  EXPECT_EQ(document["figures"][1]["figure"], 470'000'000'000);
}

TEST(Summary, FailsWithoutARecord) {
  MeasuredWorld machine;
  machine.metadataIndex.volumes["/"].hasHealthCheck = false;
  EXPECT_EQ(runSummary(machine.world, {.updateIndex = false}), ExitStatus::failed);
  EXPECT_EQ(machine.output(), "");
}

}  // namespace
}  // namespace norvex
