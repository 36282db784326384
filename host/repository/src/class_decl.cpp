#include "orv/repository/class_decl.hpp"

#include <cstring>

#include "text.hpp"

namespace orv::repository {
namespace {

template <typename Item>
const Item* findByName(const std::vector<Item>& items, std::string_view name) noexcept {
    for (const auto& item : items) {
        if (text::iequals(item.name, name)) {
            return &item;
        }
    }
    return nullptr;
}

// A cheap hash of a name as spelled (the slot table is small and every hit is checked):
// of a long name its length and its first and last eight bytes.
std::size_t exactHash(std::string_view name) noexcept {
    const std::size_t size = name.size();
    if (size >= 8) {
        std::uint64_t head;
        std::uint64_t tail;
        std::memcpy(&head, name.data(), sizeof head);
        std::memcpy(&tail, name.data() + size - 8, sizeof tail);
        const std::uint64_t mixed = head * 0x9E3779B97F4A7C15ULL ^ (tail + size) * 0xC2B2AE3D27D4EB4FULL;
        return static_cast<std::size_t>(mixed ^ (mixed >> 29));
    }
    std::size_t hash = size;
    for (const char c : name) {
        hash = hash * 31 + static_cast<unsigned char>(c);
    }
    return hash;
}

// The property spelled exactly `name` through the slot table, or nullptr.
const PropertyDecl* findIndexed(const std::vector<PropertyDecl>& properties,
                                const std::vector<std::uint32_t>& slots, std::string_view name) noexcept {
    const std::size_t mask = slots.size() - 1;
    for (std::size_t at = exactHash(name) & mask;; at = (at + 1) & mask) {
        const std::uint32_t slot = slots[at];
        if (slot == 0 || slot > properties.size()) {
            return nullptr;
        }
        const PropertyDecl& property = properties[slot - 1];
        if (property.name == name) {
            return &property;
        }
    }
}

}  // namespace

bool ParameterDecl::isIn() const noexcept {
    if (qualifiers.find("In") != nullptr) {
        return qualifiers.isTrue("In");
    }
    return true;
}

bool ParameterDecl::isOut() const noexcept {
    return qualifiers.isTrue("Out");
}

const ParameterDecl* MethodDecl::findParameter(std::string_view paramName) const noexcept {
    return findByName(parameters, paramName);
}

const PropertyDecl* ClassDecl::findProperty(std::string_view propertyName) const noexcept {
    // The table has more slots than properties (at least one stays empty, so a probe ends);
    // one that does not is out of date and not used.
    if (propertySlots.size() > properties.size()) {
        if (const PropertyDecl* exact = findIndexed(properties, propertySlots, propertyName)) {
            return exact;
        }
    }
    return findByName(properties, propertyName);
}

void ClassDecl::indexProperties() {
    std::size_t size = 4;
    while (size < 2 * properties.size()) {
        size *= 2;
    }
    propertySlots.assign(size, 0);
    for (std::size_t i = 0; i < properties.size(); ++i) {
        std::size_t at = exactHash(properties[i].name) & (size - 1);
        while (propertySlots[at] != 0) {
            at = (at + 1) & (size - 1);
        }
        propertySlots[at] = static_cast<std::uint32_t>(i + 1);
    }
}

const MethodDecl* ClassDecl::findMethod(std::string_view methodName) const noexcept {
    return findByName(methods, methodName);
}

std::vector<std::string> ClassDecl::keyNames() const {
    std::vector<std::string> out;
    for (const auto& p : properties) {
        if (p.key) {
            out.push_back(p.name);
        }
    }
    return out;
}

std::vector<const PropertyDecl*> ClassDecl::referenceProperties() const {
    std::vector<const PropertyDecl*> out;
    for (const auto& p : properties) {
        if (p.isReference()) {
            out.push_back(&p);
        }
    }
    return out;
}

}  // namespace orv::repository
