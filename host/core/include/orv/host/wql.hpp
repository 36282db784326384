// WQL queries: parsed once, evaluated against instances of this broker.
//
// The one query evaluator of the host: indication filters use it for every
// delivered indication, ExecQuery and the providers' select expressions share
// its parser and its matching rules.
//
// Grammar: SELECT * | prop [, prop ...] FROM Class [WHERE condition], where a
// condition combines predicates with AND, OR, NOT and parentheses; a predicate
// is prop op literal (op: = <> != < <= > >= LIKE), literal op prop (not LIKE),
// prop IS [NOT] NULL, or
// prop ISA Class (the property holds an embedded instance of that class or of a
// subclass). Literals: 'text', "text", numbers, TRUE, FALSE. Keywords and names
// ignore case. A predicate on a property that is null or missing is false, and
// so is its negation.
#pragma once

#include <cmpidt.h>
#include <cmpift.h>

#include <memory>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

namespace orv::host {

namespace detail {
struct Query;
}

// A query that does not parse; what() says what was expected where.
class WqlError : public std::invalid_argument {
public:
    using std::invalid_argument::invalid_argument;
};

class WqlQuery {
public:
    // Throws WqlError.
    static WqlQuery parse(std::string_view text);

    const std::string& text() const noexcept { return text_; }
    const std::string& fromClass() const noexcept;
    // The SELECT list; empty for "SELECT *".
    const std::vector<std::string>& selectList() const noexcept;
    // Whether the instance (made through this host's broker) is of the FROM class
    // or one of its subclasses and meets the WHERE clause. Thread-safe.
    bool matches(const CMPIInstance* instance) const;

private:
    WqlQuery(std::string text, std::shared_ptr<const detail::Query> query);

    std::string text_;
    std::shared_ptr<const detail::Query> query_;
};

}  // namespace orv::host
