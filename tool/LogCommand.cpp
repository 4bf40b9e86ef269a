#include "tool/LogCommand.h"

#include <algorithm>

#include "tool/Faults.h"
#include "tool/FigureText.h"
#include "tool/JsonText.h"
#include "tool/KeyPrefix.h"
#include "tool/MomentText.h"
#include "tool/ReportedMessages.h"
#include "tool/SafeText.h"

namespace norvex {
namespace {

constexpr std::int64_t kMicroseconds = 1'000'000;

const char* nameOf(ReportedMessage::Source source) {
  return source == ReportedMessage::Source::journal ? "journal" : "file";
}

bool isOfDomain(const ReportedMessage& message, const std::optional<std::string>& domain) {
  return !domain || message.domain == *domain || message.domain.ends_with("." + *domain);
}

void tellDamaged(Console& err, const DamagedRecord& damaged) {
  const std::string line = damaged.line == 0 ? "" : ":" + std::to_string(damaged.line);
  err.tell(safeText(damaged.place) + line + ": passed over a damaged message: " + damaged.reason);
}

void writeText(ToolWorld& world, const ReportedMessage& message) {
  Console& out = world.out;
  out.stream() << out.inked(Console::Ink::bold, safeText(message.domain)) << "  "
               << localTime(message.time / kMicroseconds) << "  "
               << out.inked(Console::Ink::dim, std::string("(") + nameOf(message.source) + ")") << '\n';
  std::vector<std::string_view> keys;
  std::size_t widest = 0;
  for (const auto& [key, value] : message.pairs) keys.push_back(key);
  const std::size_t prefix = commonKeyPrefix(keys).size();
  for (const std::string_view key : keys) widest = std::max(widest, columnsOf(safeText(key.substr(prefix))));
  for (const auto& [key, value] : message.pairs) {
    const std::string name = safeText(std::string_view(key).substr(prefix));
    out.stream() << "  " << name << std::string(widest - columnsOf(name) + 2, ' ') << safeText(value) << '\n';
  }
}

JsonDocument jsonOf(const ReportedMessage& message) {
  JsonDocument entry, pairs = JsonDocument::array();
  for (const auto& [key, value] : message.pairs) pairs.push_back(JsonDocument::array({key, value}));
  entry["time"] = utcTime(message.time / kMicroseconds);
  entry["source"] = nameOf(message.source);
  entry["domain"] = message.domain;
  entry["level"] = message.level;
  entry["pairs"] = std::move(pairs);
  return entry;
}

void writeJson(ToolWorld& world, const ReportedMessages& reported, const Faults& faults) {
  JsonDocument messages = JsonDocument::array(), damaged = JsonDocument::array();
  for (const ReportedMessage& message : reported.messages) messages.push_back(jsonOf(message));
  for (const DamagedRecord& record : reported.damaged) {
    JsonDocument entry;
    setText(entry, "path", record.place);
    entry["line"] = record.line;
    entry["message"] = record.reason;
    damaged.push_back(std::move(entry));
  }
  world.out.stream() << jsonPage({{"version", kJsonVersion},
                                  {"messages", std::move(messages)},
                                  {"damaged", std::move(damaged)},
                                  {"errors", faults.asJson()}});
}

}  // namespace

ExitStatus runLog(ToolWorld& world, const LogRequest& request) {
  std::int64_t since = 0;
  if (request.since) {
    const auto moment = momentOf(*request.since, world.secondsSince1970());
    if (!moment) {
      world.err.tell("--since: this is no moment: " + safeText(*request.since) +
                     "; write it as 2026-11-21, \"2026-11-21 07:03\", today, 12h or 3d");
      return ExitStatus::usage;
    }
    since = *moment;
  }
  Faults faults(world.err);
  ReportedMessages reported = reportedMessages(world.agentJournal, world.messagesFile, since, faults);
  std::erase_if(reported.messages,
                [&](const ReportedMessage& message) { return !isOfDomain(message, request.domain); });
  for (const DamagedRecord& damaged : reported.damaged) tellDamaged(world.err, damaged);
  if (request.json) {
    writeJson(world, reported, faults);
    return faults.status();
  }
  for (const ReportedMessage& message : reported.messages) {
    if (&message != &reported.messages.front()) world.out.stream() << '\n';
    writeText(world, message);
  }
  if (reported.messages.empty()) world.out.stream() << "No message has been reported.\n";
  return faults.status();
}

}  // namespace norvex
