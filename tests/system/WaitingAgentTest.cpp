// The real programs together where no service manager can be reached: the companion command wakes the agent
// that somebody has started by hand, and no other process.
#include <gtest/gtest.h>

#include <fcntl.h>
#include <sys/prctl.h>
#include <sys/ptrace.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>
#include <functional>
#include <nlohmann/json.hpp>

#include "AgentWorld.h"
#include "OwnProcesses.h"
#include "OwnVolume.h"
#include "ProcessStatus.h"
#include "tests/support/Eventually.h"

namespace norvex {
namespace {

namespace fs = std::filesystem;
using nlohmann::json;

void blockRunSignal() {
  sigset_t run;
  sigemptyset(&run);
  sigaddset(&run, SIGUSR1);
  sigprocmask(SIG_BLOCK, &run, nullptr);
}

bool isAgent(pid_t process) {
  return statusOf(process, "Name") == "NorvexAgent" && hasSignal(process, "SigBlk", SIGUSR1);
}

// The exit status, as AgentWorld::wait has it. One that does not end is killed.
int endOf(pid_t process) {
  if (!eventually([&] { return hasEnded(process); })) ::kill(process, SIGKILL);
  return AgentWorld::wait(process);
}

// Its main thread and its scheduler's have come to where nothing wakes them but an event.
bool waitsInAllItsThreads(pid_t process) {
  int threads = 0;
  for (const auto& entry : fs::directory_iterator("/proc/" + std::to_string(process) + "/task")) {
    if (!statusOf(std::stoi(entry.path().filename()), "State").starts_with("S")) return false;
    ++threads;
  }
  return threads > 1;
}

struct ToolEnd {
  int status = 0;
  std::string output;
  std::string errors;
};

class WaitingAgent : public ::testing::Test {
 protected:
  void SetUp() override {
    if (!processes_.obstacle().empty()) GTEST_SKIP() << processes_.obstacle();
    world_.beforeExec = showInProc;
    world_.environment["XDG_RUNTIME_DIR"] = world_.root() / "nowhere";
    world_.environment["DBUS_SESSION_BUS_ADDRESS"] = "unix:path=" + (world_.root() / "nowhere/bus").string();
  }

  static void showInProc() {
    if (!OwnProcesses::showInProc()) ::_exit(kNotAllowed);
  }

  pid_t startByHand() {
    const pid_t agent = world_.start({});
    EXPECT_TRUE(eventually([&] { return isAgent(agent) && waitsInAllItsThreads(agent); }));
    return agent;
  }

  // A process that waits for any signal, which ends it.
  pid_t startNamed(
      const char* name, const std::function<void()>& prepare = [] {}) {
    const pid_t process = ::fork();
    if (process == 0) {
      prepare();
      ::prctl(PR_SET_NAME, name);
      for (;;) ::pause();
    }
    EXPECT_TRUE(eventually([&] { return statusOf(process, "Name") == name; }));
    return process;
  }

  ToolEnd tellToRun(const std::vector<std::string>& options = {}) {
    std::vector<std::string> arguments = {"agent", "run"};
    arguments.insert(arguments.end(), options.begin(), options.end());
    const fs::path output = world_.root() / "output", errors = world_.root() / "errors";
    const pid_t process = ::fork();
    if (process == 0) {
      showInProc();
      ::dup2(::open(errors.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0600), STDERR_FILENO);
      ::_exit(runTool(world_, arguments, output));
    }
    const int status = AgentWorld::wait(process);
    return {status, AgentWorld::read(output).value_or(""), AgentWorld::read(errors).value_or("")};
  }

  // Of the signals that came the first is the one that has ended it.
  static void expectLeftAlone(pid_t process) {
    ::kill(process, SIGTERM);
    EXPECT_EQ(endOf(process), 128 + SIGTERM);
  }

  AgentWorld world_;

 private:
  OwnProcesses processes_;
};

TEST_F(WaitingAgent, IsWokenAndReports) {
  const pid_t agent = startByHand();
  EXPECT_TRUE(world_.messages().empty());
  const ToolEnd end = tellToRun();
  EXPECT_EQ(end.status, 0);
  EXPECT_EQ(
      end.output,
      "The agent that was waiting has got the word to run; see how it went with: norvexctl agent status\n");
  EXPECT_EQ(end.errors, "");
  EXPECT_EQ(endOf(agent), 0);
  EXPECT_EQ(world_.messages().size(), 2U);
}

TEST_F(WaitingAgent, IsSaidToBeWokenInTheDocument) {
  const pid_t agent = startByHand();
  const ToolEnd end = tellToRun({"--json"});
  EXPECT_EQ(end.status, 0);
  const json document = json::parse(end.output);
  EXPECT_EQ(document["outcome"], "woken");
  EXPECT_EQ(document["errors"], json::array());
  EXPECT_EQ(endOf(agent), 0);
}

TEST_F(WaitingAgent, MissingIsAFailureWithARemedy) {
  ToolEnd end = tellToRun();
  EXPECT_EQ(end.status, 1);
  EXPECT_EQ(end.output, "");
  EXPECT_NE(end.errors.find("this needs the service manager of a session of yours"), std::string::npos)
      << end.errors;
  end = tellToRun({"--json"});
  EXPECT_EQ(end.status, 1);
  EXPECT_EQ(json::parse(end.output)["outcome"], "failed");
}

TEST_F(WaitingAgent, IsFoundAmongProcessesThatAreLeftAlone) {
  const pid_t notWaiting = startNamed("NorvexAgent");
  const pid_t notTheAgent = startNamed("NorvexAgen", blockRunSignal);
  EXPECT_EQ(tellToRun().status, 1);
  const pid_t agent = startByHand();
  EXPECT_EQ(tellToRun().status, 0);
  EXPECT_EQ(endOf(agent), 0);
  EXPECT_FALSE(hasSignal(notTheAgent, "ShdPnd", SIGUSR1));
  expectLeftAlone(notTheAgent);
  expectLeftAlone(notWaiting);
}

TEST_F(WaitingAgent, IsNotOneThatHasEnded) {
  const pid_t agent = startByHand();
  ASSERT_EQ(tellToRun().status, 0);
  ASSERT_TRUE(eventually([&] { return hasEnded(agent); }));
  EXPECT_EQ(tellToRun().status, 1);
  const pid_t next = startByHand();
  EXPECT_EQ(tellToRun().status, 0);
  EXPECT_EQ(endOf(next), 0);
  EXPECT_EQ(endOf(agent), 0);
}

TEST_F(WaitingAgent, IsNotOneThatRunsByForce) {
  // Held where its program begins, with the signal blocked as its first step does.
  world_.beforeExec = [] {
    showInProc();
    blockRunSignal();
    if (::ptrace(PTRACE_TRACEME, 0, nullptr, nullptr) != 0) ::_exit(kNotAllowed);
  };
  const pid_t agent = world_.start({"--force"});
  int status = 0;
  ASSERT_EQ(::waitpid(agent, &status, 0), agent);
  if (WIFEXITED(status) && WEXITSTATUS(status) == kNotAllowed) GTEST_SKIP() << "ptrace is not allowed here";
  ASSERT_TRUE(WIFSTOPPED(status));
  ASSERT_TRUE(isAgent(agent));
  EXPECT_EQ(tellToRun().status, 1);
  EXPECT_FALSE(hasSignal(agent, "ShdPnd", SIGUSR1));
  ::ptrace(PTRACE_DETACH, agent, nullptr, nullptr);
  EXPECT_EQ(endOf(agent), 0);
  EXPECT_EQ(world_.messages().size(), 2U);
}

}  // namespace
}  // namespace norvex
