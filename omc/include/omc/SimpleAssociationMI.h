// OMC::SimpleAssociationMI: an association provider that supplies only
// doReferences; the four association operations are derived from it.
//
// doReferences delivers, through the result it is given, every association
// instance that refers to the source path, and signals the end of its answer
// as any operation does. The derived operations read what it delivers:
//
// - the source end of an association instance is the reference property
//   whose value equals the source path; when a role is given, the property
//   named role (ignoring case) must be a reference equal to the source path,
//   or the instance is passed over;
// - associators / associatorNames: the far ends are the property named
//   resultRole when one is given, otherwise every reference property other
//   than the source end; a far end must be of resultClass (or a subclass) when
//   one is given. associators fetch each far end's instance through the broker
//   with the requested property list (an end the broker cannot find is
//   skipped); associatorNames deliver the far ends' paths;
// - references / referenceNames: the request's result class names the
//   association class (doReferences receives it as assocClass and no result
//   class or result role); references deliver each instance restricted to the
//   requested property list (its references are kept); referenceNames
//   deliver each instance's object path;
// - an assocClass given to associators / associatorNames, or a resultClass to
//   references / referenceNames, passes over instances not of that class.
// Class tests ask the broker's class hierarchy; where the broker cannot tell,
// the class names are compared ignoring case.
#ifndef ORV_OMC_SIMPLEASSOCIATIONMI_H
#define ORV_OMC_SIMPLEASSOCIATIONMI_H

#include <cmpi/CmpiAssociationMI.h>

namespace OMC {

class SimpleAssociationMI : public CmpiAssociationMI {
public:
    SimpleAssociationMI(const CmpiBroker& mbp, const CmpiContext& ctx);

    virtual CmpiStatus doReferences(const CmpiContext& ctx, CmpiResult& result, const CmpiObjectPath& path,
                                    const char* assocClass, const char* resultClass, const char* role,
                                    const char* resultRole) = 0;

    CmpiStatus associators(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& op,
                           const char* assocClass, const char* resultClass, const char* role,
                           const char* resultRole, const char** properties) override;
    CmpiStatus associatorNames(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& op,
                               const char* assocClass, const char* resultClass, const char* role,
                               const char* resultRole) override;
    CmpiStatus references(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& op,
                          const char* resultClass, const char* role, const char** properties) override;
    CmpiStatus referenceNames(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& op,
                              const char* resultClass, const char* role) override;
};

}  // namespace OMC

#endif
