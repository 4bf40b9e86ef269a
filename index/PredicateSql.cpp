#include "index/PredicateSql.h"

#include <algorithm>
#include <array>
#include <string_view>
#include <utility>

#include "index/ValueComparison.h"

namespace norvex {
namespace {

// What a column's values are, which decides what may be left to SQLite's own operators.
enum class Holds { Numbers, Text, TextOrBlob, Anything };

// Where the store has an attribute's values: as an expression on the item, or in rows of another table which
// name the items. The condition on the expression stands between `before` and `after`.
struct Source {
  std::string_view attribute;
  std::string_view expression;
  Holds holds;
  std::string_view before;
  std::string_view after;
};

constexpr std::array kBuiltIn{
    Source{"kMDItemFSName", "i.name", Holds::TextOrBlob, "", ""},
    Source{"kMDItemPath", "path_of(i.id)", Holds::TextOrBlob, "", ""},
    Source{"kMDItemFSSize", "i.size", Holds::Numbers, "", ""},
    Source{"kMDItemFSContentChangeDate", "(i.mtime / 1e9)", Holds::Numbers, "", ""},
    Source{"kMDItemContentType", "identifier", Holds::Text, "i.type IN (SELECT id FROM types WHERE ", ")"},
    Source{"kMDItemKind", "kind", Holds::Text, "i.type IN (SELECT id FROM types WHERE ", ")"},
    Source{"kMDItemContentTypeTree", "ancestor", Holds::Text, "i.type IN (SELECT type FROM type_tree WHERE ",
           ")"},
};

// For every other attribute; takes its name.
constexpr Source kSparse{
    "", "value", Holds::Anything,
    "i.id IN (SELECT item FROM attributes WHERE name = (SELECT id FROM attribute_names WHERE name = ?) AND "
    "item >= ?1 AND item <= ?2 AND ",
    ")"};

constexpr std::string_view spelling(PredicateOperator comparison) {
  switch (comparison) {
    case PredicateOperator::Equal:
      return "=";
    case PredicateOperator::Less:
      return "<";
    case PredicateOperator::LessOrEqual:
      return "<=";
    case PredicateOperator::Greater:
      return ">";
    case PredicateOperator::GreaterOrEqual:
      return ">=";
  }
  return "=";
}

std::size_t depthOf(const Predicate& predicate) {
  const auto* const connective = std::get_if<Connective>(&predicate.term);
  if (connective == nullptr) return 0;
  std::size_t deepest = 0;
  for (const Predicate& operand : connective->operands) deepest = std::max(deepest, depthOf(operand));
  return deepest + 1;
}

class Writer {
 public:
  PredicateSql take() { return std::move(sql_); }

  void add(const Predicate& predicate) {
    std::visit([&](const auto& term) { addTerm(term); }, predicate.term);
  }

 private:
  void addTerm(const Connective& connective) {
    // An attribute without a value makes its test NULL. Within AND and OR, and for WHERE, that is as good as
    // false; a plain NOT would leave it NULL.
    if (connective.kind == Connective::Kind::Not) {
      text("(");
      add(connective.operands.front());
      text(") IS NOT TRUE");
      return;
    }
    addChain(connective);
  }

  // The deepest operand comes first: then SQLite has only the parentheses in front of it open while it reads,
  // and not also the beginning of every chain around it.
  void addChain(const Connective& connective) {
    std::vector<std::pair<std::size_t, const Predicate*>> operands;
    for (const Predicate& operand : connective.operands) operands.emplace_back(depthOf(operand), &operand);
    std::ranges::stable_sort(operands, std::ranges::greater{}, [](const auto& each) { return each.first; });
    text("(");
    for (const auto& [depth, operand] : operands) {
      if (operand != operands.front().second)
        text(connective.kind == Connective::Kind::All ? " AND " : " OR ");
      add(*operand);
    }
    text(")");
  }

