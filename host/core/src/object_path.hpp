// CMPIObjectPath: namespace, host, class name and keys.
#pragma once

#include <cstdint>
#include <string>

#include "class_source.hpp"
#include "object.hpp"
#include "value.hpp"

namespace orv::host::detail {

extern const CMPIObjectPathFT kObjectPathFT;

struct ObjectPathImpl {
    std::string nameSpace;
    std::string host;
    std::string className;
    ValueList keys;
    const ClassSource* classes = nullptr;
    // Counts the changes made through the function table (setters, addKey).
    std::uint32_t changes = 0;
};

CMPIObjectPath* newObjectPath(std::string_view ns, std::string_view className,
                              const ClassSource* classes, Owner owner);
CMPIObjectPath* cloneObjectPath(const CMPIObjectPath* path, Owner owner);
ObjectPathImpl* objectPathImpl(const CMPIObjectPath* path) noexcept;
// "//host/ns:Class.key=value,..." (host part only when set), keys in order.
std::string objectPathText(const ObjectPathImpl& path);

}  // namespace orv::host::detail
