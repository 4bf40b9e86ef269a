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

constexpr std::size_t byteOf(char character) {
  return static_cast<unsigned char>(character);
}

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

// The ends of a pattern and the longest text between its special characters.
struct Landmarks {
  std::string_view firstElement;
  std::string_view lastElement;
  std::string_view literalRun;
};

Landmarks landmarksOf(std::string_view pattern) {
  Landmarks marks{pattern.substr(0, globElementLength(pattern)), {}, {}};
  std::size_t runStart = 0;
  for (std::size_t at = 0; at < pattern.size();) {
    const std::size_t length = globElementLength(pattern.substr(at));
    marks.lastElement = pattern.substr(at, length);
    at += length;
    if (hasGlobCharacters(marks.lastElement)) {
      runStart = at;
    } else if (at - runStart > marks.literalRun.size()) {
      marks.literalRun = pattern.substr(runStart, at - runStart);
    }
  }
  return marks;
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
    firstOfNames_.set(byteOf(pattern.front()));
  } else if (pattern.starts_with("*.") && !hasGlobCharacters(std::string_view(pattern).substr(1))) {
    offer(suffixes_, std::string_view(pattern).substr(1), choice, entry.caseSensitive);
    longestSuffix_ = std::max(longestSuffix_, pattern.size() - 1);
  } else {
    if (wildcards_.size() == kMaximumWildcards) return;
    addWildcard(pattern, choice, entry.caseSensitive);
  }
  ++patternCount_;
}

// The bytes that a name can begin or end with to fit an element that stands at that end of a pattern.
MimeGlobs::ByteSet MimeGlobs::bytesFitting(std::string_view element) {
  ByteSet bytes;
  if (element == "*" || element == "?") return bytes.set();
  for (unsigned byte = 0; byte < bytes.size(); ++byte) {
    const char character = static_cast<char>(byte);
    bytes[byte] = globMatches(element, std::string_view(&character, 1));
  }
  return bytes;
}

void MimeGlobs::addWildcard(std::string_view pattern, const Choice& choice, bool caseSensitive) {
  const Landmarks marks = landmarksOf(pattern);
  wildcards_.push_back({.choice = choice,
                        .caseSensitive = caseSensitive,
                        .first = bytesFitting(marks.firstElement),
                        .last = bytesFitting(marks.lastElement),
                        .literalRun = std::string(marks.literalRun),
                        .pattern = std::string(pattern)});
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
  return wildcard.last[byteOf(name.back())] && wildcard.first[byteOf(name.front())] &&
         name.find(wildcard.literalRun) != name.npos;
}

MimeGlobs::Choice MimeGlobs::best(std::string_view name, Spelling spelling) const {
  Choice best = bestSuffix(name, spelling);
  // Few names are in the table, and hashing a whole name costs more than all of its suffixes.
  const Choice* const whole = firstOfNames_[byteOf(name.front())] ? find(names_, name, spelling) : nullptr;
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
