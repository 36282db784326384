#include "orv/cimxml/request_params.hpp"

#include <strings.h>

#include "orv/cimxml/cim_status.hpp"

namespace orv::cimxml {

namespace {

bool sameName(std::string_view a, std::string_view b) {
    return a.size() == b.size() && strncasecmp(a.data(), b.data(), a.size()) == 0;
}

[[noreturn]] void wrongKind(std::string_view name, const char* expected) {
    throw CimError(CimStatus::InvalidParameter,
                   "parameter " + std::string(name) + " must be " + expected);
}

// The parameter's value of type T; nullptr when absent or null; throws for another kind.
template <typename T>
const T* typedParam(const CimRequest& request, std::string_view name, const char* expected) {
    const ParamValue* value = request.param(name);
    if (value == nullptr || std::holds_alternative<std::monostate>(*value)) {
        return nullptr;
    }
    const T* typed = std::get_if<T>(value);
    if (typed == nullptr) {
        wrongKind(name, expected);
    }
    return typed;
}

template <typename T>
const T& requiredParam(const CimRequest& request, std::string_view name, const char* expected) {
    const T* typed = typedParam<T>(request, name, expected);
    if (typed == nullptr) {
        throw CimError(CimStatus::InvalidParameter,
                       "missing parameter " + std::string(name));
    }
    return *typed;
}

}  // namespace

void checkParameterNames(const CimRequest& request, std::initializer_list<std::string_view> known) {
    for (const auto& [name, value] : request.params) {
        bool found = false;
        for (std::string_view candidate : known) {
            found = found || sameName(name, candidate);
        }
        if (!found) {
            throw CimError(CimStatus::InvalidParameter, "unknown parameter " + name);
        }
    }
}

bool boolParam(const CimRequest& request, std::string_view name, bool fallback) {
    const std::string* text = typedParam<std::string>(request, name, "a boolean VALUE");
    if (text == nullptr) {
        return fallback;
    }
    if (sameName(*text, "true")) {
        return true;
    }
    if (sameName(*text, "false")) {
        return false;
    }
    wrongKind(name, "TRUE or FALSE");
}

std::optional<std::string> stringParam(const CimRequest& request, std::string_view name) {
    const std::string* text = typedParam<std::string>(request, name, "a VALUE");
    return text == nullptr ? std::nullopt : std::optional<std::string>(*text);
}

std::optional<std::string> classNameParam(const CimRequest& request, std::string_view name) {
    const ClassNameParam* cls = typedParam<ClassNameParam>(request, name, "a CLASSNAME");
    return cls == nullptr ? std::nullopt : std::optional<std::string>(cls->name);
}

std::optional<std::vector<std::string>> propertyListParam(const CimRequest& request,
                                                          std::string_view name) {
    using List = std::vector<std::optional<std::string>>;
    const List* list = typedParam<List>(request, name, "a VALUE.ARRAY");
    if (list == nullptr) {
        return std::nullopt;
    }
    std::vector<std::string> names;
    for (const auto& item : *list) {
        if (!item) {
            wrongKind(name, "an array of property names without nulls");
        }
        names.push_back(*item);
    }
    return names;
}

const ObjectPathModel& instanceNameParam(const CimRequest& request, std::string_view name) {
    const auto& path = requiredParam<ObjectPathModel>(request, name, "an INSTANCENAME");
    if (path.keys.empty()) {
        wrongKind(name, "an INSTANCENAME with keys");
    }
    return path;
}

ObjectPathModel objectNameParam(const CimRequest& request, std::string_view name) {
    const ParamValue* value = request.param(name);
    if (value == nullptr || std::holds_alternative<std::monostate>(*value)) {
        throw CimError(CimStatus::InvalidParameter, "missing parameter " + std::string(name));
    }
    if (const auto* cls = std::get_if<ClassNameParam>(value)) {
        ObjectPathModel path;
        path.className = cls->name;
        return path;
    }
    if (const auto* path = std::get_if<ObjectPathModel>(value)) {
        return *path;
    }
    wrongKind(name, "a CLASSNAME or INSTANCENAME");
}

const InstanceModel& instanceParam(const CimRequest& request, std::string_view name) {
    return requiredParam<InstanceModel>(request, name, "an INSTANCE");
}

const NamedInstanceModel& namedInstanceParam(const CimRequest& request, std::string_view name) {
    return requiredParam<NamedInstanceModel>(request, name, "a VALUE.NAMEDINSTANCE");
}

}  // namespace orv::cimxml
