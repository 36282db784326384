#include "key_check.hpp"

#include <strings.h>

#include "orv/cimxml/cim_status.hpp"

namespace orv::cimhost::detail {

namespace {

using cimxml::CimError;
using cimxml::CimStatus;
using cimxml::KeyBindingModel;
using repository::CimType;

[[noreturn]] void refuse(const std::string& why) { throw CimError(CimStatus::InvalidParameter, why); }

bool sameName(const std::string& a, const std::string& b) { return strcasecmp(a.c_str(), b.c_str()) == 0; }

bool isNumeric(CimType type) {
    return repository::isUnsignedInteger(type) || repository::isSignedInteger(type) || repository::isReal(type);
}

// The VALUETYPE a key of this type is sent with.
KeyBindingModel::Kind kindOf(CimType type) {
    if (type == CimType::Boolean) {
        return KeyBindingModel::Kind::Boolean;
    }
    if (type == CimType::Reference) {
        return KeyBindingModel::Kind::Reference;
    }
    return isNumeric(type) ? KeyBindingModel::Kind::Numeric : KeyBindingModel::Kind::String;
}

const char* kindName(KeyBindingModel::Kind kind) {
    switch (kind) {
    case KeyBindingModel::Kind::Boolean: return "boolean";
    case KeyBindingModel::Kind::Numeric: return "numeric";
    case KeyBindingModel::Kind::Reference: return "a reference";
    case KeyBindingModel::Kind::String: break;
    }
    return "string";
}

// The start of every refusal about one key; built only when a key is refused.
std::string keyOfClass(const repository::ClassDecl& cls, const repository::PropertyDecl& declared) {
    return "key " + declared.name + " of class " + cls.name;
}

void checkKeyType(const repository::ClassDecl& cls, const repository::PropertyDecl& declared,
                  const KeyBindingModel& key) {
    const CimType type = declared.type.type;
    const std::string_view typeName = repository::cimTypeName(type);
    // A KEYVALUE without VALUETYPE reads as "string"; the text must then fit the type,
    // which the conversion to the declared type checks.
    if (key.kind != KeyBindingModel::Kind::String && key.kind != kindOf(type)) {
        refuse(keyOfClass(cls, declared) + " is a " + std::string(typeName) + ", not " + kindName(key.kind));
    }
    if (key.kind == KeyBindingModel::Kind::String && type == CimType::Reference) {
        refuse(keyOfClass(cls, declared) + " is a reference, not a string");
    }
    if (!key.type.empty() && (key.type.size() != typeName.size() ||
                              strncasecmp(key.type.data(), typeName.data(), typeName.size()) != 0)) {
        refuse(keyOfClass(cls, declared) + " is a " + std::string(typeName) + ", not a " + key.type);
    }
}

// The class's only key, for an INSTANCENAME that holds a bare KEYVALUE; nullptr
// when the class has none or several.
const repository::PropertyDecl* soleKey(const repository::ClassDecl& cls) {
    const repository::PropertyDecl* found = nullptr;
    for (const repository::PropertyDecl& property : cls.properties) {
        if (property.key) {
            if (found != nullptr) {
                return nullptr;
            }
            found = &property;
        }
    }
    return found;
}

}  // namespace

const repository::ClassDecl* checkInstanceName(const repository::ClassRepository& classes,
                                               std::string_view nameSpace, const cimxml::ObjectPathModel& model) {
    const std::string_view ns = model.nameSpace.empty() ? nameSpace : std::string_view(model.nameSpace);
    const repository::ClassDecl* cls = classes.getClass(ns, model.className);
    if (cls == nullptr) {
        return nullptr;
    }
    for (std::size_t i = 0; i < model.keys.size(); ++i) {
        const KeyBindingModel& key = model.keys[i];
        const repository::PropertyDecl* declared = key.name.empty() ? soleKey(*cls) : cls->findProperty(key.name);
        if (declared == nullptr || !declared->key) {
            refuse(key.name.empty() ? "class " + cls->name + " has no single key for an unnamed key value"
                                    : "class " + cls->name + " has no key " + key.name);
        }
        for (std::size_t j = 0; j < i; ++j) {
            if (sameName(model.keys[j].name, key.name)) {
                refuse("key " + declared->name + " is given twice");
            }
        }
        checkKeyType(*cls, *declared, key);
    }
    if (model.instance && model.keys.empty()) {
        for (const repository::PropertyDecl& property : cls->properties) {
            if (property.key) {
                refuse("the instance name of class " + cls->name + " has no keys");
            }
        }
    }
    return cls;
}

const repository::PropertyDecl* soleKeyOf(const repository::ClassDecl* cls) {
    return cls != nullptr ? soleKey(*cls) : nullptr;
}

}  // namespace orv::cimhost::detail
