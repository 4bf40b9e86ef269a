// What a query looks for: tests of attributes, joined by and, or, not.
//
// The language, as people write it:
//
//   predicate  = all { ("||" | OR) all }                 words in any case
//   all        = one { ("&&" | AND) one }
//   one        = ("!" | NOT) one | "(" predicate ")" | test
//   test       = attribute ("==" | "=" | "!=") (value | "*") | attribute ("<" | "<=" | ">" | ">=") value
//              | "InRange" "(" attribute "," value "," value ")"
//   value      = text | number
//   text       = "'" ... "'" or '"' ... '"', with modifiers behind it: c ignores case, d diacritics
//   number     = optional sign, digits, optional fraction and exponent
//   attribute  = letters, digits, "_", ".", ":", "-" and bytes above 0x7F, not beginning with a digit or
//   "-.:"
//
// In a text "*" stands for any bytes, and a backslash takes its meaning from the byte that follows. Only ==
// and
// != take wildcards. A predicate's texts need not be UTF-8.
//
// The meaning:
//
// - An item has any number of values of an attribute. A test holds when at least one of them fulfils it; an
//   attribute without values fulfils none. InRange wants one value that lies between the bounds, both
//   included.
// - `!=` is the negation of `==`: it holds when no value is equal, so also where the attribute has no value.
//   `== *` holds when there is a value, `!= *` when there is none.
// - Numbers compare by their values, texts by their bytes, or the bytes of their folded forms where a
// modifier
//   says so (see TextFolding.h).
// - A number and a text compare as numbers when the text is one - `2024` finds the name "2024", `'7'` finds
// the
//   value 7 - and fulfil nothing otherwise. A text with a wildcard never matches a number.
//
// Any thread. A plain value; copies are independent.
#pragma once

#include <string>
#include <variant>
#include <vector>

#include "index/NumberText.h"
#include "index/TextMatch.h"

namespace norvex {

// What `*` outside of quotes stands for. Goes with PredicateOperator::Equal only.
struct AnyValue {};

enum class PredicateOperator { Equal, Less, LessOrEqual, Greater, GreaterOrEqual };

using PredicateLiteral = std::variant<AnyValue, PlainNumber, TextPattern>;

struct PredicateCondition {
  PredicateOperator comparison = PredicateOperator::Equal;
  PredicateLiteral literal;
};

// Holds when one value of the attribute fulfils every condition.
struct AttributeTest {
  std::string attribute;
  std::vector<PredicateCondition> conditions;
};

struct Predicate;

struct Connective {
  enum class Kind { All, Any, Not };
  Kind kind = Kind::All;
  std::vector<Predicate> operands;  // one for Not, else two or more
};

struct Predicate {
  std::variant<AttributeTest, Connective> term;
};

}  // namespace norvex
