#include "AssociationEnds.h"

#include <cmpi/CmpiStatus.h>

namespace OMC::detail {

bool absent(const char* text) { return text == nullptr || text[0] == '\0'; }

bool pathIsOfClass(const CmpiObjectPath& path, const char* className) {
    if (absent(className)) return true;
    try {
        return path.classPathIsA(className) != 0;
    } catch (const CmpiStatus&) {
        return path.getClassName().equalsIgnoreCase(className) != 0;
    }
}

bool instanceIsOfClass(const CmpiInstance& inst, const char* className) {
    if (absent(className)) return true;
    CmpiObjectPath path;
    try {
        path = inst.getObjectPath();
    } catch (const CmpiStatus&) {
        return true;
    }
    return pathIsOfClass(path, className);
}

std::vector<Reference> referencesOf(const CmpiInstance& inst) {
    std::vector<Reference> refs;
    const unsigned int count = inst.getPropertyCount();
    for (unsigned int i = 0; i < count; ++i) {
        Reference ref;
        CmpiData value = inst.getProperty(static_cast<int>(i), &ref.name);
        if (value.getType() == CMPI_ref && !value.isNullValue()) {
            ref.path = value;
            refs.push_back(ref);
        }
    }
    return refs;
}

namespace {

const Reference* named(const std::vector<Reference>& refs, const char* name) {
    for (const Reference& ref : refs) {
        if (ref.name.equalsIgnoreCase(name)) return &ref;
    }
    return nullptr;
}

}  // namespace

bool sourceAtRole(const std::vector<Reference>& refs, const CmpiObjectPath& source, const char* role) {
    if (absent(role)) return true;
    const Reference* atRole = named(refs, role);
    return atRole != nullptr && atRole->path == source;
}

std::vector<CmpiObjectPath> farEnds(const std::vector<Reference>& refs, const CmpiObjectPath& source,
                                    const char* role, const char* resultRole) {
    std::vector<CmpiObjectPath> ends;
    if (!absent(resultRole)) {
        const Reference* atResultRole = named(refs, resultRole);
        if (atResultRole != nullptr && !(atResultRole->path == source)) ends.push_back(atResultRole->path);
        return ends;
    }
    for (const Reference& ref : refs) {
        const bool isRole = !absent(role) && ref.name.equalsIgnoreCase(role);
        if (!isRole && !(ref.path == source)) ends.push_back(ref.path);
    }
    return ends;
}

}  // namespace OMC::detail
