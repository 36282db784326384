#include "AssociationResults.h"

#include "AssociationEnds.h"

#include <utility>

namespace OMC::detail {

namespace {

bool accepted(const CmpiInstance& inst, const std::vector<Reference>& refs, const AssociationFilter& filter) {
    return sourceAtRole(refs, filter.source, filter.role) && instanceIsOfClass(inst, filter.assocClass);
}

// The names of the references, null-terminated, kept through a property filter.
std::vector<const char*> namesOf(const std::vector<Reference>& refs) {
    std::vector<const char*> names;
    for (const Reference& ref : refs) names.push_back(ref.name.charPtr());
    names.push_back(nullptr);
    return names;
}

}  // namespace

FarEndResult::FarEndResult(CmpiResult& target, const AssociationFilter& filter, const char* resultClass,
                           const char* resultRole, Handler handler)
    : target_(target), filter_(filter), resultClass_(resultClass), resultRole_(resultRole),
      handler_(std::move(handler)) {}

void FarEndResult::returnData(const CmpiInstance& inst) {
    const std::vector<Reference> refs = referencesOf(inst);
    if (!accepted(inst, refs, filter_)) return;
    for (const CmpiObjectPath& end : farEnds(refs, filter_.source, filter_.role, resultRole_)) {
        if (pathIsOfClass(end, resultClass_)) handler_(end);
    }
}

ReferenceResult::ReferenceResult(CmpiResult& target, const AssociationFilter& filter, const char** properties)
    : target_(target), filter_(filter), properties_(properties) {}

void ReferenceResult::returnData(const CmpiInstance& inst) {
    const std::vector<Reference> refs = referencesOf(inst);
    if (!accepted(inst, refs, filter_)) return;
    if (properties_ != nullptr) {
        std::vector<const char*> keep = namesOf(refs);
        CmpiInstance filtered(inst);
        filtered.setPropertyFilter(properties_, keep.data());
    }
    target_.returnData(inst);
}

}  // namespace OMC::detail
