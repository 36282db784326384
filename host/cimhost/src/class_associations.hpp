// Association requests whose ObjectName is a class: answered from the class
// repository with classes, not instances. An association class relates the source
// class through a reference property whose class the source is (or derives from);
// its other reference properties lead to the far classes.
#pragma once

#include <optional>
#include <string>
#include <vector>

#include "orv/repository/class_repository.hpp"

namespace orv::cimhost::detail {

// The class filters and role filters of an association request; nullopt means "any".
struct AssociationFilters {
    std::optional<std::string> assocClass;
    std::optional<std::string> resultClass;
    std::optional<std::string> role;
    std::optional<std::string> resultRole;
};

// Associators / AssociatorNames: the far classes, each once, in schema order.
// assocClass filters the association classes, role the source's reference,
// resultRole the far reference and resultClass the far class.
std::vector<std::string> associatedClasses(const repository::ClassRepository& classes, const std::string& nameSpace,
                                           const std::string& source, const AssociationFilters& filters);
// References / ReferenceNames: the association classes that refer to the source,
// filtered by resultClass (the association class) and role.
std::vector<std::string> referencingClasses(const repository::ClassRepository& classes, const std::string& nameSpace,
                                            const std::string& source, const AssociationFilters& filters);

}  // namespace orv::cimhost::detail
