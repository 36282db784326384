#include "GlobalBroker.h"

#include <cmpi/CmpiStatus.h>

#include <atomic>

namespace cmpibinding {

namespace {
std::atomic<const CMPIBroker*> theBroker{nullptr};
}

void setGlobalBroker(const CMPIBroker* broker) {
    if (broker != nullptr) {
        theBroker.store(broker, std::memory_order_release);
    }
}

const CMPIBroker* globalBroker() { return theBroker.load(std::memory_order_acquire); }

const CMPIBroker* requireBroker() {
    const CMPIBroker* broker = globalBroker();
    if (broker == nullptr) {
        throw CmpiStatus(CMPI_RC_ERR_INVALID_HANDLE, "no broker: no provider has been created yet");
    }
    return broker;
}

}  // namespace cmpibinding
