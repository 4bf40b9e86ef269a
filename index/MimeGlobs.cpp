#include "index/MimeGlobs.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <limits>

#include "index/AsciiCase.h"
#include "index/GlobPattern.h"

namespace norvex {

// One line of a database.
struct MimeGlobs::Entry {
  unsigned weight = 0;
  std::string_view type;
  std::string_view pattern;
  bool caseSensitive = false;
};

namespace {

constexpr unsigned highestWeight = 100;
constexpr std::string_view noGlobs = "__NOGLOBS__";
constexpr char anyCharacter = '*';

std::string_view takeField(std::string_view& rest, char separator) {
  const std::size_t end = rest.find(separator);
  const std::string_view field = rest.substr(0, end);
  rest = end == std::string_view::npos ? std::string_view() : rest.substr(end + 1);
  return field;
}

std::optional<unsigned> parseWeight(std::string_view text) {
  unsigned weight = 0;
  const char* const end = text.data() + text.size();
  const auto [stop, error] = std::from_chars(text.data(), end, weight);
  if (error != std::errc() || stop != end || weight > highestWeight) return std::nullopt;
  return weight;
}

bool isTypeName(std::string_view text) {
  const std::size_t slash = text.find('/');
  if (slash == std::string_view::npos || slash == 0 || slash + 1 == text.size()) return false;
  if (text.size() > MimeGlobs::kMaximumPatternLength || text.find('/', slash + 1) != text.npos) return false;
  return std::all_of(text.begin(), text.end(), [](char c) { return c > ' ' && c < '\x7f'; });
}

// No name holds a slash; control characters come from files that are no databases.
bool isPattern(std::string_view text) {
  if (text.empty() || text.size() > MimeGlobs::kMaximumPatternLength) return false;
  return std::none_of(text.begin(), text.end(),
                      [](char c) { return (c >= '\0' && c < ' ') || c == '\x7f' || c == '/'; });
}

bool hasFlag(std::string_view flags, std::string_view flag) {
  while (!flags.empty()) {
    if (takeField(flags, ',') == flag) return true;
  }
  return false;
}

std::string lowered(std::string_view text) {
  std::string result(text);
  std::transform(result.begin(), result.end(), result.begin(), asciiLowered);
  return result;
}

// Weight, then length, then earliness, as one number that grows with all three. Never 0: no pattern is empty.
std::uint64_t rankOf(unsigned weight, std::size_t length, std::uint32_t line) {
  return (std::uint64_t{weight} << 48U) | (std::uint64_t{length} << 32U) |
         (std::numeric_limits<std::uint32_t>::max() - line);
}

// The longest run of plain characters. Brackets and quotings end the search: what follows is not needed.
std::string longestLiteralRun(std::string_view pattern) {
  pattern = pattern.substr(0, pattern.find_first_of("[\\"));
  std::string_view longest;
  while (!pattern.empty()) {
    const std::size_t end = pattern.find_first_of("*?");
    const std::string_view run = pattern.substr(0, end);
    if (run.size() > longest.size()) longest = run;
    pattern = end == std::string_view::npos ? std::string_view() : pattern.substr(end + 1);
  }
  return std::string(longest);
}

char literalFirst(std::string_view pattern) {
  return hasGlobCharacters(pattern.substr(0, 1)) ? anyCharacter : pattern.front();
}

// A pattern with brackets or quotings is not looked at from its end: its last character may mean another.
char literalLast(std::string_view pattern) {
  if (pattern.find_first_of("[\\") != std::string_view::npos || pattern.back() == '?') return anyCharacter;
  return pattern.back();
}

}  // namespace

std::optional<MimeGlobs::Entry> MimeGlobs::parseLine(std::string_view line) {
  if (line.starts_with('#')) return std::nullopt;
  Entry entry;
  const auto weight = parseWeight(takeField(line, ':'));
  entry.type = takeField(line, ':');
  entry.pattern = takeField(line, ':');
  entry.caseSensitive = hasFlag(takeField(line, ':'), "cs");
  if (!weight || !isTypeName(entry.type) || !isPattern(entry.pattern)) return std::nullopt;
  entry.weight = *weight;
  return entry;
}

void MimeGlobs::addDatabase(std::string_view text) {
  std::vector<Entry> entries;
  std::unordered_set<std::string, TextHash, std::equal_to<>> caseSensitiveEntries;
  std::vector<std::string> closedHere;
  const auto identity = [](const Entry& entry) {
    return std::string(entry.type).append(1, ':').append(entry.pattern);
  };
  while (!text.empty()) {
    const auto entry = parseLine(takeField(text, '\n'));
    if (!entry) continue;
    if (entry->pattern == noGlobs) {
      closedHere.emplace_back(entry->type);
      continue;
    }
    if (entry->caseSensitive) caseSensitiveEntries.insert(identity(*entry));
    entries.push_back(*entry);
  }

  for (const Entry& entry : entries) {
    ++lineCount_;
    // Case-sensitive lines are repeated without their flag, for readers that know no flags. Taken at its
    // word, the repetition of "*.C" would make every C file a C++ file.
    if (!entry.caseSensitive && caseSensitiveEntries.contains(identity(entry))) continue;
    if (!closedTypes_.contains(entry.type)) add(entry, lineCount_);
  }
  closedTypes_.insert(closedHere.begin(), closedHere.end());
  std::stable_sort(wildcards_.begin(), wildcards_.end(),
                   [](const Wildcard& a, const Wildcard& b) { return a.choice.rank > b.choice.rank; });
}

std::optional<MimeGlobs::TypeNumber> MimeGlobs::numberOf(std::string_view type) {
  const auto known = numbers_.find(type);
  if (known != numbers_.end()) return known->second;
  if (types_.size() == kMaximumTypes) return std::nullopt;
  const auto number = static_cast<TypeNumber>(types_.size());
  types_.emplace_back(type);
  numbers_.emplace(type, number);
  return number;
}

void MimeGlobs::add(const Entry& entry, std::uint32_t line) {
  const auto number = numberOf(entry.type);
  if (!number) return;
  // A pattern that does not tell capitals apart is met by names whose capitals were made small.
  const std::string pattern = entry.caseSensitive ? std::string(entry.pattern) : lowered(entry.pattern);
  const Choice choice{rankOf(entry.weight, pattern.size(), line), *number};
  if (!hasGlobCharacters(pattern)) {
    offer(names_, pattern, choice, entry.caseSensitive);
  } else if (pattern.starts_with("*.") && !hasGlobCharacters(std::string_view(pattern).substr(1))) {
    offer(suffixes_, std::string_view(pattern).substr(1), choice, entry.caseSensitive);
    longestSuffix_ = std::max(longestSuffix_, pattern.size() - 1);
  } else {
    if (wildcards_.size() == kMaximumWildcards) return;
    addWildcard(pattern, choice, entry.caseSensitive);
  }
  ++patternCount_;
}

void MimeGlobs::addWildcard(std::string_view pattern, const Choice& choice, bool caseSensitive) {
  wildcards_.push_back({.pattern = std::string(pattern),
                        .literalRun = longestLiteralRun(pattern),
                        .first = literalFirst(pattern),
                        .last = literalLast(pattern),
                        .choice = choice,
                        .caseSensitive = caseSensitive});
}

void MimeGlobs::offer(ChoiceTable& table, std::string_view key, const Choice& choice, bool caseSensitive) {
  Choices& choices = table[std::string(key)];
  if (choice.rank > choices.asWritten.rank) choices.asWritten = choice;
  if (!caseSensitive && choice.rank > choices.lowered.rank) choices.lowered = choice;
}

const MimeGlobs::Choice* MimeGlobs::find(const ChoiceTable& table, std::string_view key, Spelling spelling) {
  const auto found = table.find(key);
  if (found == table.end()) return nullptr;
  return spelling == Spelling::asWritten ? &found->second.asWritten : &found->second.lowered;
}

MimeGlobs::Choice MimeGlobs::bestSuffix(std::string_view name, Spelling spelling) const {
  Choice best;
  // A suffix that is longer than every pattern is not worth its hash: a name may be nothing but dots.
  std::size_t start = name.size() > longestSuffix_ ? name.size() - longestSuffix_ : 0;
  for (start = name.find('.', start); start != name.npos; start = name.find('.', start + 1)) {
    const Choice* const choice = find(suffixes_, name.substr(start), spelling);
    if (choice != nullptr && choice->rank > best.rank) best = *choice;
  }
  return best;
}

// Tells most names from most patterns without matching them.
bool MimeGlobs::mayFit(const Wildcard& wildcard, std::string_view name) {
  if (wildcard.first != anyCharacter && wildcard.first != name.front()) return false;
  if (wildcard.last != anyCharacter && wildcard.last != name.back()) return false;
  return name.find(wildcard.literalRun) != name.npos;
}

MimeGlobs::Choice MimeGlobs::best(std::string_view name, Spelling spelling) const {
  Choice best = bestSuffix(name, spelling);
  const Choice* const whole = find(names_, name, spelling);
  if (whole != nullptr && whole->rank > best.rank) best = *whole;
  for (const Wildcard& wildcard : wildcards_) {
    if (wildcard.choice.rank < best.rank) break;
    if (wildcard.caseSensitive && spelling == Spelling::lowered) continue;
    if (mayFit(wildcard, name) && globMatches(wildcard.pattern, name)) return wildcard.choice;
  }
  return best;
}

std::optional<MimeGlobs::TypeNumber> MimeGlobs::typeOfName(std::string_view name) const {
  if (name.empty()) return std::nullopt;
  Choice choice = best(name, Spelling::asWritten);
  const auto isCapital = [](char character) { return character >= 'A' && character <= 'Z'; };
  if (choice.rank == 0 && std::any_of(name.begin(), name.end(), isCapital)) {
    std::array<char, 1024> buffer;
    if (name.size() <= buffer.size()) {
      std::transform(name.begin(), name.end(), buffer.begin(), asciiLowered);
      choice = best(std::string_view(buffer.data(), name.size()), Spelling::lowered);
    } else {
      choice = best(lowered(name), Spelling::lowered);
    }
  }
  if (choice.rank == 0) return std::nullopt;
  return choice.type;
}

}  // namespace norvex
