// Building the platform's health elements from what the readers found: the
// keys of a logical device or a physical element, the HealthState with its
// OperationalStatus, and properties typed as the classes declare them.
#pragma once

#include "orv/platform/HealthElements.h"

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace orv::linuxhost::health {

// An element keyed by CreationClassName (= className) and keyName = keyValue
// ("DeviceID" for logical devices, "Tag" for physical elements, "InstanceID"
// for pools). The host adds the system keys.
orv::platform::HealthElement keyedElement(const std::string& className, const char* keyName, const std::string& keyValue);
// The same without a CreationClassName key (classes keyed by InstanceID only).
orv::platform::HealthElement instanceElement(const std::string& className, const std::string& instanceId);

// Sets HealthState and OperationalStatus; leaves both out when state is nothing.
void setHealth(orv::platform::HealthElement& element, std::optional<std::uint16_t> state);

void addProperty(orv::platform::HealthElement& element, const char* name, orv::platform::HealthPropertyValue value);

// Adds the property only when the value is known.
template <typename T>
void addIfKnown(orv::platform::HealthElement& element, const char* name, const std::optional<T>& value)
{
    if (value) addProperty(element, name, *value);
}

// One element per item, in the items' order.
template <typename Items, typename Make>
std::vector<orv::platform::HealthElement> elementsFrom(const Items& items, Make make)
{
    std::vector<orv::platform::HealthElement> elements;
    elements.reserve(items.size());
    for (const auto& item : items) elements.push_back(make(item));
    return elements;
}

}  // namespace orv::linuxhost::health
