#include "tool/AgentStatusCommand.h"

#include <algorithm>
#include <optional>
#include <string>
#include <vector>

#include "agent/AgentIdentity.h"
#include "tool/AgentSwitch.h"
#include "tool/Faults.h"
#include "tool/FigureText.h"
#include "tool/JsonText.h"
#include "tool/ReportedMessages.h"
#include "tool/SafeText.h"
#include "tool/Volumes.h"
#include "tool/WrappedText.h"

namespace norvex {
namespace {

constexpr std::int64_t kMicroseconds = 1'000'000;
constexpr int kErrorPriority = 3;
constexpr std::size_t kMostLines = 10;
// A week: how far back lines are looked for when nothing tells when the last run was.
constexpr std::int64_t kRecent = 604'800;

struct AgentStatus {
  bool hasReported = false;
  std::optional<std::int64_t> reportedAt;  // seconds since 1970; absent when no message is left of it
  std::size_t messages = 0;                // of that report
  std::optional<AgentJobState> job;
  AgentSwitch agentSwitch;
  std::vector<AgentJournalEntry> errors;  // the agent's own, since the last run
  std::vector<NotReadyVolume> notReady;
};

class AgentStatusCommand {
 public:
  explicit AgentStatusCommand(ToolWorld& world) : world_(world), faults_(world.err) {}

  ExitStatus run(bool json) {
    readReports();
    readJob();
    if (!status_.hasReported) {
      readErrors();
      status_.notReady = volumesNotReady(world_);
    }
    json ? writeJson() : writeText();
    return faults_.status();
  }

 private:
  // A report's messages are recorded within moments of each other.
  void readReports() {
    status_.hasReported = thisReleaseHasReported();
    const auto found = reportedMessages(world_.agentJournal, world_.messagesFile, 0, faults_).messages;
    if (found.empty()) return;
    constexpr std::int64_t kOneReport = 60 * kMicroseconds;
    const std::int64_t newest = found.back().time;
    status_.reportedAt = newest / kMicroseconds;
    status_.messages = static_cast<std::size_t>(std::count_if(
        found.begin(), found.end(),
        [newest](const ReportedMessage& message) { return newest - message.time < kOneReport; }));
  }

  void readJob() {
    auto state = world_.agentJob.state();
    if (!state)
      return faults_.add(agentLabel, "failed", state.error().description + jobRemedy(state.error()));
    status_.job = std::move(state).value();
    status_.agentSwitch = agentSwitchOf(world_, *status_.job);
  }

  void readErrors() {
    const std::int64_t recent = world_.secondsSince1970() - kRecent;
    const auto since = status_.job ? status_.job->lastStart.value_or(recent) : recent;
    const auto entries = world_.agentJournal.entriesSince(since);
    if (!entries) return;  // told when the reports were read
    for (const AgentJournalEntry& entry : entries.value()) {
      if (!entry.isDiagnostic && entry.priority <= kErrorPriority) status_.errors.push_back(entry);
    }
    if (status_.errors.size() > kMostLines)
      status_.errors.erase(status_.errors.begin(), status_.errors.end() - kMostLines);
  }

  void writeLine(const char* label, const std::string& text) {
    constexpr std::size_t kLabelColumns = 10, kIndent = 2, kGap = 2;
    const std::size_t taken = kIndent + kLabelColumns + kGap;
    std::string name(label);
    for (const std::string& line : wrappedText(text, world_.out.style().width - taken)) {
      world_.out.stream() << std::string(kIndent, ' ') << world_.out.inked(Console::Ink::dim, name)
                          << std::string(kLabelColumns + kGap - name.size(), ' ') << line << '\n';
      name.clear();
    }
  }

  std::string momentText(std::int64_t moment) const {
    return localTime(moment) + " (" + ageText(world_.secondsSince1970() - moment) + ")";
  }

  std::string reportText() const {
    if (!status_.hasReported) return "not yet";
    if (!status_.reportedAt) return "yes; its messages are no longer in any log";
    return momentText(*status_.reportedAt) + ", " + countText(world_.digits, status_.messages, "message") +
           "; see them with: norvexctl log";
  }

  std::string lastRunText() const {
    const AgentJobState& job = *status_.job;
    if (job.isRunning) return "under way";
    if (!job.lastStart) return "none that the service manager remembers";
    const std::string end =
        job.lastResult == "success" ? "ended well" : "failed: " + safeText(job.lastResult);
    return momentText(*job.lastStart) + ", " + end;
  }

  void writeText() {
    world_.out.stream() << world_.out.inked(Console::Ink::bold, "The agent's report of this release") << '\n';
    writeLine("Reported", reportText());
    if (status_.job) {
      writeLine("Job", status_.agentSwitch.isOn ? "on" : "off: " + status_.agentSwitch.explanation);
      if (status_.agentSwitch.isOn && status_.job->nextRun)
        writeLine("Next run", localTime(*status_.job->nextRun) + ", or at a better moment");
      writeLine("Last run", lastRunText());
    } else {
      writeLine("Job", "cannot be asked for");
    }
    writeReasons();
  }

  void writeReasons() {
    if (status_.notReady.empty() && status_.errors.empty()) return;
    world_.out.stream() << '\n'
                        << world_.out.inked(Console::Ink::bold, "Why nothing has been reported") << '\n';
    for (const NotReadyVolume& volume : status_.notReady)
      writeLine("Volume", safeText(volume.root) + ": " + volume.fault.message);
    for (const AgentJournalEntry& entry : status_.errors)
      writeLine("Log", localTime(entry.time / kMicroseconds) + " " + safeText(entry.text));
  }

  static JsonDocument timeOrNull(const std::optional<std::int64_t>& moment) {
    return moment ? JsonDocument(utcTime(*moment)) : JsonDocument(nullptr);
  }

  void writeJson() {
    JsonDocument document{{"version", kJsonVersion},
                          {"reported", status_.hasReported},
                          {"reportedAt", timeOrNull(status_.reportedAt)},
                          {"messages", status_.messages}};
    document["job"] = nullptr;
    if (status_.job) {
      document["job"] = {{"on", status_.agentSwitch.isOn},
                         {"decidedBy", status_.agentSwitch.decidedBy},
                         {"running", status_.job->isRunning},
                         {"nextRun", timeOrNull(status_.job->nextRun)},
                         {"lastStart", timeOrNull(status_.job->lastStart)},
                         {"lastEnd", timeOrNull(status_.job->lastEnd)},
                         {"lastResult", status_.job->lastResult}};
    }
    document["notReady"] = JsonDocument::array();
    for (const NotReadyVolume& volume : status_.notReady) {
      JsonDocument entry;
      setText(entry, "root", volume.root);
      entry["reason"] = reasonText(volume.fault.kind);
      entry["message"] = volume.fault.message;
      document["notReady"].push_back(std::move(entry));
    }
    document["log"] = JsonDocument::array();
    for (const AgentJournalEntry& entry : status_.errors) {
      JsonDocument line{{"time", utcTime(entry.time / kMicroseconds)}};
      setText(line, "message", entry.text);
      document["log"].push_back(std::move(line));
    }
    document["errors"] = faults_.asJson();
    world_.out.stream() << jsonPage(document);
  }

  ToolWorld& world_;
  Faults faults_;
  AgentStatus status_;
};

}  // namespace

ExitStatus runAgentStatus(ToolWorld& world, const AgentStatusRequest& request) {
  return AgentStatusCommand(world).run(request.json);
}

}  // namespace norvex
