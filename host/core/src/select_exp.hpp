// CMPISelectExp and its condition objects (CMPISelectCond, CMPISubCond,
// CMPIPredicate) over a parsed query.
#pragma once

#include <string>

#include "object.hpp"
#include "query.hpp"

namespace orv::host::detail {

extern const CMPISelectExpFT kSelectExpFT;
extern const CMPISelectCondFT kSelectCondFT;
extern const CMPISubCondFT kSubCondFT;
extern const CMPIPredicateFT kPredicateFT;

struct SelectExpImpl {
    std::string text;
    std::string language;
    Query query;
};

// A select expression for `text` in `language` ("WQL" or "CQL", any case);
// rc CMPI_RC_ERR_QUERY_LANGUAGE_NOT_SUPPORTED or CMPI_RC_ERR_INVALID_QUERY
// (with the parser's message) on failure.
CMPISelectExp* newSelectExp(const char* text, const char* language, Owner owner, CMPIStatus* rc);
CMPISelectExp* cloneSelectExp(const CMPISelectExp* exp, Owner owner);
SelectExpImpl* selectExpImpl(const CMPISelectExp* exp) noexcept;
// Whether the instance is of the FROM class (or a subclass) and meets the WHERE clause.
bool selectExpMatches(const SelectExpImpl& exp, const CMPIInstance* instance);
// The same for a parsed query: FROM class with inheritance, then the WHERE clause
// ("prop ISA Class" tests the class of an embedded instance).
bool queryMatches(const Query& query, const CMPIInstance* instance);

// Condition objects (select_cond.cpp).
struct SelectCondImpl {
    std::vector<Conjunction> groups;
    int type = CMPI_COND_DOC;
};
CMPISelectCond* newSelectCond(SelectCondImpl cond, Owner owner);
CMPISubCond* newSubCond(Conjunction predicates, Owner owner);
CMPIPredicate* newPredicate(Predicate predicate, Owner owner);

}  // namespace orv::host::detail
