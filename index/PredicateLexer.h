// Cuts the text of a predicate into its tokens.
//
// Used by the parser. Any thread.
#pragma once

#include <cstddef>
#include <string_view>

#include "index/Predicate.h"

namespace norvex {

struct PredicateToken {
  enum class Kind {
    End,
    Attribute,
    Value,     // a text or a number: `literal`
    Anything,  // * outside of quotes; `literal` is AnyValue
    Operator,  // `comparison` and `isNegated`
    And,
    Or,
    Not,
    Open,
    Close,
    Comma,
    Unknown,  // nothing of the language
    Broken    // begins as a text or a number, but `expected` is missing at `offset`
  };
  Kind kind = Kind::End;
  std::size_t offset = 0;   // where it begins, in bytes
  std::string_view source;  // its bytes
  PredicateLiteral literal;
  PredicateOperator comparison = PredicateOperator::Equal;
  bool isNegated = false;
  std::string_view expected;
};

class PredicateLexer {
 public:
  // `source` outlives the lexer and its tokens.
  explicit PredicateLexer(std::string_view source) : source_(source) {}

  // The next token; End again and again once the text is used up.
  PredicateToken next();

 private:
  PredicateToken text();
  PredicateToken number();
  PredicateToken word();
  PredicateToken symbol();
  PredicateToken take(PredicateToken::Kind kind, std::size_t length);
  PredicateToken broken(std::size_t offset, std::string_view expected) const;

  std::string_view source_;
  std::size_t position_ = 0;
};

// Whether two words are the same but for the case of their ASCII letters.
bool isSameWord(std::string_view left, std::string_view right);

}  // namespace norvex
