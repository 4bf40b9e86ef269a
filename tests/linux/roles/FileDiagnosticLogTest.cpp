#include "platform/linux/FileDiagnosticLog.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/file.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

#include <csignal>
#include <sstream>
#include <vector>

#include "ChildProcess.h"
#include "ScratchFolder.h"
#include "platform/FileDescriptor.h"
#include "platform/linux/DiagnosticMessageText.h"

namespace norvex {
namespace {

constexpr const char* kFile = "norvex/diagnostics.jsonl";

std::chrono::system_clock::time_point at(std::chrono::seconds secondsSince1970) {
  return std::chrono::system_clock::time_point(secondsSince1970);
}

FileDiagnosticLog logIn(const std::string& stateFolder, std::int64_t secondsSince1970 = 0) {
  return FileDiagnosticLog(stateFolder, [=] { return at(std::chrono::seconds(secondsSince1970)); });
}

void logOne(DiagnosticLog& log, const std::string& value) {
  const DiagnosticPair pairs[] = {{"key", value}};
  log.logWithKeys("domain", 5, pairs);
}

std::string lineWith(const std::string& value) {
  return R"({"domain":"domain","level":5,"pairs":[["key",")" + value +
         R"("]],"time":"1970-01-01T00:00:00Z"})" + "\n";
}

TEST(DiagnosticMessageText, KeepsThePairsInTheirOrder) {
  const DiagnosticPair pairs[] = {{"b", "2"}, {"a", "1"}, {"b", "2"}, {"c", ""}};
  EXPECT_EQ(
      diagnosticMessageJson("com.brixo.norvex.run2", 5, pairs),
      R"({"domain":"com.brixo.norvex.run2","level":5,"pairs":[["b","2"],["a","1"],["b","2"],["c",""]]})");
}

TEST(DiagnosticMessageText, AMessageWithoutPairsHasAnEmptyList) {
  EXPECT_EQ(diagnosticMessageJson("d", 3, {}, "now"), R"({"domain":"d","level":3,"pairs":[],"time":"now"})");
}

TEST(DiagnosticMessageText, IsOneLineOfValidTextWhateverThePairsHold) {
  const DiagnosticPair pairs[] = {{"quote\"\\", "line\nend\ttab"}, {"bytes", "a\xff\xfe z"}, {"Ä", "ü"}};
  EXPECT_EQ(diagnosticMessageJson("d", 5, pairs),
            "{\"domain\":\"d\",\"level\":5,\"pairs\":[[\"quote\\\"\\\\\",\"line\\nend\\ttab\"],"
            "[\"bytes\",\"a\ufffd\ufffd z\"],[\"Ä\",\"ü\"]]}");
}

