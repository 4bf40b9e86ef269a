#include "tool/DoctorCommand.h"

#include <algorithm>
#include <array>
#include <string_view>
#include <vector>

#include "tool/JsonText.h"
#include "tool/WrappedText.h"

namespace norvex {
namespace {

struct StateWords {
  const char* label;  // for people; all of one width
  const char* key;    // in JSON; never changes
};

// In the order of Finding::State.
constexpr std::array<StateWords, 3> kStates{
    {{"works     ", "works"}, {"falls back", "fallsBack"}, {"broken    ", "broken"}}};

const StateWords& wordsOf(const Finding& finding) {
  return kStates[static_cast<std::size_t>(finding.state)];
}

void writeText(Console& out, const Finding& finding) {
  constexpr std::size_t kIndent = 12;
  const bool isFine = finding.state == Finding::State::works;
  out.stream() << out.inked(isFine ? Console::Ink::dim : Console::Ink::warning, wordsOf(finding).label)
               << "  " << out.inked(Console::Ink::bold, finding.role) << '\n';
  const auto write = [&out](const std::string& text) {
    for (const std::string& line : wrappedText(text, out.style().width - kIndent))
      out.stream() << std::string(kIndent, ' ') << line << '\n';
  };
  write(finding.text);
  if (!finding.remedy.empty()) write("-> " + finding.remedy);
}

void writeJson(Console& out, const std::vector<Finding>& findings) {
  JsonDocument list = JsonDocument::array();
  for (const Finding& finding : findings) {
    list.push_back({{"role", finding.role},
                    {"state", wordsOf(finding).key},
                    {"message", finding.text},
                    {"remedy", finding.remedy}});
  }
  out.stream() << jsonPage(
      {{"version", kJsonVersion}, {"findings", std::move(list)}, {"errors", JsonDocument::array()}});
}

}  // namespace

ExitStatus runDoctor(ToolWorld& world, const DoctorRequest& request, const DoctorPlaces& places) {
  const std::vector<Finding> findings = examine(world, places);
  if (request.json) {
    writeJson(world.out, findings);
  } else {
    for (const Finding& finding : findings) writeText(world.out, finding);
  }
  const bool isBroken = std::any_of(findings.begin(), findings.end(), [](const Finding& finding) {
    return finding.state == Finding::State::broken;
  });
  return isBroken ? ExitStatus::failed : ExitStatus::success;
}

}  // namespace norvex
