#include "element_builder.hpp"

#include "health_state.hpp"

namespace orv::linuxhost::health {

using orv::platform::HealthElement;
using orv::platform::HealthKey;

namespace {

HealthKey textKey(const char* name, const std::string& value)
{
    HealthKey key;
    key.name = name;
    key.text = value;
    return key;
}

}  // namespace

HealthElement keyedElement(const std::string& className, const char* keyName, const std::string& keyValue)
{
    HealthElement element;
    element.className = className;
    element.keys.push_back(textKey("CreationClassName", className));
    element.keys.push_back(textKey(keyName, keyValue));
    return element;
}

HealthElement instanceElement(const std::string& className, const std::string& instanceId)
{
    HealthElement element;
    element.className = className;
    element.keys.push_back(textKey("InstanceID", instanceId));
    return element;
}

void setHealth(HealthElement& element, std::optional<std::uint16_t> state)
{
    if (!state) return;
    element.healthState = std::optional<std::uint16_t>(*state);
    addProperty(element, "OperationalStatus", operationalStatusFor(state));
}

void addProperty(HealthElement& element, const char* name, orv::platform::HealthPropertyValue value)
{
    element.properties.push_back({name, std::move(value)});
}

}  // namespace orv::linuxhost::health
