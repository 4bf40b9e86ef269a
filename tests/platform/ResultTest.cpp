#include "platform/Result.h"

#include <gtest/gtest.h>

#include <cerrno>
#include <memory>

namespace norvex {
namespace {

TEST(Result, IsAValueOrAnError) {
  const Result<int> good = 7;
  EXPECT_TRUE(good.ok());
  EXPECT_TRUE(static_cast<bool>(good));
  EXPECT_EQ(good.value(), 7);
  const Result<int> bad = Error{5, "why"};
  EXPECT_FALSE(bad.ok());
  EXPECT_FALSE(static_cast<bool>(bad));
  EXPECT_EQ(bad.error().code, 5);
  EXPECT_EQ(bad.error().description, "why");
}

TEST(Result, TellsAnErrorFromAValueThatIsAnError) {
  EXPECT_TRUE(Result<std::string>(std::string("Error")).ok());
}

TEST(Result, GivesItsValueAway) {
  Result<std::unique_ptr<int>> result = std::make_unique<int>(3);
  result.value() = std::make_unique<int>(4);
  const std::unique_ptr<int> taken = std::move(result).value();
  EXPECT_EQ(*taken, 4);
}

TEST(Result, OfNothingIsAlsoASuccessOrAnError) {
  EXPECT_TRUE(Result<void>().ok());
  const Result<void> bad = Error{0, "without a code"};
  EXPECT_FALSE(bad.ok());
  EXPECT_EQ(bad.error().description, "without a code");
}

TEST(SystemError, SpeaksInTheCLibrarysWords) {
  const struct {
    int code;
    const char* description;
  } rows[] = {{ENOENT, "No such file or directory"},
              {EACCES, "Permission denied"},
              {EIO, "Input/output error"},
              {ENOMEM, "Cannot allocate memory"}};
  for (const auto& row : rows) {
    EXPECT_EQ(systemError(row.code).code, row.code);
    EXPECT_EQ(systemError(row.code).description, row.description);
  }
}

}  // namespace
}  // namespace norvex
