// What encapsulated objects need to know about classes: property names and
// key lists for instances and CMPIInstance.getObjectPath and qualifiers for the object path's qualifier
// getters. The broker core implements it over the class repository; objects
// made for a provider remember the source of the broker that made them.
#pragma once

#include <cmpidt.h>

#include <string>
#include <string_view>
#include <vector>

namespace orv::host::detail {

class NameTable;

class ClassSource {
public:
    virtual ~ClassSource() = default;
    // The property names of the class (its keys among them), or nullptr when
    // the class is unknown. The table stays valid as long as the source.
    virtual const NameTable* nameTable(std::string_view ns, std::string_view className) const = 0;
    // A qualifier of the class (element empty), of a property or method
    // (element = its name) or of a parameter (element = "method.parameter").
    // Answers rc CMPI_RC_ERR_NOT_FOUND / CMPI_RC_ERR_INVALID_CLASS when missing.
    virtual CMPIData qualifier(std::string_view ns, std::string_view className, char elementKind,
                               std::string_view element, std::string_view qualifierName,
                               CMPIrc* rc) const = 0;
    virtual bool isA(std::string_view ns, std::string_view className,
                     std::string_view ancestor) const = 0;
};

}  // namespace orv::host::detail
