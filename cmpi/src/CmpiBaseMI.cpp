#include <cmpi/CmpiBaseMI.h>
#include <cmpi/CmpiProviderBase.h>

#include "Dispatch.h"
#include "GlobalBroker.h"

CmpiBaseMI::CmpiBaseMI(const CmpiBroker& mbp, const CmpiContext&) : broker(new CmpiBroker(mbp)), providerBase(nullptr) {}

CmpiBaseMI::~CmpiBaseMI() { delete broker; }

void CmpiBaseMI::setProviderBase(CmpiProviderBase* base) {
    providerBase = base;
    cmpibinding::setGlobalBroker(broker->getEnc());
}

CmpiStatus CmpiBaseMI::initialize(const CmpiContext&) { return CmpiStatus(CMPI_RC_OK); }

CmpiStatus CmpiBaseMI::cleanup(const CmpiContext&, CmpiBoolean) { return CmpiStatus(CMPI_RC_OK); }

int CmpiBaseMI::isUnloadable() const { return 1; }

CMPIStatus CmpiBaseMI::cleanupProvider(const void* hdl, const char* miName, const CMPIContext* eCtx,
                                       CMPIBoolean terminating) {
    CmpiBaseMI* provider = cmpibinding::providerOf(hdl);
    if (!terminating && !provider->isUnloadable()) {
        return CmpiStatus(CMPI_RC_NEVER_UNLOAD).status();
    }
    CmpiProviderBase* base = provider->getProviderBase();
    if (base != nullptr && base->decUseCount() > 0) {
        return CmpiStatus(CMPI_RC_OK).status();
    }
    CMPIStatus st = cmpibinding::guarded(miName, "cleanup", [&]() {
        return provider->cleanup(CmpiContext(eCtx), terminating).status();
    });
    if (st.rc != CMPI_RC_OK && !terminating) {
        if (base != nullptr) base->incUseCount();
        return st;
    }
    if (base != nullptr) base->setBaseMI(nullptr);
    delete provider;
    return st;
}