  void addTerm(const AttributeTest& test) {
    const auto* const found = std::ranges::find(kBuiltIn, test.attribute, &Source::attribute);
    const Source& source = found == kBuiltIn.end() ? kSparse : *found;
    text(source.before);
    if (&source == &kSparse) sql_.values.emplace_back(SqlText{test.attribute});
    text("(");
    for (const PredicateCondition& condition : test.conditions) {
      if (&condition != &test.conditions.front()) text(" AND ");
      addCondition(source, condition);
    }
    text(")");
    text(source.after);
  }

  void addCondition(const Source& source, const PredicateCondition& condition) {
    if (std::holds_alternative<AnyValue>(condition.literal)) {
      text(source.expression);
      text(" IS NOT NULL");
    } else if (source.holds == Holds::Numbers) {
      addOnNumbers(source.expression, condition);
    } else if (const auto* const number = std::get_if<PlainNumber>(&condition.literal)) {
      addNumber(source, condition, *number);
    } else {
      addText(source, condition, std::get<TextPattern>(condition.literal));
    }
  }

  void addOnNumbers(std::string_view expression, const PredicateCondition& condition) {
    const auto number = numberOfLiteral(condition.literal);
    if (!number) return text("0");
    compare(expression, condition.comparison, valueOf(*number));
  }

  void addNumber(const Source& source, const PredicateCondition& condition, PlainNumber number) {
    if (source.holds != Holds::Anything) return callFunction(source, condition, valueOf(number), {});
    // SQLite orders texts behind all numbers; only equality needs no look at what the value is.
    if (condition.comparison != PredicateOperator::Equal) {
      text("typeof(");
      text(source.expression);
      text(") IN ('integer', 'real') AND ");
    }
    compare(source.expression, condition.comparison, valueOf(number));
  }

  void addText(const Source& source, const PredicateCondition& condition, const TextPattern& pattern) {
    if (condition.comparison != PredicateOperator::Equal || !pattern.isPlain()) {
      return callFunction(source, condition, SqlBlob{sourceOfPattern(pattern)}, pattern.folding);
    }
    const std::string& bytes = pattern.pieces.front();
    if (source.holds == Holds::Text) return compare(source.expression, condition.comparison, SqlText{bytes});
    text(source.expression);
    text(" IN (");
    parameter(SqlText{bytes});
    text(", ");
    parameter(SqlBlob{bytes});
    if (const auto number = numberFromText(bytes); number && source.holds == Holds::Anything) {
      text(", ");
      parameter(valueOf(*number));
    }
    text(")");
  }

  void compare(std::string_view expression, PredicateOperator comparison, SqlValue value) {
    text(expression);
    text(" ");
    text(spelling(comparison));
    text(" ");
    parameter(std::move(value));
  }

  void callFunction(const Source& source, const PredicateCondition& condition, SqlValue literal,
                    TextFolding folding) {
    text("predicate_compare(");
    text(source.expression);
    text(", '");
    text(spelling(condition.comparison));
    text("', ");
    parameter(std::move(literal));
    text(folding.ignoresCase ? ", 1" : ", 0");
    text(folding.ignoresDiacritics ? ", 1)" : ", 0)");
  }

  static SqlValue valueOf(PlainNumber number) {
    return std::visit([](auto plain) { return SqlValue(plain); }, number);
  }

  void text(std::string_view part) { sql_.where += part; }

  void parameter(SqlValue value) {
    text("?");
    sql_.values.push_back(std::move(value));
  }

  PredicateSql sql_;
};

}  // namespace

PredicateSql compilePredicate(const Predicate& predicate) {
  Writer writer;
  writer.add(predicate);
  return writer.take();
}

// Two comparisons and no BETWEEN, which SQLite does not hand down to the indexes within an OR.
std::string queryOf(const PredicateSql& sql) {
  return "SELECT i.id FROM items AS i WHERE i.id >= ?1 AND i.id <= ?2 AND (" + sql.where + ")";
}

}  // namespace norvex
