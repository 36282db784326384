// A CIM-XML operation request as read from the wire, before any type is resolved
// against the class repository: values keep their text form.
#pragma once

#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <variant>
#include <vector>

namespace orv::cimxml {

struct ObjectPathModel;

// One key of an instance name. Reference keys hold the referenced path.
struct KeyBindingModel {
    enum class Kind { String, Boolean, Numeric, Reference };
    std::string name;
    Kind kind = Kind::String;
    std::string value;  // text for String / Boolean / Numeric
    std::string type;   // the optional TYPE attribute of KEYVALUE ("uint16", ...)
    std::shared_ptr<const ObjectPathModel> reference;
};

// A class or instance name, optionally with namespace and host.
struct ObjectPathModel {
    std::string host;
    std::string nameSpace;  // "root/cimv2"; empty when the path had none
    std::string className;
    std::vector<KeyBindingModel> keys;  // empty for a class path
    bool instance = false;              // read from an INSTANCENAME (even one without keys)
};

// One property of an instance sent by the client.
struct PropertyModel {
    enum class Kind { Scalar, Array, Reference };
    std::string name;
    Kind kind = Kind::Scalar;
    std::string type;            // TYPE attribute; empty for references
    std::string embeddedObject;  // EmbeddedObject / EMBEDDEDOBJECT attribute
    std::optional<std::string> value;                  // Scalar; nullopt: null
    std::optional<std::vector<std::optional<std::string>>> elements;  // Array; nullopt: null
    std::shared_ptr<const ObjectPathModel> reference;  // Reference; nullptr: null
};

struct InstanceModel {
    std::string className;
    std::vector<PropertyModel> properties;
};

struct NamedInstanceModel {
    ObjectPathModel path;
    InstanceModel instance;
};

struct ClassNameParam {
    std::string name;
};

// A CLASS sent as a parameter (CreateClass, ModifyClass): read for its form only,
// since this host does not change classes.
struct ClassParam {
    std::string name;
    std::string superClass;
};

// A QUALIFIER.DECLARATION sent as a parameter (SetQualifier): read for its form only.
struct QualifierDeclarationParam {
    std::string name;
    std::string type;
    bool isArray = false;
};

// A VALUE.REFARRAY; nullopt elements are VALUE.NULL.
struct RefArrayParam {
    std::vector<std::optional<ObjectPathModel>> items;
};

// The value of one IPARAMVALUE / PARAMVALUE, by the element it carried.
using ParamValue = std::variant<std::monostate,                         // no value (null)
                                std::string,                            // VALUE
                                std::vector<std::optional<std::string>>,  // VALUE.ARRAY
                                ClassNameParam,                         // CLASSNAME
                                ObjectPathModel,                        // INSTANCENAME / paths
                                InstanceModel,                          // INSTANCE
                                NamedInstanceModel,                     // VALUE.NAMEDINSTANCE
                                ClassParam,                             // CLASS
                                QualifierDeclarationParam,              // QUALIFIER.DECLARATION
                                RefArrayParam>;                         // VALUE.REFARRAY

struct CimRequest {
    std::string messageId;
    std::string protocolVersion;
    bool intrinsic = true;     // IMETHODCALL, or METHODCALL when false
    std::string methodName;    // as sent
    std::string nameSpace;     // NAMESPACE names joined with '/'
    ObjectPathModel target;    // METHODCALL only: the class or instance the method is called on
    std::vector<std::pair<std::string, ParamValue>> params;

    // The parameter named so (any case), or nullptr.
    const ParamValue* param(std::string_view name) const noexcept;
};

}  // namespace orv::cimxml
