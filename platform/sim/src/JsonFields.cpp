#include "JsonFields.h"

#include <cerrno>
#include <cstdlib>

namespace orv::platform::sim {

void JsonNode::fail(const std::string& problem) const
{
    throw FixtureError(path_, problem);
}

std::string JsonNode::describe() const
{
    std::string text = value_->dump();
    if (text.size() > 40) {
        text = text.substr(0, 37) + "...";
    }
    return std::string(value_->type_name()) + " " + text;
}

bool JsonNode::boolean() const
{
    if (!value_->is_boolean()) {
        fail("expected true or false, got " + describe());
    }
    return value_->get<bool>();
}

int64_t JsonNode::integer(int64_t min, int64_t max) const
{
    if (value_->is_number_unsigned()) {
        const uint64_t value = value_->get<uint64_t>();
        if (value > static_cast<uint64_t>(max)) {
            fail("value " + std::to_string(value) + " out of range [" + std::to_string(min) + ", " + std::to_string(max) + "]");
        }
        return static_cast<int64_t>(value);
    }
    if (!value_->is_number_integer()) {
        fail("expected an integer, got " + describe());
    }
    const int64_t value = value_->get<int64_t>();
    if (value < min || value > max) {
        fail("value " + std::to_string(value) + " out of range [" + std::to_string(min) + ", " + std::to_string(max) + "]");
    }
    return value;
}

uint64_t JsonNode::unsignedInteger(uint64_t max) const
{
    if (value_->is_number_integer() && !value_->is_number_unsigned()) {
        fail("value " + std::to_string(value_->get<int64_t>()) + " out of range [0, " + std::to_string(max) + "]");
    }
    if (!value_->is_number_unsigned()) {
        fail("expected an unsigned integer, got " + describe());
    }
    const uint64_t value = value_->get<uint64_t>();
    if (value > max) {
        fail("value " + std::to_string(value) + " out of range [0, " + std::to_string(max) + "]");
    }
    return value;
}

uint32_t JsonNode::register32() const
{
    if (!value_->is_string()) {
        return static_cast<uint32_t>(unsignedInteger(UINT32_MAX));
    }
    const std::string& text = value_->get_ref<const std::string&>();
    const bool hexPrefix = text.size() > 2 && text[0] == '0' && (text[1] == 'x' || text[1] == 'X');
    char* end = nullptr;
    errno = 0;
    const unsigned long long value = hexPrefix ? std::strtoull(text.c_str() + 2, &end, 16) : 0;
    if (!hexPrefix || *end != '\0' || errno != 0 || value > UINT32_MAX || text[2] == '-' || text[2] == '+') {
        fail("expected a 32-bit register as an integer or \"0x\" and hexadecimal digits, got \"" + text + "\"");
    }
    return static_cast<uint32_t>(value);
}

std::string JsonNode::text(size_t maxLength, bool nonEmpty) const
{
    if (!value_->is_string()) {
        fail("expected a string, got " + describe());
    }
    const std::string& value = value_->get_ref<const std::string&>();
    if (value.size() > maxLength) {
        fail("string of " + std::to_string(value.size()) + " bytes is longer than " + std::to_string(maxLength));
    }
    if (nonEmpty && value.empty()) {
        fail("must not be empty");
    }
    return value;
}

std::vector<JsonNode> JsonNode::array() const
{
    if (!value_->is_array()) {
        fail("expected an array, got " + describe());
    }
    std::vector<JsonNode> items;
    items.reserve(value_->size());
    for (size_t i = 0; i < value_->size(); ++i) {
        items.emplace_back((*value_)[i], path_ + "[" + std::to_string(i) + "]");
    }
    return items;
}

JsonObject JsonNode::object() const
{
    if (!value_->is_object()) {
        fail("expected an object, got " + describe());
    }
    return JsonObject(*value_, path_);
}

int64_t JsonNode::enumerator(const std::vector<std::pair<const char*, int64_t>>& names, int64_t min, int64_t max) const
{
    if (!value_->is_string()) {
        return integer(min, max);
    }
    const std::string& text = value_->get_ref<const std::string&>();
    for (const auto& [name, value] : names) {
        if (text == name) {
            return value;
        }
    }
    std::string known;
    for (const auto& entry : names) {
        known += (known.empty() ? "" : ", ") + std::string(entry.first);
    }
    fail("unknown name \"" + text + "\" (expected an integer or one of " + known + ")");
}

JsonNode JsonObject::required(const char* key)
{
    std::optional<JsonNode> node = optional(key);
    if (!node) {
        throw FixtureError(path_, std::string("missing required key \"") + key + "\"");
    }
    return *node;
}

std::optional<JsonNode> JsonObject::optional(const char* key)
{
    taken_.insert(key);
    auto found = value_->find(key);
    if (found == value_->end()) {
        return std::nullopt;
    }
    return JsonNode(*found, path_ + "." + key);
}

std::optional<JsonNode> JsonObject::optionalNonNull(const char* key)
{
    std::optional<JsonNode> node = optional(key);
    if (node && node->isNull()) {
        return std::nullopt;
    }
    return node;
}

std::vector<std::string> JsonObject::keys() const
{
    std::vector<std::string> names;
    for (auto it = value_->begin(); it != value_->end(); ++it) {
        names.push_back(it.key());
    }
    return names;
}

void JsonObject::finish() const
{
    for (auto it = value_->begin(); it != value_->end(); ++it) {
        if (taken_.count(it.key()) == 0) {
            throw FixtureError(path_, "unknown key \"" + it.key() + "\"");
        }
    }
}

} // namespace orv::platform::sim
