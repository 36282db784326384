// ExecQuery for instance providers that refuse execQuery (the binding's default
// answers CMPI_RC_ERR_NOT_SUPPORTED): the host asks the provider to enumerate the
// class instead and keeps, of what it returns, the instances the query selects,
// each with only the properties of the SELECT list (and its keys), as sfcb does.
#pragma once

#include <cmpidt.h>

#include <optional>
#include <string>
#include <string_view>

#include "query.hpp"

namespace orv::host::detail {

// Whether the host reads queries of this language: WQL, and CQL ("CQL",
// "DMTF:CQL") for the part of it that WQL covers; any case.
bool queryLanguageKnown(std::string_view language);

// The query of an ExecQuery request parsed, or the status that refuses it:
// CMPI_RC_ERR_QUERY_LANGUAGE_NOT_SUPPORTED for another language,
// CMPI_RC_ERR_INVALID_QUERY (with the parser's message) for a query that does not parse.
struct ParsedQuery {
    std::optional<Query> query;
    CMPIrc rc = CMPI_RC_OK;
    std::string message;
};
ParsedQuery parseExecQuery(const char* text, const char* language);

// Called for each instance returned to a result collecting for `query`: false when
// the query does not select it; else its properties are cut down to the SELECT list
// and its keys, and true.
bool admitForQuery(const Query& query, CMPIInstance* instance);

}  // namespace orv::host::detail
