// Strict reading of fixture JSON: every value is checked for its type and
// range, every object for unknown keys, and every problem names the JSON path.
#pragma once

#include <nlohmann/json.hpp>

#include <cstdint>
#include <functional>
#include <optional>
#include <set>
#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

namespace orv::platform::sim {

// A problem at one place of a fixture.
class FixtureError : public std::runtime_error {
public:
    FixtureError(std::string path, const std::string& problem)
        : std::runtime_error(path + ": " + problem), path_(std::move(path))
    {
    }
    const std::string& path() const { return path_; }

private:
    std::string path_;
};

class JsonObject;

// One JSON value and where it sits ("$.nics[2].speed").
class JsonNode {
public:
    JsonNode(const nlohmann::json& value, std::string path) : value_(&value), path_(std::move(path)) {}

    const std::string& path() const { return path_; }
    bool isNull() const { return value_->is_null(); }
    bool isString() const { return value_->is_string(); }
    bool isBoolean() const { return value_->is_boolean(); }
    [[noreturn]] void fail(const std::string& problem) const;

    bool boolean() const;
    // An integer in [min, max].
    int64_t integer(int64_t min, int64_t max) const;
    uint64_t unsignedInteger(uint64_t max) const;
    // An integer or a "0x..." hexadecimal string, at most 32 bits.
    uint32_t register32() const;
    // A string of at most maxLength bytes (and non-empty when required).
    std::string text(size_t maxLength, bool nonEmpty = false) const;
    std::vector<JsonNode> array() const;
    JsonObject object() const;
    // One of the names (answering its value) or any integer in [min, max].
    int64_t enumerator(const std::vector<std::pair<const char*, int64_t>>& names, int64_t min, int64_t max) const;

private:
    std::string describe() const;

    const nlohmann::json* value_;
    std::string path_;
};

// A JSON object whose keys are taken one by one; finish() rejects the rest.
class JsonObject {
public:
    JsonObject(const nlohmann::json& value, std::string path) : value_(&value), path_(std::move(path)) {}

    JsonNode required(const char* key);
    std::optional<JsonNode> optional(const char* key);
    // An optional key whose null value means the same as its absence.
    std::optional<JsonNode> optionalNonNull(const char* key);
    void finish() const;
    // Every key, for objects whose keys are names chosen by the fixture.
    std::vector<std::string> keys() const;
    const std::string& path() const { return path_; }

private:
    const nlohmann::json* value_;
    std::string path_;
    std::set<std::string> taken_;
};

} // namespace orv::platform::sim
