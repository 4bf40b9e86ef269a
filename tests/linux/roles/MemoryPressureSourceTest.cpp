// The source with its thread: which way it takes, and what it does when one ends.
#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/stat.h>

#include <atomic>
#include <semaphore>

#include "ScratchFolder.h"
#include "platform/linux/FileDescriptor.h"
#include "platform/linux/KernelMemoryPressureSource.h"
#include "tests/support/InMemoryClock.h"

namespace norvex {
namespace {

constexpr MemoryPressureLevels kBoth{.warning = true, .critical = true};

using Events = std::counting_semaphore<>;

// A wait in which the time passes by hand: each step stands for one that has come to its limit, and may
// change the files. After the last step it is a real wait again, in which nothing more happens but the end.
PressureWait stepwise(InMemoryClock& clock, std::vector<std::function<void()>> steps) {
  auto next = std::make_shared<std::size_t>(0);
  return [&clock, steps, next](pollfd* files, nfds_t count, int milliseconds) {
    if (*next == steps.size()) return ::poll(files, count, -1);
    EXPECT_EQ(milliseconds, 2000);
    clock.advance(std::chrono::milliseconds(milliseconds));
    steps[(*next)++]();
    for (nfds_t file = 0; file < count; ++file) files[file].revents = 0;
    return 0;
  };
}

std::string totals(int someMilliseconds) {
  return "some total=" + std::to_string(someMilliseconds * 1000) + "\nfull total=0\n";
}

TEST(KernelMemoryPressureSource, ListensWhereTheServiceManagerSaid) {
  const ScratchFolder folder;
  const std::string fifo = folder.at("fifo");
  ASSERT_EQ(::mkfifo(fifo.c_str(), 0600), 0);
  InMemoryClock clock;
  KernelMemoryPressureSource source(
      MemoryPressurePlaces::ofProcess({{"MEMORY_PRESSURE_WATCH", fifo}, {"MEMORY_PRESSURE_WRITE", "YWJj"}}),
      clock);
  Events events(0);
  const auto subscription = source.create(kBoth);
  subscription->setHandler([&] { events.release(); });
  const FileDescriptor writer(::open(fifo.c_str(), O_RDWR | O_NONBLOCK));
  ASSERT_EQ(::write(writer.number(), "x", 1), 1);
  EXPECT_FALSE(events.try_acquire()) << "it is made suspended";
  subscription->resume();
  events.acquire();
  ASSERT_EQ(::write(writer.number(), "x", 1), 1);
  events.acquire();
  EXPECT_FALSE(events.try_acquire());
}

TEST(KernelMemoryPressureSource, EndsWithoutHavingBeenStartedOrHavingAHandler) {
  InMemoryClock clock;
  KernelMemoryPressureSource source(MemoryPressurePlaces::ofProcess({}), clock);
  { const auto neverResumed = source.create(kBoth); }
  const auto withoutHandler = source.create(kBoth);
  withoutHandler->resume();
  withoutHandler->resume();
}

TEST(KernelMemoryPressureSource, WhereThereAreNoTriggersTheTotalsArePolledAndThenTheAvailableMemory) {
  const ScratchFolder folder;
  InMemoryClock clock;
  MemoryPressurePlaces places;
  places.watch = folder.at("no-watch");
  // A file that is not the kernel's takes no trigger, but can be read.
  places.pressureFiles = {folder.at("none"), folder.write("pressure", totals(0))};
  places.memoryInfo = folder.write("meminfo", "MemTotal: 1000 kB\nMemAvailable: 500 kB\n");
  std::vector<int> eventsBeforeStep;
  std::atomic<int> count = 0;
  const auto step = [&](std::function<void()> change) {
    return [&, change] {
      eventsBeforeStep.push_back(count);
      change();
    };
  };
  KernelMemoryPressureSource source(
      places, clock,
      stepwise(clock, {step([&] { folder.write("pressure", totals(100)); }),
                       step([&] { folder.write("pressure", totals(400)); }),
                       step([&] { std::filesystem::remove(folder.at("pressure")); }),
                       step([&] { folder.write("meminfo", "MemTotal: 1000 kB\nMemAvailable: 10 kB\n"); })}));
  std::binary_semaphore last(0);
  const auto subscription = source.create(kBoth);
  subscription->setHandler([&] {
    if (++count == 2) last.release();
  });
  subscription->resume();
  last.acquire();
  EXPECT_EQ(eventsBeforeStep, (std::vector<int>{0, 0, 1, 1}));
}

TEST(KernelMemoryPressureSource, WhereNoWayIsOpenItStaysSilent) {
  const ScratchFolder folder;
  InMemoryClock clock;
  MemoryPressurePlaces places;
  places.memoryInfo = folder.at("none");
  std::atomic<int> count = 0;
  {
    KernelMemoryPressureSource source(places, clock);
    const auto subscription = source.create(kBoth);
    subscription->setHandler([&] { ++count; });
    subscription->resume();
  }
  EXPECT_EQ(count, 0);
}

TEST(MemoryPressurePlaces, AreWhatTheEnvironmentSaysThenTheSystems) {
  struct Case {
    Environment environment;
    const char* watch;
    bool isOff;
  };
  const Case cases[] = {
      {{}, "", false},
      {{{"MEMORY_PRESSURE_WATCH", "/a"}}, "/a", false},
      {{{"MEMORY_PRESSURE_WATCH", "/a"}, {"MEMORY_PRESSURE_WRITE", "YQ=="}}, "/a", false},
      {{{"MEMORY_PRESSURE_WATCH", "/a"}, {"MEMORY_PRESSURE_WRITE", "?"}}, "", false},
      {{{"MEMORY_PRESSURE_WATCH", "a"}}, "", false},
      {{{"MEMORY_PRESSURE_WATCH", "/dev/null"}}, "/dev/null", true},
  };
  for (const Case& row : cases) {
    const MemoryPressurePlaces places = MemoryPressurePlaces::ofProcess(row.environment);
    EXPECT_EQ(places.watch, row.watch);
    EXPECT_EQ(places.isOff, row.isOff);
    EXPECT_EQ(places.pressureFiles.back(), "/proc/pressure/memory");
  }
}

}  // namespace
}  // namespace norvex
