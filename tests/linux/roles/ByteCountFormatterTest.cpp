#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/wait.h>
#include <unistd.h>

#include <clocale>
#include <cstdint>
#include <cstdlib>
#include <limits>

#include "ChildProcess.h"
#include "ScratchFolder.h"
#include "platform/FileDescriptor.h"
#include "platform/linux/LocaleByteCountFormatter.h"

namespace norvex {
namespace {

constexpr std::uint64_t kLargest = std::numeric_limits<std::uint64_t>::max();

TEST(ByteCountFormatter, WritesSizesInTheFileStyle) {
  struct Case {
    std::uint64_t bytes;
    const char* text;
  };
  const Case cases[] = {
      {0, "Zero KB"},
      {1, "1 byte"},
      {2, "2 bytes"},
      {10, "10 bytes"},
      {999, "999 bytes"},
      {1'000, "1 KB"},
      {1'001, "1 KB"},
      {1'499, "1 KB"},
      {1'500, "2 KB"},
      {1'501, "2 KB"},
      {2'499, "2 KB"},
      {2'500, "2 KB"},
      {2'501, "3 KB"},
      {3'500, "4 KB"},
      {123'456, "123 KB"},
      {998'500, "998 KB"},
      {999'499, "999 KB"},
      {999'500, "1000 KB"},
      {999'999, "1000 KB"},
      {1'000'000, "1 MB"},
      {1'049'999, "1 MB"},
      {1'050'000, "1 MB"},
      {1'050'001, "1.1 MB"},
      {1'150'000, "1.2 MB"},
      {1'250'000, "1.2 MB"},
      {1'250'001, "1.3 MB"},
      {1'500'000, "1.5 MB"},
      {1'950'000, "2 MB"},
      {1'950'001, "2 MB"},
      {99'949'999, "99.9 MB"},
      {99'950'000, "100 MB"},
      {999'949'999, "999.9 MB"},
      {999'950'000, "1000 MB"},
      {999'999'999, "1000 MB"},
      {1'000'000'000, "1 GB"},
      {1'004'999'999, "1 GB"},
      {1'005'000'000, "1 GB"},
      {1'005'000'001, "1.01 GB"},
      {1'010'000'000, "1.01 GB"},
      {1'015'000'000, "1.02 GB"},
      {1'100'000'000, "1.1 GB"},
      {1'500'000'000, "1.5 GB"},
      {12'345'678'901, "12.35 GB"},
      {999'994'999'999, "999.99 GB"},
      {999'995'000'000, "1000 GB"},
      {999'999'999'999, "1000 GB"},
      {1'000'000'000'000, "1 TB"},
      {2'000'398'934'016, "2 TB"},
      {1'234'567'890'123, "1.23 TB"},
      {1'235'000'000'000, "1.24 TB"},
      {1'245'000'000'000, "1.24 TB"},
      {999'999'999'999'999, "1000 TB"},
      {1'000'000'000'000'000, "1 PB"},
      {1'230'000'000'000'000, "1.23 PB"},
      {999'999'999'999'999'999, "1000 PB"},
      {1'000'000'000'000'000'000, "1 EB"},
      {1'005'000'000'000'000'000, "1 EB"},
      {1'005'000'000'000'000'001, "1.01 EB"},
      {9'223'372'036'854'775'808U, "9.22 EB"},
      {18'440'000'000'000'000'000U, "18.44 EB"},
      {18'445'000'000'000'000'000U, "18.44 EB"},
      {18'445'000'000'000'000'001U, "18.45 EB"},
      {kLargest, "18.45 EB"},
  };
  const LocaleByteCountFormatter formatter("C");
  for (const Case& row : cases) EXPECT_EQ(formatter.string(row.bytes), row.text) << row.bytes;
}

TEST(ByteCountFormatter, AnUnknownLocaleCountsAsC) {
  for (const char* name : {"xx_NOWHERE.UTF-8", "../../etc", "C"}) {
    const LocaleByteCountFormatter formatter(name);
    EXPECT_EQ(formatter.string(999'999), "1000 KB") << name;
    EXPECT_EQ(formatter.string(1'500'000), "1.5 MB") << name;
  }
}

struct Convention {
  const char* name;
  const char* charset;
  const char* decimalPoint;        // as the definition writes it
  const char* thousandsSeparator;  // likewise
  const char* grouping;
  const char* thousandKilobytes;
  const char* oneAndAHalfMegabytes;
};
// Names that no installed locale or alias has.
constexpr Convention kConventions[] = {
    {"x_english", "UTF-8", ".", ",", "3;3", "1,000 KB", "1.5 MB"},
    {"x_german", "UTF-8", ",", ".", "3;3", "1.000 KB", "1,5 MB"},
    {"x_french", "UTF-8", ",", "<U202F>", "3", "1\u202f000 KB", "1,5 MB"},
    {"x_pashto", "UTF-8", "<U066B>", "<U066C>", "3", "1\u066c000 KB", "1\u066b5 MB"},
    {"x_latin", "ISO-8859-1", ",", "<U00A0>", "3;3", "1\u00a0000 KB", "1,5 MB"},
    {"x_pairs", "UTF-8", ".", ",", "2;2;2;3", "10,00 KB", "1.5 MB"},
    {"x_repeated", "UTF-8", ".", "'", "1", "1'0'0'0 KB", "1.5 MB"},
    {"x_myriads", "UTF-8", ".", ",", "4", "1000 KB", "1.5 MB"},
    {"x_lastthree", "UTF-8", ".", ",", "3;-1", "1,000 KB", "1.5 MB"},
    {"x_lasttwo", "UTF-8", ".", ",", "2;-1", "10,00 KB", "1.5 MB"},
    {"x_ungrouped", "UTF-8", ",", ".", "-1", "1000 KB", "1,5 MB"},
    {"x_unseparated", "UTF-8", ",", "", "3;3", "1000 KB", "1,5 MB"},
};

// Compiles the locale of the convention into `folder`. False where the compiler or its sources are missing.
bool compileLocale(const ScratchFolder& folder, const Convention& convention) {
  const std::string source =
      folder.write(std::string(convention.name) + ".def",
                   std::string("LC_CTYPE\ncopy \"POSIX\"\nEND LC_CTYPE\nLC_NUMERIC\ndecimal_point \"") +
                       convention.decimalPoint + "\"\nthousands_sep \"" + convention.thousandsSeparator +
                       "\"\ngrouping " + convention.grouping + "\nEND LC_NUMERIC\n");
  const std::string target = folder.at(convention.name);
  inChild([&] {
    const FileDescriptor nowhere(::open("/dev/null", O_RDWR));
    ::dup2(nowhere.number(), STDOUT_FILENO);
    ::dup2(nowhere.number(), STDERR_FILENO);
    // -c: the categories that are not described here are no reason to stop.
    ::execlp("localedef", "localedef", "-c", "-f", convention.charset, "-i", source.c_str(), target.c_str(),
             nullptr);
    return std::string();
  });
  return std::filesystem::exists(target + "/LC_NUMERIC") && std::filesystem::exists(target + "/LC_CTYPE");
}

// In a child with the locales in `folder`: the C library gives the path that it searches for them never back.
ChildEnd withLocalesIn(const ScratchFolder& folder, const std::function<std::string()>& body) {
  return inChild([&] {
    ::setenv("LOCPATH", folder.path().c_str(), 1);
    return body();
  });
}

TEST(ByteCountFormatter, GroupsAndSeparatesAsTheLocaleDoes) {
  const ScratchFolder folder;
  for (const Convention& convention : kConventions) {
    if (!compileLocale(folder, convention)) GTEST_SKIP() << "localedef or its charmaps are not installed";
    const ChildEnd end = withLocalesIn(folder, [&] {
      const LocaleByteCountFormatter formatter(convention.name);
      return formatter.string(999'999) + " | " + formatter.string(1'500'000) + " | " + formatter.string(0);
    });
    EXPECT_EQ(end.report, std::string(convention.thousandKilobytes) + " | " +
                              convention.oneAndAHalfMegabytes + " | Zero KB")
        << convention.name;
  }
}

TEST(ByteCountFormatter, TheUsersOwnLocaleIsTheOneOfTheEnvironment) {
  const ScratchFolder folder;
  if (!compileLocale(folder, kConventions[1])) GTEST_SKIP() << "localedef or its charmaps are not installed";
  const ChildEnd end = withLocalesIn(folder, [&] {
    ::unsetenv("LC_ALL");
    ::setenv("LC_NUMERIC", kConventions[1].name, 1);
    const std::string german = LocaleByteCountFormatter().string(1'500'000);
    ::setenv("LC_ALL", "xx_NOWHERE", 1);
    return german + " " + LocaleByteCountFormatter().string(1'500'000);
  });
  EXPECT_EQ(end.report, "1,5 MB 1.5 MB");
}

TEST(ByteCountFormatter, LeavesTheLocaleOfProcessAndThreadAsTheyAre) {
  const std::string before = std::setlocale(LC_ALL, nullptr);
  const LocaleByteCountFormatter formatter("C.UTF-8");
  EXPECT_EQ(std::setlocale(LC_ALL, nullptr), before);
  EXPECT_EQ(::uselocale(nullptr), LC_GLOBAL_LOCALE);
}

}  // namespace
}  // namespace norvex
