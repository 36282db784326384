// The latched records: rebuilding an element's path from its record, reading
// an event number from a request, finding a record by event number or by
// element, and the index that keeps the search for an element short.
#include <strings.h>

#include <algorithm>
#include <cctype>
#include <cstdlib>
#include <cstring>

#include "VmLatchedHealth.h"

namespace VmLatchedHealth {
namespace {

constexpr const char* kNullHost = "NULL";
constexpr std::size_t kNullHostLength = 4;

const char* orEmpty(const char* text) { return text != nullptr ? text : ""; }

bool isStringType(CMPIType type) { return type == CMPI_string || type == CMPI_chars; }

std::string lowerCase(const char* text) {
    std::string out(orEmpty(text));
    std::transform(out.begin(), out.end(), out.begin(), [](unsigned char c) { return std::tolower(c); });
    return out;
}

}  // namespace

bool SetCopInfo(HealthInfo* info, CmpiObjectPath& path) {
    if (std::strncmp(info->hostname, kNullHost, kNullHostLength) != 0) {
        path.setHostname(info->hostname);
    }
    try {
        for (uint32_t i = 0; i < info->copKeyCount; ++i) {
            const ObjectPathKey& key = info->copKeys[i];
            if (key.name == nullptr || key.value == nullptr) {
                std::abort();
            }
            path.setKey(key.name, CmpiData(key.value));
        }
    } catch (const CmpiStatus&) {
        return false;
    }
    return true;
}

void FreeCopKeys(ObjectPathKey* keys, uint32_t count) {
    for (uint32_t i = 0; i < count; ++i) {
        std::free(keys[i].name);
        std::free(keys[i].value);
    }
    std::free(keys);
}

bool GetEventId(const CmpiObjectPath& path, unsigned int* id) {
    *id = 0;
    CmpiData key;
    try {
        key = path.getKey("EventId");
    } catch (const CmpiStatus&) {
        return false;
    }
    if (key.isNullValue() || key.isNotFound()) {
        return false;
    }
    const char* text = key;
    *id = static_cast<unsigned int>(std::strtol(orEmpty(text), nullptr, 10));
    return true;
}

HealthInfo* FindRecordByEventId(unsigned int eventId) {
    for (HealthInfo* record : state().healthInfo) {
        if (record->eventId == eventId) {
            return record;
        }
    }
    return nullptr;
}

bool RecordMatches(HealthInfo* record, const CmpiObjectPath& cop) {
    const CmpiString className = cop.getClassName();
    if (std::strncmp(record->className, orEmpty(className.charPtr()), kClassNameSize) != 0) {
        return false;
    }
    CmpiObjectPath rebuilt(record->ns, record->className);
    return SetCopInfo(record, rebuilt) && rebuilt == cop;
}

// Namespace, host name, class name in lower case, then the keys sorted by
// their lower-case names: the parts that path equality compares, in a form
// where equal paths give equal text.
bool RecordIndex::canonicalForm(const CmpiObjectPath& path, std::string& out) {
    const unsigned int count = path.getKeyCount();
    std::vector<std::string> keys;
    keys.reserve(count);
    for (unsigned int i = 0; i < count; ++i) {
        CmpiString name;
        const CmpiData value = path.getKey(static_cast<int>(i), &name);
        if (!isStringType(value.getType()) || value.isNullValue()) {
            return false;
        }
        const char* text = value;
        keys.push_back(lowerCase(name.charPtr()) + '\x01' + orEmpty(text));
    }
    std::sort(keys.begin(), keys.end());
    out.assign(orEmpty(path.getNameSpace().charPtr()));
    out += '\0';
    out += orEmpty(path.getHostname().charPtr());
    out += '\0';
    out += lowerCase(path.getClassName().charPtr());
    for (const std::string& key : keys) {
        out += '\0';
        out += key;
    }
    return true;
}

const std::vector<HealthInfo*>* RecordIndex::candidates(const CmpiObjectPath& cop, std::string& canonical) const {
    static const std::vector<HealthInfo*> none;
    if (!canonicalForm(cop, canonical)) {
        return nullptr;
    }
    const auto found = buckets_.find(canonical);
    return found != buckets_.end() ? &found->second : &none;
}

}  // namespace VmLatchedHealth
