#include "tool/ReportedMessages.h"

#include <algorithm>
#include <cerrno>
#include <nlohmann/json.hpp>

#include "platform/linux/Files.h"
#include "tool/MomentText.h"

namespace norvex {
namespace {

using Json = nlohmann::json;

// Thousands of reports fit; a file that is larger is not the agent's.
constexpr std::size_t kLargestFile = std::size_t{256} << 20;
constexpr std::int64_t kMicroseconds = 1'000'000;

bool hasShape(const Json& message) {
  return message.is_object() && message.contains("domain") && message["domain"].is_string() &&
         message.contains("level") && message["level"].is_number_integer() && message.contains("pairs") &&
         message["pairs"].is_array();
}

bool isPair(const Json& pair) {
  return pair.is_array() && pair.size() == 2 && pair[0].is_string() && pair[1].is_string();
}

class Reader {
 public:
  Reader(std::int64_t since, Faults& faults) : since_(since), faults_(faults) {}

  void readJournal(AgentJournal& journal) {
    const auto entries = journal.entriesSince(since_);
    if (!entries) return faults_.add("journal", "unreadable", entries.error().description);
    for (const AgentJournalEntry& entry : entries.value()) {
      if (!entry.isDiagnostic) continue;
      auto message = parsedMessage(entry.text);
      if (!message) {
        found_.damaged.push_back({"the journal", 0, message.error().description});
        continue;
      }
      message.value().time = entry.time;
      take(std::move(message).value(), ReportedMessage::Source::journal);
    }
  }

  void readFile(const std::string& path) {
    const auto text = readWholeFile(path, kLargestFile);
    if (!text && text.error().code == ENOENT) return;
    if (!text) return faults_.add(path, "unreadable", "cannot be read: " + text.error().description);
    std::string_view rest = text.value();
    for (std::uint64_t line = 1; !rest.empty(); ++line) {
      const std::string_view record = rest.substr(0, rest.find('\n'));
      rest.remove_prefix(std::min(rest.size(), record.size() + 1));
      if (!record.empty()) readLine(path, line, record);
    }
  }

  // The newest last; of two of one moment the one that was read first.
  ReportedMessages found() {
    std::stable_sort(found_.messages.begin(), found_.messages.end(),
                     [](const ReportedMessage& a, const ReportedMessage& b) { return a.time < b.time; });
    return std::move(found_);
  }

 private:
  void readLine(const std::string& path, std::uint64_t line, std::string_view record) {
    auto message = parsedMessage(record);
    if (!message) {
      found_.damaged.push_back({path, line, message.error().description});
    } else if (message.value().time >= since_ * kMicroseconds) {
      take(std::move(message).value(), ReportedMessage::Source::file);
    }
  }

  void take(ReportedMessage message, ReportedMessage::Source source) {
    message.source = source;
    found_.messages.push_back(std::move(message));
  }

  const std::int64_t since_;
  Faults& faults_;
  ReportedMessages found_;
};

}  // namespace

Result<ReportedMessage> parsedMessage(std::string_view json) {
  const Json document = Json::parse(json, nullptr, false);
  if (document.is_discarded()) return Error{EBADMSG, "it is no JSON, or only the beginning of some"};
  if (!hasShape(document)) return Error{EBADMSG, "it lacks a domain, a level or pairs"};
  ReportedMessage message;
  message.domain = document["domain"];
  message.level = document["level"];
  for (const Json& pair : document["pairs"]) {
    if (!isPair(pair)) return Error{EBADMSG, "a pair is not two texts"};
    message.pairs.emplace_back(pair[0], pair[1]);
  }
  if (const auto time = document.find("time"); time != document.end()) {
    const auto moment = time->is_string() ? momentOf(time->get<std::string>(), 0) : std::nullopt;
    if (!moment) return Error{EBADMSG, "its time is none"};
    message.time = *moment * kMicroseconds;
  }
  return message;
}

ReportedMessages reportedMessages(AgentJournal& journal, const std::string& file, std::int64_t since,
                                  Faults& faults) {
  Reader reader(since, faults);
  reader.readJournal(journal);
  reader.readFile(file);
  return reader.found();
}

}  // namespace norvex
