#include "ElementInstance.h"

#include <strings.h>

#include <algorithm>

#include <cmpi/CmpiArray.h>
#include <cmpi/CmpiStatus.h>

namespace hwhealth {

namespace {

using orv::platform::HealthElement;
using orv::platform::HealthKey;

constexpr const char* kSystemClassKey = "SystemCreationClassName";
constexpr const char* kSystemNameKey = "SystemName";

bool hasKey(const std::vector<HealthKey>& keys, const char* name) {
    return std::any_of(keys.begin(), keys.end(),
                       [name](const HealthKey& key) { return ::strcasecmp(key.name.c_str(), name) == 0; });
}

void addIfMissing(std::vector<HealthKey>& keys, const char* name, const CmpiString& value) {
    if (!hasKey(keys, name)) {
        HealthKey key;
        key.name = name;
        key.text = value.charPtr();
        keys.push_back(std::move(key));
    }
}

CmpiData keyValue(const HealthKey& key) {
    return key.text ? CmpiData(key.text->c_str()) : CmpiData(CMPIUint32(key.number));
}

CmpiData arrayOf(const std::vector<uint16_t>& items) {
    CmpiArray array(static_cast<CMPICount>(items.size()), CMPI_uint16);
    for (std::size_t i = 0; i < items.size(); ++i) {
        array[static_cast<int>(i)] = CmpiData(CMPIUint16(items[i]));
    }
    return CmpiData(array);
}

struct ValueOf {
    CmpiData operator()(const std::string& v) const { return CmpiData(v.c_str()); }
    CmpiData operator()(bool v) const { return CmpiData(v); }
    CmpiData operator()(uint16_t v) const { return CmpiData(CMPIUint16(v)); }
    CmpiData operator()(uint32_t v) const { return CmpiData(CMPIUint32(v)); }
    CmpiData operator()(uint64_t v) const { return CmpiData(CMPIUint64(v)); }
    CmpiData operator()(int32_t v) const { return CmpiData(CMPISint32(v)); }
    CmpiData operator()(int64_t v) const { return CmpiData(CMPISint64(v)); }
    CmpiData operator()(const std::vector<uint16_t>& v) const { return arrayOf(v); }
};

// A null HealthState is set as a NULL of the property's type: sfcb fails to
// send an instance holding a value of type CMPI_null.
void setHealthState(CmpiInstance& instance, std::optional<uint16_t> state) {
    constexpr const char* kName = "HealthState";
    if (state) {
        instance.setProperty(kName, CmpiData(CMPIUint16(*state)));
        return;
    }
    CMPIInstance* enc = instance.getEnc();
    const CMPIStatus status = enc->ft->setProperty(enc, kName, nullptr, CMPI_uint16);
    if (status.rc != CMPI_RC_OK) {
        throw CmpiStatus(status);
    }
}

}  // namespace

CmpiData valueOf(const orv::platform::HealthPropertyValue& value) { return std::visit(ValueOf{}, value); }

std::vector<HealthKey> keysOf(const HealthElement& element, const SystemKeys* systemKeys) {
    std::vector<HealthKey> keys = element.keys;
    if (systemKeys != nullptr) {
        addIfMissing(keys, kSystemClassKey, systemKeys->creationClassName);
        addIfMissing(keys, kSystemNameKey, systemKeys->name);
    }
    return keys;
}

CmpiObjectPath pathOf(const CmpiString& nameSpace, const HealthElement& element, const std::vector<HealthKey>& keys) {
    CmpiObjectPath path(nameSpace, element.className.c_str());
    if (element.hostName) {
        path.setHostname(element.hostName->c_str());
    }
    for (const HealthKey& key : keys) {
        path.setKey(key.name.c_str(), keyValue(key));
    }
    return path;
}

CmpiInstance instanceOf(const CmpiObjectPath& path, const HealthElement& element, const std::vector<HealthKey>& keys,
                        const char** properties) {
    CmpiInstance instance(path);
    std::vector<const char*> keyNames;
    for (const HealthKey& key : keys) {
        keyNames.push_back(key.name.c_str());
    }
    keyNames.push_back(nullptr);
    instance.setPropertyFilter(properties, keyNames.data());
    for (const HealthKey& key : keys) {
        instance.setProperty(key.name.c_str(), keyValue(key));
    }
    if (element.healthState) {
        setHealthState(instance, *element.healthState);
    }
    for (const orv::platform::HealthProperty& property : element.properties) {
        instance.setProperty(property.name.c_str(), valueOf(property.value));
    }
    return instance;
}

}  // namespace hwhealth
