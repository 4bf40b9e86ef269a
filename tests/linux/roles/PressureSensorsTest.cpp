// The ways of learning that memory is short, one by one.
#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>

#include <cerrno>
#include <cstring>

#include "ScratchFolder.h"
#include "platform/linux/PolledPressure.h"
#include "platform/linux/PressureTriggers.h"

namespace norvex {
namespace {

using std::chrono::seconds;

constexpr MemoryPressureLevels kBoth{.warning = true, .critical = true};
constexpr Clock::Moment kStart{std::chrono::hours(1000)};

// What the sensor says about its descriptors as they are now.
PressureVerdict lookAt(PressureSensor& sensor) {
  std::vector<pollfd> files(sensor.awaited().begin(), sensor.awaited().end());
  EXPECT_GE(::poll(files.data(), files.size(), 0), 0);
  return sensor.judge(files, kStart);
}

TEST(PressureTriggers, TheKernelTakesATriggerForEachLevelWithoutPrivilege) {
  const Result<std::unique_ptr<PressureSensor>> sensor =
      PressureTriggers::onFile("/proc/pressure/memory", kBoth);
  if (!sensor && (sensor.error().code == ENOENT || sensor.error().code == EOPNOTSUPP ||
                  sensor.error().code == EACCES || sensor.error().code == EPERM)) {
    GTEST_SKIP() << "this kernel has no triggers for everybody: " << sensor.error().description;
  }
  ASSERT_TRUE(sensor) << sensor.error().description;
  EXPECT_EQ(sensor.value()->awaited().size(), 2U);
  EXPECT_FALSE(sensor.value()->interval());
  EXPECT_EQ(PressureTriggers::onFile("/proc/pressure/memory", {.warning = true}).value()->awaited().size(),
            1U);
}

TEST(PressureTriggers, AFileThatIsNotTheKernelsIsNotWrittenTo) {
  const ScratchFolder folder;
  const std::string file = folder.write("file", "mine");
  EXPECT_EQ(PressureTriggers::onFile(file, kBoth).error().code, EINVAL);
  EXPECT_EQ(PressureTriggers::onWatch(file, "some").error().code, EINVAL);
  EXPECT_EQ(contentOf(file), "mine");
  EXPECT_EQ(PressureTriggers::onFile(folder.at("none"), kBoth).error().code, ENOENT);
  EXPECT_EQ(PressureTriggers::onWatch(folder.at("none"), "some").error().code, ENOENT);
}

TEST(PressureTriggers, AFifoThatIsWrittenToIsPressureOnce) {
  const ScratchFolder folder;
  ASSERT_EQ(::mkfifo(folder.at("fifo").c_str(), 0600), 0);
  const auto sensor = PressureTriggers::onWatch(folder.at("fifo"), "some 1 2").value();
  EXPECT_EQ(lookAt(*sensor), PressureVerdict::calm) << "it has heard its own text";
  {
    const FileDescriptor writer(::open(folder.at("fifo").c_str(), O_WRONLY | O_NONBLOCK));
    ASSERT_EQ(::write(writer.number(), "anything", 8), 8);
    EXPECT_EQ(lookAt(*sensor), PressureVerdict::pressure);
  }
  EXPECT_EQ(lookAt(*sensor), PressureVerdict::calm) << "a writer that leaves says nothing";
}

TEST(PressureTriggers, ASocketGetsTheTextAndIsListenedToUntilItIsClosed) {
  const ScratchFolder folder;
  const FileDescriptor listener(::socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0));
  sockaddr_un address{};
  address.sun_family = AF_UNIX;
  std::strcpy(address.sun_path, folder.at("socket").c_str());
  ASSERT_EQ(::bind(listener.number(), reinterpret_cast<const sockaddr*>(&address), sizeof(address)), 0);
  ASSERT_EQ(::listen(listener.number(), 1), 0);

