#include "memory_elements.hpp"

#include "element_builder.hpp"

namespace orv::linuxhost::health {

namespace {

bool endsWith(const std::string& text, const std::string& tail)
{
    return text.size() >= tail.size() && text.compare(text.size() - tail.size(), tail.size(), tail) == 0;
}

}  // namespace

std::uint16_t memoryTypeOf(const std::string& edacType)
{
    struct Known {
        const char* suffix;
        std::uint16_t value;
    };
    static const Known known[] = {{"DDR2", 21}, {"DDR3", 24}, {"DDR", 20}, {"RMBS", 19}};
    if (edacType.empty() || edacType == "Unknown") return 0;
    if (edacType.find("FB-DDR2") != std::string::npos) return 25;
    for (const Known& entry : known) {
        if (endsWith(edacType, entry.suffix)) return entry.value;
    }
    return 1;
}

orv::platform::HealthElement memoryElement(const MemoryModule& module)
{
    orv::platform::HealthElement element = keyedElement(kPhysicalMemoryClass, "Tag", "edac:" + module.location);
    const std::string name = module.label.value_or(module.slot.value_or(module.location));
    addProperty(element, "ElementName", name);
    addProperty(element, "BankLabel", module.label.value_or(name));
    if (module.sizeMb) addProperty(element, "Capacity", *module.sizeMb * std::uint64_t{1024} * 1024);
    if (module.memoryType) addProperty(element, "MemoryType", memoryTypeOf(*module.memoryType));
    setHealth(element, memoryHealth(module));
    return element;
}

std::vector<orv::platform::HealthElement> memoryElements(const std::string& sysRoot)
{
    return elementsFrom(readMemoryModules(sysRoot), memoryElement);
}

}  // namespace orv::linuxhost::health
