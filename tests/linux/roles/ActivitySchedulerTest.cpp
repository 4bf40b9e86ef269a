#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <condition_variable>
#include <csignal>
#include <memory>
#include <mutex>
#include <thread>
#include <vector>

#include "platform/linux/LinuxActivityScheduler.h"

namespace norvex {
namespace {

using testing::ElementsAre;

constexpr ActivityState kCheckIn = ActivityState::checkIn;
constexpr ActivityState kRun = ActivityState::run;

// Writes the handler's calls down.
class Calls {
 public:
  ActivityScheduler::Handler handler() {
    return [this](Activity& activity) {
      const std::lock_guard lock(mutex_);
      states_.push_back(activity.state());
      threads_.push_back(std::this_thread::get_id());
      called_.notify_all();
    };
  }

  std::vector<ActivityState> waitFor(std::size_t count) {
    std::unique_lock lock(mutex_);
    called_.wait(lock, [&] { return states_.size() >= count; });
    return states_;
  }

  std::vector<ActivityState> states() { return waitFor(0); }

  std::vector<std::thread::id> threads() {
    const std::lock_guard lock(mutex_);
    return threads_;
  }

 private:
  std::mutex mutex_;
  std::condition_variable called_;
  std::vector<ActivityState> states_;
  std::vector<std::thread::id> threads_;
};

class ActivitySchedulerTest : public testing::Test {
 protected:
  ActivitySchedulerTest() { LinuxActivityScheduler::blockRunSignal(); }

  void start(const Environment& environment) {
    scheduler_ = std::make_unique<LinuxActivityScheduler>(environment);
    scheduler_->registerActivity("com.brixo.NorvexAgent", ActivityCriteria::checkIn, calls_.handler());
  }
  void end() { scheduler_.reset(); }
  static void askForRun() { ::kill(::getpid(), SIGUSR1); }

  Calls calls_;
  std::unique_ptr<LinuxActivityScheduler> scheduler_;
};

Environment startedProcess(pid_t process) {
  return {{"SYSTEMD_EXEC_PID", std::to_string(process)}};
}

TEST_F(ActivitySchedulerTest, StartedByHandItChecksInAndDoesNotRun) {
  start({});
  end();
  EXPECT_THAT(calls_.states(), ElementsAre(kCheckIn));
}

TEST_F(ActivitySchedulerTest, StartedByTheServiceManagerItChecksInAndRuns) {
  start(startedProcess(::getpid()));
  end();
  EXPECT_THAT(calls_.states(), ElementsAre(kCheckIn, kRun));
}

TEST_F(ActivitySchedulerTest, AVariableInheritedFromAnotherProcessIsNoRequest) {
  const std::string own = std::to_string(::getpid());
  for (const std::string& value : {std::to_string(::getppid()), own + "0", " " + own, std::string()}) {
    Calls calls;
    {
      LinuxActivityScheduler scheduler({{"SYSTEMD_EXEC_PID", value}});
      scheduler.registerActivity("com.brixo.NorvexAgent", ActivityCriteria::checkIn, calls.handler());
    }
    EXPECT_THAT(calls.states(), ElementsAre(kCheckIn)) << value;
  }
}

TEST_F(ActivitySchedulerTest, ASignalAsksForARun) {
  start({});
  calls_.waitFor(1);
  askForRun();
  EXPECT_THAT(calls_.waitFor(2), ElementsAre(kCheckIn, kRun));
}

TEST_F(ActivitySchedulerTest, ASignalThatCameBeforeTheRegistrationCounts) {
  askForRun();
  start({});
  EXPECT_THAT(calls_.waitFor(2), ElementsAre(kCheckIn, kRun));
}

TEST_F(ActivitySchedulerTest, EveryLaterSignalIsAnotherRun) {
  start(startedProcess(::getpid()));
  for (std::size_t known = 2; known < 6; ++known) {
    calls_.waitFor(known);
    askForRun();
  }
  EXPECT_THAT(calls_.waitFor(6), ElementsAre(kCheckIn, kRun, kRun, kRun, kRun, kRun));
}

TEST_F(ActivitySchedulerTest, AllCallsComeOnOneQueueThatIsNotTheCallers) {
  start(startedProcess(::getpid()));
  calls_.waitFor(2);
  askForRun();
  calls_.waitFor(3);
  const std::vector<std::thread::id> threads = calls_.threads();
  EXPECT_NE(threads[0], std::this_thread::get_id());
  EXPECT_THAT(threads, ElementsAre(threads[0], threads[0], threads[0]));
}

TEST_F(ActivitySchedulerTest, AFurtherRegistrationIsNeverCalled) {
  Calls further;
  start(startedProcess(::getpid()));
  scheduler_->registerActivity("another", ActivityCriteria::checkIn, further.handler());
  end();
  EXPECT_THAT(calls_.states(), ElementsAre(kCheckIn, kRun));
  EXPECT_THAT(further.states(), ElementsAre());
}

TEST_F(ActivitySchedulerTest, TheActivityKeepsTheStateItIsGiven) {
  ActivityState after = kRun;
  {
    LinuxActivityScheduler scheduler({});
    scheduler.registerActivity("com.brixo.NorvexAgent", ActivityCriteria::checkIn, [&](Activity& activity) {
      activity.setState(ActivityState::done);
      after = activity.state();
    });
  }
  EXPECT_EQ(after, ActivityState::done);
}

TEST_F(ActivitySchedulerTest, EndsWithoutAnyRegistration) {
  const LinuxActivityScheduler scheduler({});
}

}  // namespace
}  // namespace norvex
