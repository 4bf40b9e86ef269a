#include "tool/CommandLine.h"

#include <CLI/CLI.hpp>
#include <functional>
#include <memory>
#include <string>
#include <utility>
#include <vector>

#include "tool/HelpTexts.h"

namespace norvex {
namespace {

constexpr const char* kProgramName = "norvexctl";

// The commands and where their arguments go. Outlives the parsing.
class Grammar {
 public:
  CLI::App program{"Shows how the storage of this machine is used, and what is reported of it.",
                   kProgramName};

  Grammar() {
    program.footer(help::kProgram);
    program.require_subcommand(1);
    CLI::App* index = program.add_subcommand("index", "The metadata index of whole volumes");
    index->require_subcommand(1);
    index->footer(help::kIndex);
    addIndexUpdate(*index);
    addIndexStatus(*index);
    addIndexQuery(*index);
    addIndexShow(*index);
    addPreview();
    addSummary();
    addShow();
    addLog();
    addAgent();
    add<DoctorRequest>(program, "doctor", "Show what works on this machine and what does not", help::kDoctor);
  }

  // The command that was parsed, with its arguments.
  CommandRequest request() const {
    for (const auto& [app, request] : commands_) {
      if (app->parsed()) return request();
    }
    return {};  // the program requires one
  }

 private:
  // The parser's command and where its arguments go.
  template <typename Request>
  struct Command {
    CLI::App& app;
    Request& request;
  };

  // Every command can write JSON.
  template <typename Request>
  Command<Request> add(CLI::App& parent, const char* name, const char* description, const char* footer) {
    const auto request = std::make_shared<Request>();
    CLI::App* app = parent.add_subcommand(name, description);
    app->footer(footer);
    app->add_flag("--json", request->json, "Write one JSON document (docs/norvexctl-json.md)");
    commands_.emplace_back(app, [request] { return CommandRequest(*request); });
    return {*app, *request};
  }

  void addIndexUpdate(CLI::App& index) {
    const auto [app, request] =
        add<IndexUpdateRequest>(index, "update", "Make the indexes of volumes anew", help::kIndexUpdate);
    app.add_option("VOLUME", request.volumes, "Mount points of volumes")->type_name("");
  }

  void addIndexStatus(CLI::App& index) {
    const auto [app, request] =
        add<IndexStatusRequest>(index, "status", "Show what the indexes say of volumes", help::kIndexStatus);
    app.add_option("VOLUME", request.volumes, "Mount points of volumes")->type_name("");
  }

  void addIndexQuery(CLI::App& index) {
    const auto [app, request] =
        add<IndexQueryRequest>(index, "query", "List the items that match a predicate", help::kIndexQuery);
    app.add_option("PREDICATE", request.predicate, "What to look for")->required()->type_name("");
    app.add_option("--volume", request.volumes, "Look on this volume; may be given several times")
        ->type_name("VOLUME")
        ->expected(1)
        ->multi_option_policy(CLI::MultiOptionPolicy::TakeAll);
    CLI::Option* count = app.add_flag("--count", request.countOnly, "Write only how many match");
    CLI::Option* null =
        app.add_flag("-0,--null", request.nullSeparated, "End each path with a NUL, for xargs -0");
    null->excludes(count)->excludes(app.get_option("--json"));
  }

  void addIndexShow(CLI::App& index) {
    const auto [app, request] =
        add<IndexShowRequest>(index, "show", "Show all attributes of an item", help::kIndexShow);
    app.add_option("PATH", request.path, "The item's path")->required()->type_name("");
  }

  // What every command that measures has.
  template <typename Request>
  static void addNoIndex(const Command<Request>& command) {
    command.app.add_flag("!--no-index", command.request.updateIndex,
                         "Measure with the index as it is, instead of updating it first");
  }

  void addPreview() {
    addNoIndex(add<PreviewRequest>(program, "preview", "Show what would be reported", help::kPreview));
  }

  void addSummary() {
    addNoIndex(add<SummaryRequest>(program, "summary", "Show every figure exactly", help::kSummary));
  }

  void addShow() {
    const auto command = add<ShowRequest>(program, "show", "Show where the space went", help::kShow);
    addNoIndex(command);
    command.app.add_option("--html", command.request.htmlFile, "Write a page for the browser into this file")
        ->type_name("FILE")
        ->excludes(command.app.get_option("--json"));
  }

  void addLog() {
    const auto [app, request] = add<LogRequest>(program, "log", "Show what has been reported", help::kLog);
    app.add_option("--since", request.since, "Only from this moment on")->type_name("MOMENT");
    app.add_option("--domain", request.domain, "Only messages of this domain, or ending so, such as run2")
        ->type_name("DOMAIN");
  }

  void addAgent() {
    CLI::App& agent = *program.add_subcommand("agent", "The agent that reports, and its job");
    agent.require_subcommand(1);
    agent.footer(help::kAgent);
    add<AgentStatusRequest>(agent, "status", "Show whether it has reported, and why not", help::kAgentStatus);
    add<AgentRunRequest>(agent, "run", "Start it now", help::kAgentRun);
    add<AgentEnableRequest>(agent, "enable", "Switch its job on for you", help::kAgentEnable);
    add<AgentDisableRequest>(agent, "disable", "Switch its job off for you", help::kAgentDisable);
  }

  std::vector<std::pair<CLI::App*, std::function<CommandRequest()>>> commands_;
};

}  // namespace

std::variant<CommandRequest, ExitStatus> parseCommandLine(int argc, const char* const* argv,
                                                          std::ostream& out, std::ostream& err) {
  // The library tells what is wrong by exceptions; they end here.
  Grammar grammar;
  try {
    grammar.program.parse(argc, argv);
  } catch (const CLI::Success& help) {
    grammar.program.exit(help, out, err);
    return ExitStatus::success;
  } catch (const CLI::Error& error) {
    err << kProgramName << ": " << error.what() << "\nTry: " << kProgramName
        << " --help, or --help after a command\n";
    return ExitStatus::usage;
  }
  return grammar.request();
}

}  // namespace norvex
