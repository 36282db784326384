#include "class_associations.hpp"

#include <strings.h>

#include <algorithm>

namespace orv::cimhost::detail {

namespace {

using repository::ClassRepository;
using repository::PropertyDecl;

bool sameName(const std::string& left, const std::string& right) {
    return strcasecmp(left.c_str(), right.c_str()) == 0;
}

bool roleMatches(const std::optional<std::string>& role, const PropertyDecl& end) {
    return !role || sameName(*role, end.name);
}

bool classMatches(const ClassRepository& classes, const std::string& nameSpace,
                  const std::optional<std::string>& filter, const std::string& className) {
    return !filter || classes.isA(nameSpace, className, *filter);
}

// Walks every association class of the namespace that passes `associationFilter`,
// calling visit(associationClass, sourceEnd, otherEnds) once per reference property
// through which `source` takes part.
template <typename Visit>
void forEachSourceEnd(const ClassRepository& classes, const std::string& nameSpace, const std::string& source,
                      const std::optional<std::string>& associationFilter, const std::optional<std::string>& role,
                      Visit visit) {
    for (const std::string& association : classes.classNames(nameSpace, "", true)) {
        if (!classes.isAssociation(nameSpace, association) ||
            !classMatches(classes, nameSpace, associationFilter, association)) {
            continue;
        }
        const std::vector<const PropertyDecl*> ends = classes.referenceProperties(nameSpace, association);
        for (const PropertyDecl* end : ends) {
            if (roleMatches(role, *end) && classes.isA(nameSpace, source, end->type.referenceClass)) {
                visit(association, *end, ends);
            }
        }
    }
}

void addOnce(std::vector<std::string>& names, const std::string& name) {
    if (std::none_of(names.begin(), names.end(), [&name](const std::string& known) { return sameName(known, name); })) {
        names.push_back(name);
    }
}

// The declared spelling of a class named in a reference property.
std::string declaredName(const ClassRepository& classes, const std::string& nameSpace, const std::string& name) {
    const repository::ClassDecl* cls = classes.getClass(nameSpace, name);
    return cls != nullptr ? cls->name : name;
}

}  // namespace

std::vector<std::string> associatedClasses(const ClassRepository& classes, const std::string& nameSpace,
                                           const std::string& source, const AssociationFilters& filters) {
    std::vector<std::string> names;
    forEachSourceEnd(classes, nameSpace, source, filters.assocClass, filters.role,
                     [&](const std::string&, const PropertyDecl& sourceEnd,
                         const std::vector<const PropertyDecl*>& ends) {
                         for (const PropertyDecl* far : ends) {
                             const std::string& farClass = far->type.referenceClass;
                             if (far != &sourceEnd && roleMatches(filters.resultRole, *far) &&
                                 classMatches(classes, nameSpace, filters.resultClass, farClass)) {
                                 addOnce(names, declaredName(classes, nameSpace, farClass));
                             }
                         }
                     });
    return names;
}

std::vector<std::string> referencingClasses(const ClassRepository& classes, const std::string& nameSpace,
                                            const std::string& source, const AssociationFilters& filters) {
    std::vector<std::string> names;
    forEachSourceEnd(classes, nameSpace, source, filters.resultClass, filters.role,
                     [&](const std::string& association, const PropertyDecl&, const std::vector<const PropertyDecl*>&) {
                         addOnce(names, association);
                     });
    return names;
}

}  // namespace orv::cimhost::detail
