#include "broker_answers.hpp"

#include <algorithm>
#include <cctype>
#include <optional>
#include <regex>
#include <sstream>

namespace orv::e2e {

namespace {

// Splits at commas outside double quotes (a backslash escapes the next character).
std::vector<std::string> splitTopLevel(const std::string& text) {
    std::vector<std::string> parts(1);
    bool quoted = false;
    for (std::size_t i = 0; i < text.size(); ++i) {
        const char c = text[i];
        if (c == '\\' && i + 1 < text.size()) {
            parts.back() += c;
            parts.back() += text[++i];
            continue;
        }
        if (c == '"') {
            quoted = !quoted;
        }
        if (c == ',' && !quoted) {
            parts.emplace_back();
            continue;
        }
        parts.back() += c;
    }
    return parts;
}

// "namespace:Class." at the start of a value: a reference.
const std::regex kPathStart("^([A-Za-z0-9_][A-Za-z0-9_/]*:[A-Za-z0-9_]+)\\.(.*)$");
const std::regex kHostedPathStart("^([^/\" ]+/[A-Za-z0-9_/]+:[A-Za-z0-9_]+)\\.(.*)$");
// sfcb sends some references with an empty host: wbemcli prints "/ns:Class...".
const std::regex kEmptyHostPathStart("^/([A-Za-z0-9_/]+:[A-Za-z0-9_]+)\\.(.*)$");

std::string lowered(std::string text) {
    std::transform(text.begin(), text.end(), text.begin(), [](unsigned char c) { return std::tolower(c); });
    return text;
}

struct KeyBinding {
    std::string name;
    std::string value;
};

// The key bindings of a path's key part. A reference value swallows the
// bindings after it that are not references themselves: wbemcli prints
// references unquoted, so their keys follow at the same level.
std::vector<KeyBinding> keyBindings(const std::string& keys) {
    std::vector<KeyBinding> bindings;
    bool inReference = false;
    for (const std::string& token : splitTopLevel(keys)) {
        const std::size_t eq = token.find('=');
        const std::string name = token.substr(0, eq);
        const std::string value = eq == std::string::npos ? "" : token.substr(eq + 1);
        const bool reference = std::regex_match(value, kPathStart) || std::regex_match(value, kEmptyHostPathStart);
        if (!reference && inReference && !bindings.empty()) {
            bindings.back().value += "," + token;
            continue;
        }
        inReference = reference;
        bindings.push_back({name, value});
    }
    return bindings;
}

std::string sortedKeys(const std::string& keys) {
    std::vector<KeyBinding> bindings = keyBindings(keys);
    for (KeyBinding& binding : bindings) {
        binding.value = canonicalPath(binding.value);
    }
    std::sort(bindings.begin(), bindings.end(),
              [](const KeyBinding& a, const KeyBinding& b) { return lowered(a.name) < lowered(b.name); });
    std::string out;
    for (const KeyBinding& binding : bindings) {
        out += (out.empty() ? "" : ",") + binding.name + "=" + binding.value;
    }
    return out;
}

std::string scalarText(const orv::repository::Scalar& item) {
    if (const bool* b = std::get_if<bool>(&item)) {
        return *b ? "TRUE" : "FALSE";
    }
    if (const std::string* s = std::get_if<std::string>(&item)) {
        return "\"" + *s + "\"";
    }
    return orv::repository::scalarToText(item);
}

// The class part of a printed path ("host/ns:Class.keys"), or "" for other text.
std::string classOf(const std::string& path) {
    const std::size_t slash = path.find('/');
    const std::size_t colon = path.find(':', slash == std::string::npos ? 0 : slash);
    if (slash == std::string::npos || colon == std::string::npos) {
        return "";
    }
    return path.substr(colon + 1, path.find('.', colon) - colon - 1);
}

// The MOF default of a property of the class, in wbemcli's text, or nothing.
std::optional<std::string> mofDefault(const orv::repository::ClassRepository& classes, const std::string& path,
                                      const std::string& property) {
    const auto* decl = classes.getClass("root/cimv2", classOf(path));
    if (decl == nullptr) {
        return std::nullopt;
    }
    for (const auto& p : decl->properties) {
        if (lowered(p.name) == lowered(property) && !p.defaultValue.isNull()) {
            return wbemcliText(p.defaultValue);
        }
    }
    return std::nullopt;
}

std::string describe(const WbemcliObject& object) {
    std::string out = object.path + "\n";
    for (const auto& [name, value] : object.properties) {
        out += "  -" + name + "=" + value + "\n";
    }
    return out;
}

}  // namespace

std::string canonicalPath(const std::string& path) {
    std::smatch match;
    if (std::regex_match(path, match, kPathStart) || std::regex_match(path, match, kHostedPathStart) ||
        std::regex_match(path, match, kEmptyHostPathStart)) {
        return match[1].str() + "." + sortedKeys(match[2].str());
    }
    return path;
}

std::vector<WbemcliObject> parseWbemcliAnswer(const std::string& text) {
    std::vector<WbemcliObject> objects;
    std::istringstream lines(text);
    std::string line;
    while (std::getline(lines, line)) {
        if (line.empty()) {
            continue;
        }
        if (line[0] == '-' && !objects.empty()) {
            const std::size_t eq = line.find('=');
            const std::string name = line.substr(1, eq == std::string::npos ? std::string::npos : eq - 1);
            const std::string value = eq == std::string::npos ? "" : line.substr(eq + 1);
            objects.back().properties.emplace_back(name, canonicalPath(value));
            continue;
        }
        objects.push_back({canonicalPath(line), {}});
    }
    for (WbemcliObject& object : objects) {
        std::sort(object.properties.begin(), object.properties.end(),
                  [](const auto& a, const auto& b) { return lowered(a.first) < lowered(b.first); });
    }
    // An enumeration of a parent class visits the subclasses' providers in the
    // broker's own class order; each provider's objects keep their order.
    std::stable_sort(objects.begin(), objects.end(), [](const WbemcliObject& a, const WbemcliObject& b) {
        return classOf(a.path) < classOf(b.path);
    });
    return objects;
}

std::string wbemcliText(const orv::repository::Value& value) {
    if (value.isNull()) {
        return "";
    }
    if (!value.isArray()) {
        return scalarText(value.get());
    }
    std::string out;
    for (const auto& item : value.elements()) {
        out += (out.empty() ? "" : ",") + scalarText(item);
    }
    return out;
}

namespace {

// sfcb's object with the properties it filled itself taken out: those that
// orv-cimhost's object lacks and that are empty or hold the class's MOF default.
WbemcliObject withoutBrokerFill(WbemcliObject sfcb, const WbemcliObject& orv,
                                const orv::repository::ClassRepository& classes) {
    std::vector<std::pair<std::string, std::string>> kept;
    for (const auto& property : sfcb.properties) {
        const bool orvHasIt = std::any_of(orv.properties.begin(), orv.properties.end(),
                                          [&](const auto& p) { return lowered(p.first) == lowered(property.first); });
        if (!orvHasIt &&
            (property.second.empty() || mofDefault(classes, sfcb.path, property.first) == property.second)) {
            continue;
        }
        kept.push_back(property);
    }
    sfcb.properties = std::move(kept);
    return sfcb;
}

std::string difference(const std::vector<WbemcliObject>& orv, const std::vector<WbemcliObject>& sfcb,
                       const orv::repository::ClassRepository& classes) {
    if (orv.size() != sfcb.size()) {
        return std::to_string(orv.size()) + " objects from orv-cimhost, " + std::to_string(sfcb.size()) +
               " from sfcb";
    }
    for (std::size_t i = 0; i < orv.size(); ++i) {
        const WbemcliObject normalised = withoutBrokerFill(sfcb[i], orv[i], classes);
        if (normalised.path != orv[i].path || normalised.properties != orv[i].properties) {
            return "object " + std::to_string(i + 1) + " differs:\norv-cimhost:\n" + describe(orv[i]) +
                   "sfcb (normalised):\n" + describe(normalised);
        }
    }
    return "";
}

}  // namespace

std::string compareAnswers(const std::string& orvAnswer, const std::string& sfcbAnswer,
                           const orv::repository::ClassRepository& classes) {
    const std::string problem = difference(parseWbemcliAnswer(orvAnswer), parseWbemcliAnswer(sfcbAnswer), classes);
    if (problem.empty()) {
        return "";
    }
    return problem + "\n--- orv-cimhost answered:\n" + orvAnswer + "\n--- sfcb answered:\n" + sfcbAnswer;
}

}  // namespace orv::e2e
