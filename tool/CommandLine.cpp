#include "tool/CommandLine.h"

#include <CLI/CLI.hpp>
#include <memory>
#include <string>

namespace norvex {
namespace {

constexpr const char* kProgramName = "norvexctl";

constexpr const char* kProgramFooter =
    "Example:\n"
    "  norvexctl index update && norvexctl index status\n"
    "\n"
    "Exit status: 0 done, 1 something could not be done, 2 the command line makes no sense.";

constexpr const char* kUpdateFooter =
    "Without VOLUME: the included volumes of the backup settings (chronel/backup.conf).\n"
    "Ctrl-C leaves every index as it was.\n"
    "\n"
    "Example:\n"
    "  norvexctl index update / /home";

constexpr const char* kStatusFooter =
    "Without VOLUME: the included volumes of the backup settings.\n"
    "\n"
    "Example:\n"
    "  norvexctl index status /";

constexpr const char* kQueryFooter =
    "Without --volume: the included volumes that have an index.\n"
    "\n"
    "A predicate compares attributes (== != < <= > >=, InRange(attribute, low, high), attribute == *),\n"
    "joined by && || ! and parentheses. In a string, * stands for anything; behind it, c ignores case\n"
    "and d diacritics. `norvexctl index show PATH` names the attributes of an item.\n"
    "\n"
    "Examples:\n"
    "  norvexctl index query 'kMDItemFSName == \"*.iso\"c && kMDItemFSSize > 1000000000'\n"
    "  norvexctl index query --null 'kMDItemContentTypeTree == \"public.image\"' | xargs -0 ls -l";

constexpr const char* kShowFooter =
    "Example:\n"
    "  norvexctl index show ~/Downloads";

constexpr const char* kJsonHelp = "Write one JSON document (docs/norvexctl-json.md)";

// The commands and where their arguments go. Outlives the parsing.
struct Grammar {
  CLI::App program{"Shows how the storage of this machine is used.", kProgramName};
  IndexUpdateRequest updateRequest;
  IndexStatusRequest statusRequest;
  IndexQueryRequest queryRequest;
  IndexShowRequest showRequest;
  CLI::App* update = nullptr;
  CLI::App* status = nullptr;
  CLI::App* query = nullptr;
  CLI::App* show = nullptr;

  Grammar() {
    program.footer(kProgramFooter);
    program.require_subcommand(1);
    CLI::App* index = program.add_subcommand("index", "The metadata index of whole volumes");
    index->require_subcommand(1);
    index->footer(kProgramFooter);
    addUpdate(*index);
    addStatus(*index);
    addQuery(*index);
    addShow(*index);
  }

  void addUpdate(CLI::App& index) {
    update = index.add_subcommand("update", "Make the indexes of volumes anew");
    update->footer(kUpdateFooter);
    update->add_option("VOLUME", updateRequest.volumes, "Mount points of volumes")->type_name("");
    update->add_flag("--json", updateRequest.json, kJsonHelp);
  }

  void addStatus(CLI::App& index) {
    status = index.add_subcommand("status", "Show what the indexes say of volumes");
    status->footer(kStatusFooter);
    status->add_option("VOLUME", statusRequest.volumes, "Mount points of volumes")->type_name("");
    status->add_flag("--json", statusRequest.json, kJsonHelp);
  }

  void addQuery(CLI::App& index) {
    query = index.add_subcommand("query", "List the items that match a predicate");
    query->footer(kQueryFooter);
    query->add_option("PREDICATE", queryRequest.predicate, "What to look for")->required()->type_name("");
    query->add_option("--volume", queryRequest.volumes, "Look on this volume; may be given several times")
        ->type_name("VOLUME")
        ->expected(1)
        ->multi_option_policy(CLI::MultiOptionPolicy::TakeAll);
    CLI::Option* count = query->add_flag("--count", queryRequest.countOnly, "Write only how many match");
    CLI::Option* null =
        query->add_flag("-0,--null", queryRequest.nullSeparated, "End each path with a NUL, for xargs -0");
    CLI::Option* json = query->add_flag("--json", queryRequest.json, kJsonHelp);
    null->excludes(count)->excludes(json);
  }

  void addShow(CLI::App& index) {
    show = index.add_subcommand("show", "Show all attributes of an item");
    show->footer(kShowFooter);
    show->add_option("PATH", showRequest.path, "The item's path")->required()->type_name("");
    show->add_flag("--json", showRequest.json, kJsonHelp);
  }

  CommandRequest request() const {
    if (update->parsed()) return updateRequest;
    if (status->parsed()) return statusRequest;
    if (query->parsed()) return queryRequest;
    return showRequest;
  }
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
