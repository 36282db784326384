// Reading the ends of an association instance relative to a source path.
#ifndef ORV_OMC_SRC_ASSOCIATIONENDS_H
#define ORV_OMC_SRC_ASSOCIATIONENDS_H

#include <cmpi/CmpiInstance.h>
#include <cmpi/CmpiObjectPath.h>

#include <vector>

namespace OMC::detail {

// Whether a name or class argument is absent (null or empty).
bool absent(const char* text);

// Whether path's class is className or a subclass; without the broker's
// answer, whether the class names match ignoring case. True when className
// is absent.
bool pathIsOfClass(const CmpiObjectPath& path, const char* className);

// Whether the instance's class is className or a subclass (true when
// className is absent or the instance's path cannot be built).
bool instanceIsOfClass(const CmpiInstance& inst, const char* className);

struct Reference {
    CmpiString name;
    CmpiObjectPath path;
};

// The non-null reference properties of the instance, in property order.
std::vector<Reference> referencesOf(const CmpiInstance& inst);

// Whether the instance has the source at role: true when role is absent,
// otherwise whether the property named role is a reference equal to source.
bool sourceAtRole(const std::vector<Reference>& refs, const CmpiObjectPath& source, const char* role);

// The far ends: the reference named resultRole when given (unless it is the
// source itself), otherwise every reference other than the one named role
// and those equal to the source.
std::vector<CmpiObjectPath> farEnds(const std::vector<Reference>& refs, const CmpiObjectPath& source,
                                    const char* role, const char* resultRole);

}  // namespace OMC::detail

#endif
