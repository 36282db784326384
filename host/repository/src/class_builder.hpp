// Builds a class declaration from its parsed form: applies the declared types
// to values and qualifiers and merges in what the superclass passes down.
#pragma once

#include <string>
#include <vector>

#include "mof_syntax.hpp"
#include "namespace_state.hpp"
#include "orv/repository/class_decl.hpp"
#include "orv/repository/qualifier.hpp"

namespace orv::repository::mof {

// Throws MofError for an unknown superclass or referenced class, a duplicate
// class or property, an unknown qualifier (when the namespace declares
// qualifiers), a value that does not fit its type, or an Override naming nothing.
// Appends to `warnings` ("file:line: message") what is accepted but breaks a
// schema rule: a property declared again with another type than the one it inherits.
ClassDecl buildClass(const ClassSyntax& syntax, const NamespaceState& ns, const std::string& file,
                     std::vector<std::string>& warnings);

QualifierDeclaration buildQualifierDeclaration(const QualifierDeclSyntax& syntax,
                                               const std::string& file);

}  // namespace orv::repository::mof
