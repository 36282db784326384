#include <cmpi/CmpiString.h>

#include "Check.h"
#include "GlobalBroker.h"

#include <strings.h>

#include <cstring>

namespace {

CMPIString* newBrokerString(const char* s) {
    const CMPIBroker* broker = cmpibinding::requireBroker();
    return cmpibinding::checked([&](CMPIStatus* st) { return broker->eft->newString(broker, s, st); });
}

const char* orEmpty(const char* s) { return s != nullptr ? s : ""; }

}  // namespace

CmpiString::CmpiString(const char* s) : enc(newBrokerString(s)) {}

CmpiString::CmpiString(const CmpiString& other)
    : enc(other.enc != nullptr ? newBrokerString(other.charPtr()) : nullptr) {}

const char* CmpiString::charPtr() const {
    if (enc == nullptr) {
        return nullptr;
    }
    return enc->ft->getCharPtr(enc, nullptr);
}

CmpiBoolean CmpiString::equals(const char* s) const {
    return std::strcmp(orEmpty(charPtr()), orEmpty(s)) == 0;
}

CmpiBoolean CmpiString::equals(const CmpiString& s) const { return equals(s.charPtr()); }

CmpiBoolean CmpiString::equalsIgnoreCase(const char* s) const {
    return strcasecmp(orEmpty(charPtr()), orEmpty(s)) == 0;
}

CmpiBoolean CmpiString::equalsIgnoreCase(const CmpiString& s) const {
    return equalsIgnoreCase(s.charPtr());
}
