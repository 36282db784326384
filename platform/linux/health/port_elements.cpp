#include "port_elements.hpp"

#include "element_builder.hpp"

namespace orv::linuxhost::health {

orv::platform::HealthElement storagePortElement(const StoragePort& port)
{
    orv::platform::HealthElement element = keyedElement(kSasSataPortClass, "DeviceID", port.id);
    addProperty(element, "ElementName", port.name);
    addIfKnown(element, "Speed", port.speed);
    setHealth(element, storagePortHealth(port));
    return element;
}

std::vector<orv::platform::HealthElement> storagePortElements(const std::string& sysRoot)
{
    std::vector<orv::platform::HealthElement> elements;
    for (const StoragePort& port : readSasPhys(sysRoot)) elements.push_back(storagePortElement(port));
    for (const StoragePort& port : readAtaLinks(sysRoot)) elements.push_back(storagePortElement(port));
    return elements;
}

}  // namespace orv::linuxhost::health
