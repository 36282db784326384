#include <cmpi/CmpiStatus.h>

#include "GlobalBroker.h"

namespace {

const char* textOf(const CMPIString* s) {
    if (s == nullptr || s->ft == nullptr) {
        return nullptr;
    }
    return s->ft->getCharPtr(s, nullptr);
}

}  // namespace

CmpiStatus::CmpiStatus(const CMPIStatus st) : rc_(st.rc), hasMsg_(false) {
    if (const char* text = textOf(st.msg)) {
        hasMsg_ = true;
        msg_ = text;
    }
}

CmpiStatus::CmpiStatus(const CMPIrc rc) : rc_(rc), hasMsg_(false) {}

CmpiStatus::CmpiStatus(const CMPIrc rc, const char* msg)
    : rc_(rc), hasMsg_(msg != nullptr), msg_(msg != nullptr ? msg : "") {}

CMPIStatus CmpiStatus::status() const {
    CMPIStatus st{rc_, nullptr};
    const CMPIBroker* broker = cmpibinding::globalBroker();
    if (hasMsg_ && broker != nullptr) {
        st.msg = broker->eft->newString(broker, msg_.c_str(), nullptr);
    }
    return st;
}
