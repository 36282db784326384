// CMPIInstance: class, namespace, properties in the order they were set, and
// an optional property filter (setPropertyFilter).
#pragma once

#include <optional>
#include <string>
#include <vector>

#include "class_source.hpp"
#include "object.hpp"
#include "value.hpp"

namespace orv::host::detail {

extern const CMPIInstanceFT kInstanceFT;

struct InstanceImpl {
    std::string nameSpace;
    std::string host;
    std::string className;
    ValueList properties;
    // Key names of the path the instance was made from, kept only when the class
    // is not in the repository, for the instance's path.
    std::vector<std::string> pathKeys;
    // Set by setPropertyFilter: only these names (and keys) are kept.
    std::optional<std::vector<std::string>> filter;
    const ClassSource* classes = nullptr;
    // The names of className as the class source has them, or nullptr.
    const NameTable* classNames = nullptr;
};

// A new instance of the path's class whose properties start as the path's keys.
CMPIInstance* newInstance(const CMPIObjectPath* path, Owner owner);
CMPIInstance* cloneInstance(const CMPIInstance* instance, Owner owner);
InstanceImpl* instanceImpl(const CMPIInstance* instance) noexcept;
// "instance of Class {\n Name = value;\n};" with properties in order.
std::string instanceText(const InstanceImpl& instance);

}  // namespace orv::host::detail
