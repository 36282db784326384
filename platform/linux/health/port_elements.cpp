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
    std::vector<orv::platform::HealthElement> elements = elementsFrom(readSasPhys(sysRoot), storagePortElement);
    for (auto& element : elementsFrom(readAtaLinks(sysRoot), storagePortElement)) elements.push_back(std::move(element));
    return elements;
}

}  // namespace orv::linuxhost::health
