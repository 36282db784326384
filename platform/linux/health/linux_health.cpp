#include "linux_health.hpp"

#include "controller_elements.hpp"
#include "disk_elements.hpp"
#include "md_elements.hpp"
#include "memory_elements.hpp"
#include "port_elements.hpp"
#include "power_elements.hpp"
#include "sensor_elements.hpp"

namespace orv::linuxhost {

LinuxHealth::LinuxHealth(std::string sysRoot, std::string devRoot)
    : sysRoot_(std::move(sysRoot)), devRoot_(std::move(devRoot))
{
}

std::vector<orv::platform::HealthElement> LinuxHealth::elements(const std::string& watchedClass)
{
    if (watchedClass == "CIM_Sensor") return health::sensorElements(sysRoot_);
    if (watchedClass == "CIM_PhysicalMemory") return health::memoryElements(sysRoot_);
    if (watchedClass == "CIM_PowerSupply") return health::powerSupplyElements(sysRoot_);
    if (watchedClass == "Orvane_Battery") return health::batteryElements(sysRoot_);
    if (watchedClass == "Orvane_Controller") return health::storageControllerElements(sysRoot_);
    if (watchedClass == "Orvane_PortController") return health::networkControllerElements(sysRoot_);
    if (watchedClass == "Orvane_SASSATAPort") return health::storagePortElements(sysRoot_);
    if (watchedClass == "Orvane_StorageVolume") return health::volumeElements(sysRoot_);
    if (watchedClass == "Orvane_StorageExtent") return health::extentElements(sysRoot_);
    if (watchedClass == "Orvane_StoragePool") return health::poolElements(sysRoot_);
    if (watchedClass == "Orvane_DiskDrive") {
        health::DeviceSmartProbe probe(devRoot_);
        return health::diskElements(sysRoot_, probe);
    }
    return {};
}

}  // namespace orv::linuxhost
