#include "health_elements_provider.hpp"

#include <filesystem>

namespace orv::e2e {

std::vector<std::string> healthElementsHostArgs() {
    return {"--provider-dir", std::filesystem::path(ORV_HEALTH_ELEMENTS_LIBRARY).parent_path().string(),
            "--registration", ORV_HEALTH_ELEMENTS_REGISTRATION, "--mof", ORV_HEALTH_ELEMENTS_MOF};
}

SfcbStaging healthElementsStaging() {
    SfcbStaging staging;
    staging.libraries = {ORV_HEALTH_ELEMENTS_LIBRARY};
    staging.registrations = {ORV_HEALTH_ELEMENTS_REGISTRATION};
    staging.mofs = {ORV_HEALTH_ELEMENTS_MOF};
    staging.schemaMofs = {"Device/CIM_Sensor.mof", "Physical/CIM_PhysicalMemory.mof", "Device/CIM_Processor.mof",
                          "Device/CIM_PowerSupply.mof"};
    return staging;
}

}  // namespace orv::e2e
