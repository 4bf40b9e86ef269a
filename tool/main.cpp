// The companion command: makes what the commands work with, and hands over to the one that was asked for.
#include <unistd.h>

#include <chrono>
#include <clocale>
#include <cstdio>
#include <exception>
#include <filesystem>
#include <iostream>
#include <string>
#include <system_error>

#include "index/MountPoints.h"
#include "machine/MachinePlatform.h"
#include "platform/linux/FileDiagnosticLog.h"
#include "platform/linux/LocaleByteCountFormatter.h"
#include "tool/CommandLine.h"
#include "tool/Commands.h"
#include "tool/ConsoleSystemLog.h"
#include "tool/StopSignals.h"
#include "tool/SystemdAgentJob.h"
#include "tool/SystemdAgentJournal.h"
#include "tool/WaitingAgent.h"

namespace {

std::int64_t secondsSince1970() {
  using std::chrono::duration_cast, std::chrono::seconds, std::chrono::system_clock;
  return duration_cast<seconds>(system_clock::now().time_since_epoch()).count();
}

std::string absolutePath(const std::string& path) {
  std::error_code error;  // no working folder: the path stays as it is, and nothing is found there
  const std::filesystem::path absolute = std::filesystem::absolute(path, error);
  return error ? path : absolute.string();
}

norvex::ExitStatus run(int argc, const char* const* argv) {
  using namespace norvex;
  const auto parsed = parseCommandLine(argc, argv, std::cout, std::cerr);
  if (const auto* status = std::get_if<ExitStatus>(&parsed)) return *status;
  const auto& request = std::get<CommandRequest>(parsed);
  const Environment environment = processEnvironment();
  Console out(std::cout, ConsoleStyle::of(STDOUT_FILENO, environment));
  Console err(std::cerr, ConsoleStyle::of(STDERR_FILENO, environment));
  ConsoleSystemLog log(err);
  const MachinePlatform machine(argc, argv, environment, log);
  const Platform& roles = machine.roles();
  const ScopedPlatform installed(roles);
  const LocaleByteCountFormatter numbers;
  SystemdAgentJournal journal;
  SystemdAgentJob job(environment);
  ToolWorld world{.out = out,
                  .err = err,
                  .stores = machine.storeFolder(),
                  .backupSettings = roles.backupSettings,
                  .byteCounts = roles.byteCountFormatter,
                  .digits = [&numbers](std::uint64_t number) { return numbers.grouped(number); },
                  .clock = roles.clock,
                  .secondsSince1970 = secondsSince1970,
                  .isMountPoint = isMountPoint,
                  .absolute = absolutePath,
                  .dataHome = machine.folders().data,
                  .messagesFile = FileDiagnosticLog::pathBelow(machine.folders().state),
                  .disabledFile = "/etc/norvex/disabled",
                  .agentJournal = journal,
                  .agentJob = job,
                  .wakeWaitingAgent = [] { return wakeWaitingAgent().has_value(); },
                  .cancelled = stopWanted()};

  ExitStatus status = runCommand(world, request);
  worsen(status, log.status());
  if (!std::cout.flush()) {
    err.tell("the output could not be written to its end; is there room where it goes?");
    worsen(status, ExitStatus::failed);
  }
  return status;
}

}  // namespace

int main(int argc, char* argv[]) {
  try {
    std::setlocale(LC_CTYPE, "");
    std::ios::sync_with_stdio(false);
    return static_cast<int>(run(argc, argv));
  } catch (const std::exception& error) {  // of the libraries: out of memory, above all
    std::fprintf(stderr, "norvexctl: %s\n", error.what());
    return static_cast<int>(norvex::ExitStatus::failed);
  }
}
