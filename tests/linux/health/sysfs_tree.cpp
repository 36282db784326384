#include "sysfs_tree.hpp"

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <stdexcept>

namespace fs = std::filesystem;

namespace orv::linuxtest {

SysfsTree::SysfsTree()
{
    std::string pattern = (fs::temp_directory_path() / "orv-health-XXXXXX").string();
    if (::mkdtemp(pattern.data()) == nullptr) throw std::runtime_error("cannot make a temporary folder");
    root_ = pattern;
}

SysfsTree::~SysfsTree()
{
    std::error_code ec;
    fs::remove_all(root_, ec);
}

void SysfsTree::write(const std::string& relative, const std::string& text) const
{
    const fs::path file = path(relative);
    fs::create_directories(file.parent_path());
    std::ofstream(file) << text << "\n";
}

void SysfsTree::writeAll(const std::string& folder, std::initializer_list<std::pair<const char*, std::string>> files) const
{
    for (const auto& [name, value] : files) write(folder + "/" + name, value);
}

void SysfsTree::mkdir(const std::string& relative) const { fs::create_directories(path(relative)); }

void SysfsTree::link(const std::string& target, const std::string& at) const
{
    const fs::path where = path(at);
    fs::create_directories(where.parent_path());
    fs::create_symlink(fs::relative(path(target), where.parent_path()), where);
}

void SysfsTree::remove(const std::string& relative) const { fs::remove_all(path(relative)); }

std::optional<std::string> keyOf(const orv::platform::HealthElement& element, const std::string& name)
{
    for (const auto& key : element.keys) {
        if (key.name == name) return key.text ? *key.text : std::to_string(key.number);
    }
    return std::nullopt;
}

const orv::platform::HealthPropertyValue* propertyOf(const orv::platform::HealthElement& element, const std::string& name)
{
    for (const auto& property : element.properties) {
        if (property.name == name) return &property.value;
    }
    return nullptr;
}

std::optional<std::uint16_t> healthOf(const orv::platform::HealthElement& element)
{
    if (!element.healthState) return std::nullopt;
    return element.healthState->value_or(0xffff);
}

}  // namespace orv::linuxtest