TEST(FileDiagnosticLog, AppendsOneLineAMessageWithItsTime) {
  const ScratchFolder folder;
  FileDiagnosticLog log = logIn(folder.path(), 1'767'323'045);
  logOne(log, "1");
  logOne(log, "2");
  EXPECT_EQ(contentOf(folder.at(kFile)),
            R"({"domain":"domain","level":5,"pairs":[["key","1"]],"time":"2026-01-02T03:04:05Z"})"
            "\n"
            R"({"domain":"domain","level":5,"pairs":[["key","2"]],"time":"2026-01-02T03:04:05Z"})"
            "\n");
}

TEST(FileDiagnosticLog, TellsTheTimeInUtcToTheSecond) {
  struct Case {
    std::chrono::milliseconds since1970;
    const char* text;
  };
  const Case cases[] = {
      {std::chrono::milliseconds(0), "1970-01-01T00:00:00Z"},
      {std::chrono::milliseconds(-1), "1969-12-31T23:59:59Z"},
      {std::chrono::milliseconds(951'825'599'999), "2000-02-29T11:59:59Z"},
      {std::chrono::milliseconds(4'102'444'800'000), "2100-01-01T00:00:00Z"},
  };
  for (const Case& row : cases) {
    const ScratchFolder folder;
    FileDiagnosticLog log(folder.path(),
                          [&] { return std::chrono::system_clock::time_point(row.since1970); });
    logOne(log, "1");
    EXPECT_NE(contentOf(folder.at(kFile)).find(std::string("\"time\":\"") + row.text + "\""),
              std::string::npos)
        << row.text;
  }
}

TEST(FileDiagnosticLog, IsForTheUserAlone) {
  const ScratchFolder folder;
  FileDiagnosticLog log = logIn(folder.at("state"));
  logOne(log, "1");
  EXPECT_EQ(modeOf(folder.at("state")), 0700U);
  EXPECT_EQ(modeOf(folder.at("state/norvex")), 0700U);
  EXPECT_EQ(modeOf(folder.at("state/norvex/diagnostics.jsonl")), 0600U);
}

TEST(FileDiagnosticLog, EndsALineThatACrashLeftUnfinished) {
  const ScratchFolder folder;
  folder.write(kFile, lineWith("0") + R"({"domain":"dom)");
  FileDiagnosticLog log = logIn(folder.path());
  logOne(log, "1");
  logOne(log, "2");
  EXPECT_EQ(contentOf(folder.at(kFile)),
            lineWith("0") + R"({"domain":"dom)" + "\n" + lineWith("1") + lineWith("2"));
}

TEST(FileDiagnosticLog, WritesThroughNoLinkAndIntoNothingElse) {
  const ScratchFolder folder;
  const std::string victim = folder.write("victim", "mine\n");
  std::filesystem::create_directory(folder.at("norvex"));
  std::filesystem::create_symlink(victim, folder.at(kFile));
  FileDiagnosticLog log = logIn(folder.path());
  logOne(log, "1");
  EXPECT_EQ(contentOf(victim), "mine\n");

  std::filesystem::remove(folder.at(kFile));
  ASSERT_EQ(::mkfifo(folder.at(kFile).c_str(), 0600), 0);
  logOne(log, "1");  // returns
  std::filesystem::remove(folder.at(kFile));
  std::filesystem::create_directory(folder.at(kFile));
  logOne(log, "1");  // returns
  EXPECT_TRUE(std::filesystem::is_empty(folder.at(kFile)));
}

TEST(FileDiagnosticLog, WhereTheFolderCannotBeMadeTheMessageIsLost) {
  const ScratchFolder folder;
  const std::string file = folder.write("state", "a file");
  FileDiagnosticLog log = logIn(file);
  logOne(log, "1");
  EXPECT_EQ(contentOf(file), "a file");
}

TEST(FileDiagnosticLog, ALockThatIsNeverGivenBackDoesNotLoseTheMessage) {
  const ScratchFolder folder;
  const std::string path = folder.write(kFile, "");
  const FileDescriptor other(::open(path.c_str(), O_RDONLY));
  ASSERT_EQ(::flock(other.number(), LOCK_EX), 0);
  FileDiagnosticLog log = logIn(folder.path());
  logOne(log, "1");
  EXPECT_EQ(contentOf(path), lineWith("1"));
}

TEST(FileDiagnosticLog, ProcessesThatWriteAtOnceMixNoLines) {
  const ScratchFolder folder;
  constexpr int kMessages = 20;
  const std::string longValue(20'000, 'x');
  const auto writeAllOfThem = [&] {
    FileDiagnosticLog log = logIn(folder.path());
    for (int message = 0; message < kMessages; ++message) logOne(log, longValue);
    return std::string();
  };
  inChild([&] {
    const pid_t sibling = ::fork();
    writeAllOfThem();
    if (sibling == 0) ::_exit(0);
    return std::string();  // the report ends when the sibling has closed its end, too
  });
  std::istringstream lines(contentOf(folder.at(kFile)));
  int count = 0;
  for (std::string line; std::getline(lines, line); ++count) EXPECT_EQ(line + "\n", lineWith(longValue));
  EXPECT_EQ(count, 2 * kMessages);
}

// A disk that is full in the middle of the second message. Reports the file's content, then what it is when
// there is room again and a third message has come.
std::string fillWith(const std::string& stateFolder, const std::function<void()>& fill,
                     const std::function<void()>& makeRoom) {
  FileDiagnosticLog log = logIn(stateFolder);
  logOne(log, "1");
  fill();
  logOne(log, std::string(20'000, 'x'));
  const std::string full = contentOf(stateFolder + "/" + kFile);
  makeRoom();
  logOne(log, "3");
  return full + "--\n" + contentOf(stateFolder + "/" + kFile);
}

const std::string kWholeLinesOnly = lineWith("1") + "--\n" + lineWith("1") + lineWith("3");

TEST(FileDiagnosticLog, AMessageThatFindsTheDiskFullIsTakenBack) {
  const ScratchFolder folder;
  const ChildEnd end = inChild([&] {
    if (const std::string problem = mountSmallDisk(folder.path(), "64k"); !problem.empty()) return problem;
    const std::string filler = folder.at("filler");
    return fillWith(
        folder.path(), [&] { std::ofstream(filler) << std::string(1024 * 1024, 'f') << std::flush; },
        [&] { std::filesystem::remove(filler); });
  });
  NORVEX_SKIP_IF_IMPOSSIBLE(end);
  EXPECT_EQ(end.report, kWholeLinesOnly);
}

TEST(FileDiagnosticLog, AMessageThatFindsTheFilesLimitIsTakenBack) {
  const ScratchFolder folder;
  const ChildEnd end = inChild([&] {
    ::signal(SIGXFSZ, SIG_IGN);
    const auto limitFiles = [](rlim_t bytes) {
      const rlimit limit{bytes, RLIM_INFINITY};
      ::setrlimit(RLIMIT_FSIZE, &limit);
    };
    return fillWith(
        folder.path(), [&] { limitFiles(8192); }, [&] { limitFiles(RLIM_INFINITY); });
  });
  EXPECT_EQ(end.report, kWholeLinesOnly);
}

}  // namespace
}  // namespace norvex
