// Equality of object paths: the same namespace and host name, the class name
// ignoring case, and the same key bindings, names ignoring case, in any order.
#include <cmpi/CmpiObjectPath.h>

#include "DataEquality.h"

#include <strings.h>

#include <cstring>

namespace {

const char* orEmpty(const char* s) { return s != nullptr ? s : ""; }

bool sameText(const CmpiString& a, const CmpiString& b) {
    return std::strcmp(orEmpty(a.charPtr()), orEmpty(b.charPtr())) == 0;
}

// Whether path holds a key named name (ignoring case) whose value equals value.
bool holdsKey(const CmpiObjectPath& path, const char* name, const CmpiData& value) {
    const unsigned int count = path.getKeyCount();
    for (unsigned int i = 0; i < count; ++i) {
        CmpiString keyName;
        CmpiData keyValue = path.getKey(static_cast<int>(i), &keyName);
        if (strcasecmp(orEmpty(keyName.charPtr()), name) == 0) {
            return cmpibinding::dataEquals(keyValue.getEncData(), value.getEncData());
        }
    }
    return false;
}

bool sameKeys(const CmpiObjectPath& a, const CmpiObjectPath& b) {
    const unsigned int count = a.getKeyCount();
    if (count != b.getKeyCount()) return false;
    for (unsigned int i = 0; i < count; ++i) {
        CmpiString keyName;
        CmpiData keyValue = a.getKey(static_cast<int>(i), &keyName);
        if (!holdsKey(b, orEmpty(keyName.charPtr()), keyValue)) return false;
    }
    return true;
}

}  // namespace

bool CmpiObjectPath::operator==(const CmpiObjectPath& other) const {
    if (isNull() || other.isNull()) return isNull() && other.isNull();
    return sameText(getNameSpace(), other.getNameSpace()) && sameText(getHostname(), other.getHostname()) &&
           getClassName().equalsIgnoreCase(other.getClassName()) && sameKeys(*this, other);
}
