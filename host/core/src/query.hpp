// A small WQL/CQL reader for select expressions:
//   SELECT * | prop [, prop ...] FROM Class [WHERE condition]
// where a condition combines predicates with AND, OR, NOT and parentheses, and
// pred = prop op literal | literal op prop | prop IS [NOT] NULL | prop ISA Class,
// with op one of = <> != < <= > >= LIKE (LIKE with the property first). NOT binds tightest, then AND, then OR. The condition
// is kept in disjunctive normal form (a list of AND-groups) with every NOT pushed
// into its predicate (= becomes <>, < becomes >=, ISA becomes NOT ISA, ...); a
// condition whose normal form has more than 256 groups is refused.
#pragma once

#include <cmpidt.h>

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace orv::host::detail {

struct Predicate {
    std::string lhs;  // property name
    std::string rhs;  // literal text without quotes ("" for IS [NOT] NULL)
    CMPIPredOp op = CMPI_PredOp_Equals;
    CMPIType type = CMPI_charString;  // CMPI_charString, CMPI_numericString, CMPI_booleanString
};

using Conjunction = std::vector<Predicate>;

struct Query {
    std::string fromClass;
    std::vector<std::string> projection;  // empty: "*"
    std::vector<Conjunction> where;       // empty: no WHERE clause
};

// The parsed query, or empty with `error` set.
std::optional<Query> parseQuery(std::string_view text, std::string* error);

// Whether one predicate holds for a value given in text form (isNull: no value).
// Not for ISA / NOT ISA, which need the class of an embedded instance.
bool predicateHolds(const Predicate& predicate, const std::string& value, bool isNull);

}  // namespace orv::host::detail
