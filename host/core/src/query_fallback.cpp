#include "query_fallback.hpp"

#include <vector>

#include "core.hpp"
#include "names.hpp"
#include "select_exp.hpp"

namespace orv::host::detail {

bool queryLanguageKnown(std::string_view language) {
    return equalsNoCase(language, "WQL") || equalsNoCase(language, "CQL") || equalsNoCase(language, "DMTF:CQL");
}

ParsedQuery parseExecQuery(const char* text, const char* language) {
    ParsedQuery parsed;
    if (language == nullptr || !queryLanguageKnown(language)) {
        parsed.rc = CMPI_RC_ERR_QUERY_LANGUAGE_NOT_SUPPORTED;
        parsed.message = "query language " + std::string(language != nullptr ? language : "(none)") +
                         " is not supported: use WQL or DMTF:CQL";
        return parsed;
    }
    if (text == nullptr) {
        parsed.rc = CMPI_RC_ERR_INVALID_QUERY;
        parsed.message = "no query";
        return parsed;
    }
    parsed.query = parseQuery(text, &parsed.message);
    parsed.rc = parsed.query ? CMPI_RC_OK : CMPI_RC_ERR_INVALID_QUERY;
    return parsed;
}

bool admitForQuery(const Query& query, CMPIInstance* instance) {
    if (!queryMatches(query, instance)) {
        return false;
    }
    if (!query.projection.empty()) {
        // The SELECT list works as a property filter: it keeps the keys too.
        std::vector<const char*> names;
        for (const std::string& name : query.projection) {
            names.push_back(name.c_str());
        }
        names.push_back(nullptr);
        instance->ft->setPropertyFilter(instance, names.data(), nullptr);
    }
    return true;
}

Outcome CoreServices::checkQueryClass(std::string_view ns, const Query& query) const {
    if (!repository_.hasNamespace(ns)) {
        return Outcome{CMPI_RC_ERR_INVALID_NAMESPACE, "namespace " + std::string(ns) + " not found", 0};
    }
    const repository::ClassDecl* cls = repository_.getClass(ns, query.fromClass);
    if (cls == nullptr) {
        return Outcome{CMPI_RC_ERR_INVALID_QUERY, "class " + query.fromClass + " not found in " + std::string(ns), 0};
    }
    for (const std::string& property : query.projection) {
        if (cls->findProperty(property) == nullptr) {
            return Outcome{CMPI_RC_ERR_INVALID_QUERY, "class " + cls->name + " has no property " + property, 0};
        }
    }
    return Outcome{};
}

}  // namespace orv::host::detail
