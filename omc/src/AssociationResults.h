// The results SimpleAssociationMI hands to doReferences: each reads the
// association instances delivered and passes on what its operation answers.
// Paths and plain values delivered by doReferences are not association
// instances and are passed over; the end of the answer passes through.
#ifndef ORV_OMC_SRC_ASSOCIATIONRESULTS_H
#define ORV_OMC_SRC_ASSOCIATIONRESULTS_H

#include <cmpi/CmpiResult.h>

#include <functional>

namespace OMC::detail {

// What selects the association instances of a request.
struct AssociationFilter {
    const CmpiObjectPath& source;
    const char* assocClass;
    const char* role;
};

// Passes each far end of the accepted instances to a handler.
class FarEndResult : public CmpiResult {
public:
    using Handler = std::function<void(const CmpiObjectPath&)>;
    FarEndResult(CmpiResult& target, const AssociationFilter& filter, const char* resultClass,
                 const char* resultRole, Handler handler);

    void returnData(const CmpiData&) override {}
    void returnData(const CmpiObjectPath&) override {}
    void returnData(const CmpiInstance& inst) override;
    void returnDone() override { target_.returnDone(); }

private:
    CmpiResult& target_;
    AssociationFilter filter_;
    const char* resultClass_;
    const char* resultRole_;
    Handler handler_;
};

// Passes on each accepted instance, restricted to the property list when
// one is given.
class ReferenceResult : public CmpiResult {
public:
    ReferenceResult(CmpiResult& target, const AssociationFilter& filter, const char** properties);

    void returnData(const CmpiData&) override {}
    void returnData(const CmpiObjectPath&) override {}
    void returnData(const CmpiInstance& inst) override;
    void returnDone() override { target_.returnDone(); }

private:
    CmpiResult& target_;
    AssociationFilter filter_;
    const char** properties_;
};

}  // namespace OMC::detail

#endif
