// The "health" section: hardware elements and the health state they report.
#include "ReaderParts.h"

namespace orv::platform::sim {
namespace {

constexpr uint64_t kMaxHealthState = UINT16_MAX;

HealthKey readKey(const std::string& name, const JsonNode& node)
{
    HealthKey key;
    key.name = name;
    if (node.isString()) {
        key.text = node.text(SIZE_MAX);
    } else {
        key.number = static_cast<uint32_t>(node.unsignedInteger(UINT32_MAX));
    }
    return key;
}

// A typed number: an object with one key naming the CIM type.
HealthPropertyValue readTypedValue(const JsonNode& node)
{
    JsonObject object = node.object();
    const std::vector<std::string> types = object.keys();
    if (types.size() != 1) {
        node.fail("expected a string, a boolean or one of {\"uint16\"|\"uint32\"|\"uint64\"|\"sint32\"|"
                  "\"sint64\"|\"uint16[]\": value}");
    }
    const std::string& type = types.front();
    const JsonNode value = object.required(type.c_str());
    HealthPropertyValue out;
    if (type == "uint16") {
        out = static_cast<uint16_t>(value.unsignedInteger(UINT16_MAX));
    } else if (type == "uint32") {
        out = static_cast<uint32_t>(value.unsignedInteger(UINT32_MAX));
    } else if (type == "uint64") {
        out = static_cast<uint64_t>(value.unsignedInteger(UINT64_MAX));
    } else if (type == "sint32") {
        out = static_cast<int32_t>(value.integer(INT32_MIN, INT32_MAX));
    } else if (type == "sint64") {
        out = static_cast<int64_t>(value.integer(INT64_MIN, INT64_MAX));
    } else if (type == "uint16[]") {
        std::vector<uint16_t> items;
        for (const JsonNode& item : value.array()) {
            items.push_back(static_cast<uint16_t>(item.unsignedInteger(UINT16_MAX)));
        }
        out = std::move(items);
    } else {
        node.fail("unknown property type \"" + type + "\"");
    }
    object.finish();
    return out;
}

HealthPropertyValue readPropertyValue(const JsonNode& node)
{
    if (node.isString()) {
        return node.text(SIZE_MAX);
    }
    if (node.isBoolean()) {
        return node.boolean();
    }
    return readTypedValue(node);
}

std::vector<HealthProperty> readProperties(const JsonNode& node)
{
    JsonObject object = node.object();
    std::vector<HealthProperty> properties;
    for (const std::string& name : object.keys()) {
        properties.push_back(HealthProperty{name, readPropertyValue(object.required(name.c_str()))});
    }
    object.finish();
    return properties;
}

std::vector<HealthKey> readKeys(const JsonNode& node)
{
    JsonObject object = node.object();
    std::vector<HealthKey> keys;
    for (const std::string& name : object.keys()) {
        keys.push_back(readKey(name, object.required(name.c_str())));
    }
    object.finish();
    return keys;
}

HealthElementModel readElement(const JsonNode& node)
{
    JsonObject object = node.object();
    HealthElementModel model;
    model.watchedClass = object.required("watchedClass").text(SIZE_MAX, true);
    model.element.className = model.watchedClass;
    if (std::optional<JsonNode> className = object.optional("class")) {
        model.element.className = className->text(SIZE_MAX, true);
    }
    if (std::optional<JsonNode> hostName = object.optionalNonNull("hostName")) {
        model.element.hostName = hostName->text(SIZE_MAX);
    }
    model.element.keys = readKeys(object.required("keys"));
    if (std::optional<JsonNode> state = object.optional("healthState")) {
        model.element.healthState.emplace();
        if (!state->isNull()) {
            *model.element.healthState = static_cast<uint16_t>(state->unsignedInteger(kMaxHealthState));
        }
    }
    if (std::optional<JsonNode> properties = object.optional("properties")) {
        model.element.properties = readProperties(*properties);
    }
    object.finish();
    return model;
}

} // namespace

std::vector<HealthElementModel> readHealth(const JsonNode& node)
{
    std::vector<HealthElementModel> elements;
    for (const JsonNode& item : node.array()) {
        elements.push_back(readElement(item));
    }
    return elements;
}

} // namespace orv::platform::sim
