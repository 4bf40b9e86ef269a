// The names that MIME types go by: the patterns of the desktop's databases, made fast.
//
// Filled once by ContentTypes; afterwards only read, then by any number of threads at once.
#pragma once

#include <bitset>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <unordered_map>
#include <unordered_set>
#include <vector>

namespace norvex {

class MimeGlobs {
 public:
  // A type's place in types().
  using TypeNumber = std::uint16_t;

  // Beyond these, entries are ignored. The usual database has 900 types and 20 patterns with wildcards of
  // their own; a longer pattern than a name can be never matches.
  static constexpr std::size_t kMaximumTypes = 60000;
  static constexpr std::size_t kMaximumWildcards = 1024;
  static constexpr std::size_t kMaximumPatternLength = 255;

  // Takes the entries of one database, the text of a `globs2` file: lines `weight:type:pattern[:flags]`, with
  // the flag `cs` for patterns that tell capitals from small letters. Databases are added in the order of
  // their precedence. A type whose pattern is `__NOGLOBS__` keeps its patterns from here, and gets none from
  // the databases after this one. Lines that are not of this form are ignored.
  void addDatabase(std::string_view text);

  // The type that the name has, nothing when no pattern fits. Of several patterns the one of the highest
  // weight decides, then the longest, then the earliest. The name is looked for as it is first and, when
  // nothing fits, with ASCII capitals as small letters. No memory is allocated for a name of up to 1 KiB.
  std::optional<TypeNumber> typeOfName(std::string_view name) const;

  // The MIME types that have patterns, in the order in which they were met.
  const std::vector<std::string>& types() const { return types_; }

  // How many patterns there are.
  std::size_t patternCount() const { return patternCount_; }

 private:
  struct Entry;

  // A candidate. The rank orders candidates: a higher one wins, 0 is none.
  struct Choice {
    std::uint64_t rank = 0;
    TypeNumber type = 0;
  };
  // What a pattern means for a name as it is, and for a name whose capitals were made small.
  struct Choices {
    Choice asWritten;
    Choice lowered;
  };
  using ByteSet = std::bitset<256>;
  // A pattern that is matched against a name only when the name's ends and length allow it to fit.
  struct Wildcard {
    Choice choice;
    bool caseSensitive = false;
    ByteSet first;
    ByteSet last;
    std::string literalRun;  // every fitting name holds it
    std::string pattern;
  };
  struct TextHash {
    using is_transparent = void;
    std::size_t operator()(std::string_view text) const { return std::hash<std::string_view>()(text); }
  };
  using ChoiceTable = std::unordered_map<std::string, Choices, TextHash, std::equal_to<>>;
  enum class Spelling { asWritten, lowered };

  static std::optional<Entry> parseLine(std::string_view line);
  static void offer(ChoiceTable& table, std::string_view key, const Choice& choice, bool caseSensitive);
  void add(const Entry& entry, std::uint32_t line);
  void addWildcard(std::string_view pattern, const Choice& choice, bool caseSensitive);
  std::optional<TypeNumber> numberOf(std::string_view type);

  static const Choice* find(const ChoiceTable& table, std::string_view key, Spelling spelling);
  static ByteSet bytesFitting(std::string_view element);
  static bool mayFit(const Wildcard& wildcard, std::string_view name);
  Choice best(std::string_view name, Spelling spelling) const;
  Choice bestSuffix(std::string_view name, Spelling spelling) const;

  std::vector<std::string> types_;
  std::unordered_map<std::string, TypeNumber, TextHash, std::equal_to<>> numbers_;
  std::unordered_set<std::string, TextHash, std::equal_to<>> closedTypes_;
  ChoiceTable names_;  // whole names
  ByteSet firstOfNames_;
  ChoiceTable suffixes_;             // ".ext" of the patterns "*.ext"
  std::vector<Wildcard> wildcards_;  // all others, the highest rank first
  std::size_t longestSuffix_ = 0;
  std::size_t patternCount_ = 0;
  std::uint32_t lineCount_ = 0;
};

}  // namespace norvex
