// The common frame of every dispatcher: find the provider object behind the
// MI record, run the operation, and turn whatever it ends with into the
// status handed back to the broker. Nothing is thrown into the broker.
#ifndef ORV_CMPI_SRC_DISPATCH_H
#define ORV_CMPI_SRC_DISPATCH_H

#include <cmpi/CmpiAssociationMI.h>
#include <cmpi/CmpiBaseMI.h>
#include <cmpi/CmpiIndicationMI.h>
#include <cmpi/CmpiInstanceMI.h>
#include <cmpi/CmpiMethodMI.h>
#include <cmpi/CmpiStatus.h>

#include <exception>

namespace cmpibinding {

// Logs "<miName>: <operation> failed: <text>" at LOG_ERR and answers
// CMPI_RC_ERR_FAILED with text as message.
CMPIStatus failedStatus(const char* miName, const char* operation, const char* text);

// The provider object stored as the record's handle.
inline CmpiBaseMI* providerOf(const void* hdl) {
    return static_cast<CmpiBaseMI*>(const_cast<void*>(hdl));
}

// Runs run() and answers what it returns; a thrown CmpiStatus becomes the
// answer, any other exception is logged and answered with CMPI_RC_ERR_FAILED.
// The interface of kind MI that the provider object serves, or null.
inline CmpiInstanceMI* interfaceOf(CmpiInstanceMI*, const CmpiBaseMI& p) { return p.instanceInterface(); }
inline CmpiAssociationMI* interfaceOf(CmpiAssociationMI*, const CmpiBaseMI& p) { return p.associationInterface(); }
inline CmpiIndicationMI* interfaceOf(CmpiIndicationMI*, const CmpiBaseMI& p) { return p.indicationInterface(); }
inline CmpiMethodMI* interfaceOf(CmpiMethodMI*, const CmpiBaseMI& p) { return p.methodInterface(); }

template <class Run>
CMPIStatus guarded(const char* miName, const char* operation, Run&& run) {
    try {
        return run();
    } catch (const CmpiStatus& thrown) {
        return thrown.status();
    } catch (const std::exception& e) {
        return failedStatus(miName, operation, e.what());
    } catch (...) {
        return failedStatus(miName, operation, "unknown exception");
    }
}

template <class MI, class Record, class Operation>
CMPIStatus dispatch(Record* mi, const char* operation, Operation&& run) {
    const char* miName = mi->ft->miName;
    return guarded(miName, operation, [&]() -> CMPIStatus {
        MI* provider = interfaceOf(static_cast<MI*>(nullptr), *providerOf(mi->hdl));
        if (provider == nullptr) {
            return failedStatus(miName, operation, "the provider does not serve this interface");
        }
        return run(*provider).status();
    });
}

}  // namespace cmpibinding

#endif
