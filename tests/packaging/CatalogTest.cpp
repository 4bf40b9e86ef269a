// The journal's explanations belong to the messages that are sent, and every message has one.
#include <gtest/gtest.h>

#include <algorithm>
#include <fstream>
#include <map>
#include <string>

#include "platform/linux/DiagnosticMessageIds.h"

namespace norvex {
namespace {

// The entries of the catalog: the text below each id.
std::map<std::string, std::string> catalogEntries() {
  std::ifstream file(NORVEX_SOURCE_DIR "/packaging/journal/norvex.catalog");
  std::map<std::string, std::string> entries;
  std::string id;
  for (std::string line; std::getline(file, line);) {
    if (line.starts_with("-- ")) {
      id = line.substr(3);
      entries[id];
    } else if (!id.empty()) {
      entries[id] += line + '\n';
    }
  }
  return entries;
}

TEST(Catalog, ExplainsEveryMessageAndNothingElse) {
  const auto entries = catalogEntries();
  EXPECT_EQ(entries.size(), kDiagnosticMessageIds.size());
  for (const auto& [domain, id] : kDiagnosticMessageIds) {
    EXPECT_EQ(entries.count(std::string(id)), 1U) << domain;
  }
}

TEST(Catalog, EveryEntryHasASubjectAndLeadsToTheManual) {
  for (const auto& [id, text] : catalogEntries()) {
    EXPECT_TRUE(text.starts_with("Subject: ")) << id;
    EXPECT_NE(text.find("Documentation: man:NorvexAgent(8)"), std::string::npos) << id;
    EXPECT_NE(text.find("@NORVEX_DOMAIN@"), std::string::npos) << id;
  }
}

}  // namespace
}  // namespace norvex
