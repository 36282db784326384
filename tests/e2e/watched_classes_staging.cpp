#include "watched_classes_staging.hpp"

namespace orv::e2e {

SfcbStaging watchedClassesStaging() {
    SfcbStaging staging;
    staging.schemaMofs = {"Device/CIM_Sensor.mof", "Physical/CIM_PhysicalMemory.mof", "Device/CIM_Processor.mof",
                          "Device/CIM_PowerSupply.mof"};
    return staging;
}

}  // namespace orv::e2e
