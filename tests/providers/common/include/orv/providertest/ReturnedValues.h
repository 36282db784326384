// Readers of what a request returned: properties and keys as (name, CIM type,
// text), in the order the object holds them, and the class names of returned
// instances and paths.
//
//   EXPECT_EQ(propertiesOf(reply.instances()[0]),
//             (std::vector<NamedValue>{{"Name", CMPI_string, "vif0"}, ...}));
#pragma once

#include <cmpidt.h>

#include <optional>
#include <ostream>
#include <string>
#include <string_view>
#include <vector>

#include "orv/host/broker_core.hpp"

namespace orv::providertest {

struct NamedValue {
    std::string name;
    CMPIType type = CMPI_null;
    // Strings as they are, numbers in decimal, booleans "true"/"false",
    // references as "namespace:Class.key=value,...", arrays "[a, b]";
    // "<null>" for a null value.
    std::string text;
    bool operator==(const NamedValue&) const = default;
};

std::ostream& operator<<(std::ostream& os, const NamedValue& value);

// "string", "uint16", "uint8[]", ... for messages.
std::string typeName(CMPIType type);
std::string valueText(const CMPIData& data);

std::vector<NamedValue> propertiesOf(const CMPIInstance* instance);
// The names only, in order.
std::vector<std::string> propertyNamesOf(const CMPIInstance* instance);
std::optional<NamedValue> propertyOf(const CMPIInstance* instance, std::string_view name);

std::vector<NamedValue> keysOf(const CMPIObjectPath* path);
std::string classNameOf(const CMPIObjectPath* path);
std::string nameSpaceOf(const CMPIObjectPath* path);
// The class of the instance's own object path.
std::string classNameOf(const CMPIInstance* instance);

// Class names of the returned instances, or else of the returned paths, in order.
std::vector<std::string> classNamesOf(const orv::host::Reply& reply);

}  // namespace orv::providertest