  const auto sensor = PressureTriggers::onWatch(folder.at("socket"), "text").value();
  FileDescriptor other(::accept(listener.number(), nullptr, nullptr));
  char text[16] = {};
  EXPECT_EQ(::read(other.number(), text, sizeof(text)), 4);
  EXPECT_STREQ(text, "text");
  EXPECT_EQ(lookAt(*sensor), PressureVerdict::calm);
  ASSERT_EQ(::write(other.number(), "x", 1), 1);
  EXPECT_EQ(lookAt(*sensor), PressureVerdict::pressure);
  other = FileDescriptor();
  EXPECT_EQ(lookAt(*sensor), PressureVerdict::gone);
}

TEST(PressureTriggers, OneThatFiresIsPressureAndOneWhoseGroupIsGoneIsGone) {
  PressureTriggers triggers;
  const pollfd none{0, POLLPRI, 0};
  const pollfd fired{0, POLLPRI, POLLPRI};
  const pollfd ended{0, POLLPRI, static_cast<short>(POLLPRI | POLLERR)};
  EXPECT_EQ(triggers.judge(std::vector{none, none}, kStart), PressureVerdict::calm);
  EXPECT_EQ(triggers.judge(std::vector{none, fired}, kStart), PressureVerdict::pressure);
  EXPECT_EQ(triggers.judge(std::vector{fired, ended}, kStart), PressureVerdict::gone);
}

std::string totals(int someMilliseconds, int fullMilliseconds) {
  return "some avg10=0.00 total=" + std::to_string(someMilliseconds * 1000) +
         "\nfull avg10=0.00 total=" + std::to_string(fullMilliseconds * 1000) + "\n";
}

TEST(PolledStallTotals, GrowthByTheShareOfTheTriggersIsPressure) {
  struct Case {
    MemoryPressureLevels levels;
    int some;  // growth in milliseconds
    int full;
    seconds passed;
    PressureVerdict verdict;
  };
  constexpr MemoryPressureLevels kWarning{.warning = true};
  constexpr MemoryPressureLevels kCritical{.critical = true};
  const Case cases[] = {
      {kBoth, 149, 99, seconds(2), PressureVerdict::calm},
      {kBoth, 150, 0, seconds(2), PressureVerdict::pressure},
      {kBoth, 0, 100, seconds(2), PressureVerdict::pressure},
      {kWarning, 0, 2000, seconds(2), PressureVerdict::calm},
      {kCritical, 2000, 0, seconds(2), PressureVerdict::calm},
      {kBoth, 150, 100, seconds(20), PressureVerdict::calm},
      {kBoth, 1500, 0, seconds(20), PressureVerdict::pressure},
      {kBoth, 0, 0, seconds(0), PressureVerdict::calm},
      {kBoth, -50, -50, seconds(2), PressureVerdict::calm},
  };
  for (const Case& row : cases) {
    const ScratchFolder folder;
    const std::string file = folder.write("pressure", totals(1000, 500));
    const auto sensor = PolledStallTotals::on(file, row.levels, kStart);
    folder.write("pressure", totals(1000 + row.some, 500 + row.full));
    EXPECT_EQ(sensor->judge({}, kStart + row.passed), row.verdict) << row.some << " " << row.full;
    // The next look counts from this one.
    if (row.passed == seconds(0)) continue;
    EXPECT_EQ(sensor->judge({}, kStart + 2 * row.passed), PressureVerdict::calm);
  }
}

TEST(PolledStallTotals, AFileThatGoesIsTheEnd) {
  const ScratchFolder folder;
  EXPECT_EQ(PolledStallTotals::on(folder.at("pressure"), kBoth, kStart), nullptr);
  const auto sensor = PolledStallTotals::on(folder.write("pressure", totals(0, 0)), kBoth, kStart);
  EXPECT_EQ(sensor->interval(), std::chrono::milliseconds(2000));
  std::filesystem::remove(folder.at("pressure"));
  EXPECT_EQ(sensor->judge({}, kStart + seconds(2)), PressureVerdict::gone);
}

TEST(PolledAvailableMemory, LessThanATenthIsAWarningLessThanATwentiethCritical) {
  struct Case {
    MemoryPressureLevels levels;
    int available;  // of 1000
    PressureVerdict verdict;
  };
  const Case cases[] = {
      {{.warning = true}, 100, PressureVerdict::calm},     {{.warning = true}, 99, PressureVerdict::pressure},
      {{.critical = true}, 99, PressureVerdict::calm},     {{.critical = true}, 50, PressureVerdict::calm},
      {{.critical = true}, 49, PressureVerdict::pressure},
  };
  for (const Case& row : cases) {
    const ScratchFolder folder;
    const std::string file = folder.write(
        "meminfo", "MemTotal: 1000 kB\nMemAvailable: " + std::to_string(row.available) + " kB\n");
    EXPECT_EQ(PolledAvailableMemory::on(file, row.levels)->judge({}, kStart), row.verdict) << row.available;
  }
}

TEST(PolledAvailableMemory, TheKernelsOwnFileCanBeRead) {
  EXPECT_NE(PolledAvailableMemory::on("/proc/meminfo", kBoth), nullptr);
}

}  // namespace
}  // namespace norvex
