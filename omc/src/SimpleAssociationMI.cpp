#include <omc/SimpleAssociationMI.h>

#include "AssociationResults.h"

#include <cmpi/CmpiResultInstanceToPathFilter.h>

namespace OMC {

using detail::AssociationFilter;
using detail::FarEndResult;
using detail::ReferenceResult;

SimpleAssociationMI::SimpleAssociationMI(const CmpiBroker& mbp, const CmpiContext& ctx)
    : CmpiBaseMI(mbp, ctx), CmpiAssociationMI(mbp, ctx) {}

CmpiStatus SimpleAssociationMI::associators(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& op,
                                            const char* assocClass, const char* resultClass, const char* role,
                                            const char* resultRole, const char** properties) {
    FarEndResult ends(rslt, AssociationFilter{op, assocClass, role}, resultClass, resultRole,
                      [&](const CmpiObjectPath& end) {
                          try {
                              rslt.returnData(broker->getInstance(ctx, end, properties));
                          } catch (const CmpiStatus& st) {
                              if (st.rc() != CMPI_RC_ERR_NOT_FOUND) throw;
                          }
                      });
    return doReferences(ctx, ends, op, assocClass, resultClass, role, resultRole);
}

CmpiStatus SimpleAssociationMI::associatorNames(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& op,
                                                const char* assocClass, const char* resultClass, const char* role,
                                                const char* resultRole) {
    FarEndResult ends(rslt, AssociationFilter{op, assocClass, role}, resultClass, resultRole,
                      [&](const CmpiObjectPath& end) { rslt.returnData(end); });
    return doReferences(ctx, ends, op, assocClass, resultClass, role, resultRole);
}

CmpiStatus SimpleAssociationMI::references(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& op,
                                           const char* resultClass, const char* role, const char** properties) {
    ReferenceResult refs(rslt, AssociationFilter{op, resultClass, role}, properties);
    return doReferences(ctx, refs, op, resultClass, nullptr, role, nullptr);
}

CmpiStatus SimpleAssociationMI::referenceNames(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& op,
                                               const char* resultClass, const char* role) {
    CmpiResultInstanceToPathFilter names(rslt);
    ReferenceResult refs(names, AssociationFilter{op, resultClass, role}, nullptr);
    return doReferences(ctx, refs, op, resultClass, nullptr, role, nullptr);
}

}  // namespace OMC
