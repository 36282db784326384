#include "controller_elements.hpp"

#include "element_builder.hpp"

#include <cstdio>

namespace orv::linuxhost::health {

namespace {

std::vector<orv::platform::HealthElement> elementsOf(const char* className, const std::string& sysRoot,
                                                     std::uint8_t baseClass)
{
    return elementsFrom(readPciFunctions(sysRoot, baseClass),
                        [className](const PciFunctionHealth& function) { return controllerElement(className, function); });
}

}  // namespace

orv::platform::HealthElement controllerElement(const char* className, const PciFunctionHealth& function)
{
    orv::platform::HealthElement element = keyedElement(className, "DeviceID", "pci:" + function.address);
    char ids[32];
    std::snprintf(ids, sizeof ids, "%04x:%04x", function.vendorId, function.deviceId);
    std::string name = "PCI " + std::string(ids) + " at " + function.address;
    if (function.driver) name += " (" + *function.driver + ")";
    addProperty(element, "ElementName", name);
    setHealth(element, pciFunctionHealth(function));
    return element;
}

std::vector<orv::platform::HealthElement> storageControllerElements(const std::string& sysRoot)
{
    return elementsOf(kControllerClass, sysRoot, kPciMassStorage);
}

std::vector<orv::platform::HealthElement> networkControllerElements(const std::string& sysRoot)
{
    return elementsOf(kPortControllerClass, sysRoot, kPciNetwork);
}

}  // namespace orv::linuxhost::health
