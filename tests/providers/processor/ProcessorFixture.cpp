#include "ProcessorFixture.h"

namespace processortest {

StringKeys processorKeys(const std::string& deviceId) {
    return {{"SystemCreationClassName", "OMC_UnitaryComputerSystem"},
            {"SystemName", orv::providertest::SimHost::kFqdn},
            {"CreationClassName", kProcessorClass},
            {"DeviceID", deviceId},
            {"ElementName", deviceId}};
}

std::vector<NamedValue> processorKeyValues(const std::string& deviceId) {
    std::vector<NamedValue> keys;
    for (const auto& [name, value] : processorKeys(deviceId)) {
        keys.push_back({name, CMPI_string, value});
    }
    return keys;
}

std::vector<NamedValue> uniformPackageProperties(const std::string& deviceId, unsigned cores) {
    std::vector<NamedValue> properties = processorKeyValues(deviceId);
    const std::vector<NamedValue> rest = {
        {"OperationalStatus", CMPI_uint16A, "[2]"},
        {"Vendor", CMPI_uint16, "2"},
        {"NumberOfEnabledCores", CMPI_uint16, std::to_string(cores)},
        {"Stepping", CMPI_string, "4"},
        {"ModelName", CMPI_string, "Test CPU @ 2.00GHz"},
        {"OtherIdentifyingInfo", CMPI_stringA, "[0x  ff]"},
        {"IdentifyingDescriptions", CMPI_stringA, "[Brand ID]"},
        {"CPUStatus", CMPI_uint16, "4"},
        {"Characteristics", CMPI_uint16A, "[2, 4, 5, 6, 7]"},
        {"EnabledProcessorCharacteristics", CMPI_uint16A, "[2, 2, 2, 2, 2]"},
    };
    properties.insert(properties.end(), rest.begin(), rest.end());
    return properties;
}

std::vector<std::string> deviceIdsOf(const orv::host::Reply& reply) {
    std::vector<std::string> ids;
    for (const CMPIInstance* instance : reply.instances()) {
        ids.push_back(textOf(instance, "DeviceID"));
    }
    return ids;
}

std::string textOf(const CMPIInstance* instance, const char* name) {
    const std::optional<NamedValue> value = orv::providertest::propertyOf(instance, name);
    return value ? value->text : "<absent>";
}

}  // namespace processortest
