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
