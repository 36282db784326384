// The factory pattern: per provider name one CmpiProviderBase
// (CMProviderBase) and one exported factory per interface kind
// (CMInstanceMIFactory, CMAssociationMIFactory, CMIndicationMIFactory,
// CMMethodMIFactory). Each factory owns a static function table (both version
// fields CMPICurrentVersion, the name the kind word followed by the provider
// name, the cleanup dispatcher then the kind's dispatchers in table order)
// and a static MI record, and on every call:
//   1. wraps the context;
//   2. points the MI record at the function table;
//   3. asks the provider base for its provider object;
//   4. if there is none, builds one with the broker and context, gives it the
//      provider base, calls initialize once (its status is not examined) and
//      stores it; a throwing constructor frees the memory and the exception
//      passes on to the caller;
//   5. instance factories only: writes "--- _Create_InstanceMI() %s\n" to
//      standard error, filled with the type name of CmpiBaseMI*;
//   6. stores the provider object as the record's handle;
//   7. counts one use;
//   8. returns the record. The status argument is left as the broker set it.
//
// Usage, in the provider's source file:
//   CMProviderBase(MyProvider);
//   CMInstanceMIFactory(MyProviderClass, MyProvider);
#ifndef ORV_CMPI_CMPIFACTORY_H
#define ORV_CMPI_CMPIFACTORY_H

#include <cmpi/CmpiBaseMI.h>
#include <cmpi/CmpiBroker.h>
#include <cmpi/CmpiContext.h>
#include <cmpi/CmpiProviderBase.h>

#include <cmpift.h>

#include <memory>

namespace CmpiFactory {

enum class TraceLine { None, Instance };

// Writes the instance factories' trace line to standard error.
void writeInstanceTrace();

template <class Provider, class Record, class Table>
Record* createMI(Record& mi, Table* ft, CmpiProviderBase& base, const CMPIBroker* mb,
                 const CMPIContext* ctxp, TraceLine trace) {
    CmpiContext ctx(ctxp);
    mi.ft = ft;
    CmpiBaseMI* provider = base.getBaseMI();
    if (provider == nullptr) {
        CmpiBroker broker(mb);
        std::unique_ptr<CmpiBaseMI> created(new Provider(broker, ctx));
        created->setProviderBase(&base);
        (void)created->initialize(ctx);
        provider = created.release();
        base.setBaseMI(provider);
    }
    if (trace == TraceLine::Instance) {
        writeInstanceTrace();
    }
    mi.hdl = provider;
    base.incUseCount();
    return &mi;
}

}  // namespace CmpiFactory

#define CMProviderBase(pn) CmpiProviderBase base##pn

#define CMInstanceMIFactory(cn, pn)                                                          \
    CMPI_EXTERN_C CMPIInstanceMI* pn##_Create_InstanceMI(const CMPIBroker* broker,            \
                                                         const CMPIContext* ctxp,             \
                                                         CMPIStatus* rc) {                    \
        static CMPIInstanceMIFT instMIFT = {                                                 \
            CMPICurrentVersion,                                                              \
            CMPICurrentVersion,                                                              \
            "instance" #pn,                                                                  \
            CmpiBaseMI::driveBaseCleanup<CMPIInstanceMI>,                                    \
            CmpiInstanceMI::driveEnumInstanceNames,                                          \
            CmpiInstanceMI::driveEnumInstances,                                              \
            CmpiInstanceMI::driveGetInstance,                                                \
            CmpiInstanceMI::driveCreateInstance,                                             \
            CmpiInstanceMI::driveSetInstance,                                                \
            CmpiInstanceMI::driveDeleteInstance,                                             \
            CmpiInstanceMI::driveExecQuery,                                                  \
        };                                                                                   \
        static CMPIInstanceMI mi;                                                            \
        (void)rc;                                                                            \
        return CmpiFactory::createMI<cn>(mi, &instMIFT, base##pn, broker, ctxp,              \
                                         CmpiFactory::TraceLine::Instance);                  \
    }

#define CMAssociationMIFactory(cn, pn)                                                       \
    CMPI_EXTERN_C CMPIAssociationMI* pn##_Create_AssociationMI(const CMPIBroker* broker,      \
                                                               const CMPIContext* ctxp,       \
                                                               CMPIStatus* rc) {              \
        static CMPIAssociationMIFT assocMIFT = {                                             \
            CMPICurrentVersion,                                                              \
            CMPICurrentVersion,                                                              \
            "association" #pn,                                                               \
            CmpiBaseMI::driveBaseCleanup<CMPIAssociationMI>,                                 \
            CmpiAssociationMI::driveAssociators,                                             \
            CmpiAssociationMI::driveAssociatorNames,                                         \
            CmpiAssociationMI::driveReferences,                                              \
            CmpiAssociationMI::driveReferenceNames,                                          \
        };                                                                                   \
        static CMPIAssociationMI mi;                                                         \
        (void)rc;                                                                            \
        return CmpiFactory::createMI<cn>(mi, &assocMIFT, base##pn, broker, ctxp,             \
                                         CmpiFactory::TraceLine::None);                      \
    }

#define CMIndicationMIFactory(cn, pn)                                                        \
    CMPI_EXTERN_C CMPIIndicationMI* pn##_Create_IndicationMI(const CMPIBroker* broker,        \
                                                             const CMPIContext* ctxp,         \
                                                             CMPIStatus* rc) {                \
        static CMPIIndicationMIFT indMIFT = {                                                \
            CMPICurrentVersion,                                                              \
            CMPICurrentVersion,                                                              \
            "indication" #pn,                                                                \
            CmpiBaseMI::driveBaseCleanup<CMPIIndicationMI>,                                  \
            CmpiIndicationMI::driveAuthorizeFilter,                                          \
            CmpiIndicationMI::driveMustPoll,                                                 \
            CmpiIndicationMI::driveActivateFilter,                                           \
            CmpiIndicationMI::driveDeActivateFilter,                                         \
            CmpiIndicationMI::driveEnableIndications,                                        \
            CmpiIndicationMI::driveDisableIndications,                                       \
        };                                                                                   \
        static CMPIIndicationMI mi;                                                          \
        (void)rc;                                                                            \
        return CmpiFactory::createMI<cn>(mi, &indMIFT, base##pn, broker, ctxp,               \
                                         CmpiFactory::TraceLine::None);                      \
    }

#define CMMethodMIFactory(cn, pn)                                                            \
    CMPI_EXTERN_C CMPIMethodMI* pn##_Create_MethodMI(const CMPIBroker* broker,                \
                                                     const CMPIContext* ctxp, CMPIStatus* rc) { \
        static CMPIMethodMIFT methMIFT = {                                                   \
            CMPICurrentVersion,                                                              \
            CMPICurrentVersion,                                                              \
            "method" #pn,                                                                    \
            CmpiBaseMI::driveBaseCleanup<CMPIMethodMI>,                                      \
            CmpiMethodMI::driveInvokeMethod,                                                 \
        };                                                                                   \
        static CMPIMethodMI mi;                                                              \
        (void)rc;                                                                            \
        return CmpiFactory::createMI<cn>(mi, &methMIFT, base##pn, broker, ctxp,              \
                                         CmpiFactory::TraceLine::None);                      \
    }

#endif
