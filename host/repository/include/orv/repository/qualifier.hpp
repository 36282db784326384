// Qualifiers on classes, properties, methods and parameters, and qualifier declarations.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "orv/repository/cim_type.hpp"
#include "orv/repository/value.hpp"

namespace orv::repository {

// Qualifier flavors. The defaults are those of a qualifier declared without a
// Flavor list: EnableOverride, ToSubclass, not Translatable.
struct Flavors {
    bool enableOverride = true;  // false: DisableOverride
    bool toSubclass = true;      // false: Restricted
    bool translatable = false;

    bool operator==(const Flavors&) const = default;
};

// Where a qualifier may appear (bit set of a qualifier declaration's Scope list).
enum class Scope : std::uint16_t {
    Class = 1U << 0U,
    Association = 1U << 1U,
    Indication = 1U << 2U,
    Property = 1U << 3U,
    Reference = 1U << 4U,
    Method = 1U << 5U,
    Parameter = 1U << 6U,
    Qualifier = 1U << 7U,
    Any = 0xFFU,
};

// A qualifier as applied to an element, e.g. Description("...") or Key.
// A qualifier written without a value ("Key") holds the boolean true.
// The type is the declared one when qualifier declarations were loaded into the
// namespace; otherwise it is taken from the literal (no value: boolean).
struct Qualifier {
    std::string name;  // as spelled where it was applied
    DataType type;
    Value value;
    // Flavors written at the point of use ("Key : DisableOverride"), or the declared ones.
    Flavors flavors;
    // True when this qualifier came down from the parent element unchanged.
    bool propagated = false;
};

// An ordered list of qualifiers with case-insensitive lookup.
class QualifierList {
public:
    QualifierList() = default;
    explicit QualifierList(std::vector<Qualifier> items) : items_(std::move(items)) {}

    const std::vector<Qualifier>& items() const noexcept { return items_; }
    std::vector<Qualifier>& items() noexcept { return items_; }
    bool empty() const noexcept { return items_.empty(); }

    // The qualifier named so (any case), or nullptr.
    const Qualifier* find(std::string_view name) const noexcept;
    // True when the qualifier is present with the boolean value true (or no value).
    bool isTrue(std::string_view name) const noexcept;
    // The string value of the qualifier, when present, scalar and a string.
    std::optional<std::string> stringValue(std::string_view name) const;

    // Adds or replaces (same name, any case) a qualifier.
    void set(Qualifier qualifier);

private:
    std::vector<Qualifier> items_;
};

// "Qualifier Key : boolean = false, Scope(property, reference), Flavor(DisableOverride, ToSubclass);"
struct QualifierDeclaration {
    std::string name;
    DataType type;
    Value defaultValue;
    std::uint16_t scopes = 0;  // bit set of Scope
    Flavors flavors;

    bool allows(Scope scope) const noexcept {
        return (scopes & static_cast<std::uint16_t>(scope)) != 0;
    }
};

}  // namespace orv::repository
