#include <gtest/gtest.h>

#include "tool/FigureText.h"
#include "tool/JsonText.h"
#include "tool/SafeText.h"

namespace norvex {
namespace {

TEST(SafeText, EscapesWhatIsNotForATerminal) {
  const std::pair<std::string, std::string> cases[] = {
      {"plain name", "plain name"},
      {"caf\u00e9 \u65e5\u672c", "caf\u00e9 \u65e5\u672c"},
      {"a\nb\tc", "a\\nb\\tc"},
      {"\x1b[31m", "\\x1B[31m"},
      {std::string("nul\0", 4), "nul\\x00"},
      {"\x7f", "\\x7F"},
      {"\u009b31m", "\\u009B31m"},
      {"right \u202e left", "right \\u202E left"},
      {"caf\xe9", "caf\\xE9"},
      {"back\\slash", "back\\\\slash"},
      {"\xed\xa0\x80", "\\xED\\xA0\\x80"},
  };
  for (const auto& [name, shown] : cases) EXPECT_EQ(safeText(name), shown);
}

TEST(JsonText, KeepsAllBytesOfWhatIsNoUtf8) {
  JsonDocument object;
  setText(object, "path", "caf\xe9");
  EXPECT_EQ(jsonLine(object), "{\"path\":\"caf\xEF\xBF\xBD\",\"pathBytes\":\"Y2Fm6Q==\"}");
}

TEST(JsonText, EncodesBase64WithPadding) {
  const std::pair<const char*, const char*> cases[] = {
      {"", ""},        {"f", "Zg=="},        {"fo", "Zm8="},
      {"foo", "Zm9v"}, {"foob", "Zm9vYg=="}, {"\xff\xfe\xfd", "//79"}};
  for (const auto& [bytes, text] : cases) EXPECT_EQ(base64(bytes), text);
}

TEST(FigureText, ShowsTheLargestUnit) {
  const std::pair<std::int64_t, const char*> cases[] = {
      {-5, "just now"}, {59, "just now"}, {60, "1 minute ago"}, {7199, "1 hour ago"}, {172800, "2 days ago"}};
  for (const auto& [seconds, text] : cases) EXPECT_EQ(ageText(seconds), text);
  EXPECT_EQ(elapsedText(std::chrono::seconds(3723)), "1:02:03");
  EXPECT_EQ(elapsedText(std::chrono::seconds(67)), "1:07");
}

}  // namespace
}  // namespace norvex
