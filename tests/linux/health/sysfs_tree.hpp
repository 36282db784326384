// A sysfs tree the health tests write out: files, directories and links under
// a fresh temporary root, removed again when the tree goes away; plus lookups
// of the properties and keys of the elements the readers answer.
#pragma once

#include "orv/platform/HealthElements.h"

#include <optional>
#include <string>

namespace orv::linuxtest {

class SysfsTree {
public:
    SysfsTree();
    ~SysfsTree();
    SysfsTree(const SysfsTree&) = delete;
    SysfsTree& operator=(const SysfsTree&) = delete;

    const std::string& root() const { return root_; }
    std::string path(const std::string& relative) const { return root_ + "/" + relative; }
    // Writes text and a newline to the file, creating its folders.
    void write(const std::string& relative, const std::string& text) const;
    // Writes each "name=value" of the list into folder/name.
    void writeAll(const std::string& folder, std::initializer_list<std::pair<const char*, std::string>> files) const;
    void mkdir(const std::string& relative) const;
    // A link at `at` to `target` (both relative to the root), written relative
    // as sysfs writes them.
    void link(const std::string& target, const std::string& at) const;
    void remove(const std::string& relative) const;

private:
    std::string root_;
};

// The value of the element's key or property of that name, if any.
std::optional<std::string> keyOf(const orv::platform::HealthElement& element, const std::string& name);
const orv::platform::HealthPropertyValue* propertyOf(const orv::platform::HealthElement& element, const std::string& name);
template <typename T>
std::optional<T> property(const orv::platform::HealthElement& element, const std::string& name)
{
    const orv::platform::HealthPropertyValue* value = propertyOf(element, name);
    if (value == nullptr || !std::holds_alternative<T>(*value)) return std::nullopt;
    return std::get<T>(*value);
}
// The element's HealthState: nothing when absent (a null state reads as 0xffff).
std::optional<std::uint16_t> healthOf(const orv::platform::HealthElement& element);

}  // namespace orv::linuxtest
