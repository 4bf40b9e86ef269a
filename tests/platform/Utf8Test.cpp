#include "platform/Utf8.h"

#include <gtest/gtest.h>

namespace norvex {
namespace {

using std::string_view_literals::operator""sv;

TEST(Utf8, TakesEveryWellFormedText) {
  for (const std::string_view text :
       {""sv, "plain"sv, "\0zero"sv, "\x7F"sv, "\xC2\x80"sv, "\xDF\xBF"sv, "\xE0\xA0\x80"sv, "\xED\x9F\xBF"sv,
        "\xEE\x80\x80"sv, "\xEF\xBF\xBF"sv, "\xF0\x90\x80\x80"sv, "\xF4\x8F\xBF\xBF"sv, "a\xC3\xA4z"sv}) {
    EXPECT_TRUE(isValidUtf8(text)) << text;
  }
}

TEST(Utf8, RefusesWhatIsNot) {
  for (const std::string_view text : {"\x80"sv,              // a continuation alone
                                      "\xBF"sv,              //
                                      "\xC3"sv,              // cut off
                                      "a\xE2\x82"sv,         //
                                      "\xF0\x9F\x98"sv,      //
                                      "\xC3z"sv,             // no continuation
                                      "\xE2\x82z"sv,         //
                                      "\xE2z\x82"sv,         //
                                      "\xC0\x80"sv,          // longer than need be
                                      "\xC1\xBF"sv,          //
                                      "\xE0\x9F\xBF"sv,      //
                                      "\xF0\x8F\xBF\xBF"sv,  //
                                      "\xED\xA0\x80"sv,      // surrogates
                                      "\xED\xBF\xBF"sv,      //
                                      "\xF4\x90\x80\x80"sv,  // above U+10FFFF
                                      "\xF5\x80\x80\x80"sv,  //
                                      "\xF8\x88\x80\x80\x80"sv,
                                      "\xFE"sv,
                                      "\xFF"sv,
                                      "good\xFF"sv}) {
    EXPECT_FALSE(isValidUtf8(text)) << text;
  }
}

}  // namespace
}  // namespace norvex
