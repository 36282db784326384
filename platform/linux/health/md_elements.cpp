#include "md_elements.hpp"

#include "element_builder.hpp"

namespace orv::linuxhost::health {

namespace {

constexpr std::uint64_t kSectorSize = 512;

void addBlocks(orv::platform::HealthElement& element, const std::optional<std::uint64_t>& sectors)
{
    addProperty(element, "BlockSize", kSectorSize);
    addIfKnown(element, "NumberOfBlocks", sectors);
}

template <typename Make>
std::vector<orv::platform::HealthElement> forEachArray(const std::string& sysRoot, Make make)
{
    std::vector<orv::platform::HealthElement> elements;
    for (const MdArray& array : readMdArrays(sysRoot)) make(array, elements);
    return elements;
}

}  // namespace

orv::platform::HealthElement volumeElement(const MdArray& array)
{
    orv::platform::HealthElement element = keyedElement(kStorageVolumeClass, "DeviceID", mdArrayId(array));
    addProperty(element, "ElementName", array.name);
    addBlocks(element, array.sectors);
    setHealth(element, mdArrayHealth(array));
    return element;
}

orv::platform::HealthElement poolElement(const MdArray& array)
{
    orv::platform::HealthElement element = instanceElement(kStoragePoolClass, mdArrayId(array));
    addProperty(element, "ElementName", array.name);
    addProperty(element, "PoolID", array.name);
    addProperty(element, "Primordial", false);
    if (array.sectors) addProperty(element, "TotalManagedSpace", *array.sectors * kSectorSize);
    setHealth(element, mdArrayHealth(array));
    return element;
}

orv::platform::HealthElement extentElement(const MdArray& array, const MdMember& member)
{
    const std::string role = member.slot ? "slot" + std::to_string(*member.slot) : member.entry;
    orv::platform::HealthElement element = keyedElement(kStorageExtentClass, "DeviceID", mdArrayId(array) + "/" + role);
    addProperty(element, "ElementName", member.blockName);
    addBlocks(element, member.sectors);
    setHealth(element, mdMemberHealth(member));
    return element;
}

std::vector<orv::platform::HealthElement> volumeElements(const std::string& sysRoot)
{
    return forEachArray(sysRoot, [](const MdArray& array, auto& out) { out.push_back(volumeElement(array)); });
}

std::vector<orv::platform::HealthElement> poolElements(const std::string& sysRoot)
{
    return forEachArray(sysRoot, [](const MdArray& array, auto& out) { out.push_back(poolElement(array)); });
}

std::vector<orv::platform::HealthElement> extentElements(const std::string& sysRoot)
{
    return forEachArray(sysRoot, [](const MdArray& array, auto& out) {
        for (const MdMember& member : array.members) out.push_back(extentElement(array, member));
    });
}

}  // namespace orv::linuxhost::health
