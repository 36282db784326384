// CMPIInstance: class, namespace, properties in the order they were set, and
// an optional property filter (setPropertyFilter).
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "class_source.hpp"
#include "object.hpp"
#include "value.hpp"

namespace orv::host::detail {

extern const CMPIInstanceFT kInstanceFT;

// The path getObjectPath made last, handed out again while neither the
// instance nor the path has changed (the CIM-XML writer asks twice per
// instance). The instance owns it; when it is replaced or the instance goes,
// it is handed to the arena, so a caller holding it keeps a valid path until
// the invocation ends. Not copied with the instance.
struct PathCache {
    CMPIObjectPath* path = nullptr;
    std::uint32_t instanceChanges = 0;  // InstanceImpl::changes when it was made
    std::uint32_t pathChanges = 0;      // its ObjectPathImpl::changes then

    PathCache() = default;
    PathCache(const PathCache& /*other*/) noexcept {}
    PathCache& operator=(const PathCache&) = delete;
    ~PathCache() { forget(); }
    // Hands the path (if any) over to its arena.
    void forget() noexcept;
};

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
    // Counts the changes made through the function table.
    std::uint32_t changes = 0;
    PathCache pathCache;
};

// A new instance of the path's class whose properties start as the path's keys.
CMPIInstance* newInstance(const CMPIObjectPath* path, Owner owner);
CMPIInstance* cloneInstance(const CMPIInstance* instance, Owner owner);
InstanceImpl* instanceImpl(const CMPIInstance* instance) noexcept;
// "instance of Class {\n Name = value;\n};" with properties in order.
std::string instanceText(const InstanceImpl& instance);

}  // namespace orv::host::detail
