// DSP0201 encoding of what providers return: instances, instance names and the path
// forms the operation responses need, read through the CMPI function tables.
#pragma once

#include <cmpidt.h>
#include <cmpift.h>

#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "orv/cimxml/xml_writer.hpp"
#include "orv/repository/class_repository.hpp"

namespace orv::cimxml {

// Where the instance encoder reads property declarations, for what they add to a
// property's start tag (REFERENCECLASS of a reference, CLASSORIGIN when asked for): the
// classes of one namespace of a repository. The class most instances of an answer have
// is looked up once, ahead; other classes per instance.
class ClassDeclarations {
public:
    // None: start tags carry what the values show.
    ClassDeclarations() = default;
    // `classes` must outlive this.
    ClassDeclarations(const repository::ClassRepository& classes, std::string nameSpace,
                      std::string_view expectedClass = {});

    explicit operator bool() const noexcept { return classes_ != nullptr; }
    // The class named so (any case) in the namespace, or nullptr.
    const repository::ClassDecl* find(std::string_view className) const noexcept;

private:
    const repository::ClassRepository* classes_ = nullptr;
    std::string nameSpace_;
    const repository::ClassDecl* expected_ = nullptr;
};

// How NULL elements of an array value are sent. DSP0201 writes each as a
// VALUE.NULL inside VALUE.ARRAY, which wbemcli 1.6 and pywbem cannot read;
// sfcb leaves them out (the elements after them move up), which both read.
enum class ArrayNullElements {
    Drop,       // as sfcb: only the non-NULL elements, in order
    ValueNull,  // as DSP0201: a VALUE.NULL per NULL element
};

struct InstanceEncoding {
    bool includeClassOrigin = false;
    ArrayNullElements arrayNullElements = ArrayNullElements::Drop;
    // Properties to keep (any case); nullopt keeps every property.
    std::optional<std::vector<std::string>> propertyList;
    ClassDeclarations declarations;  // may be none
};

// Where a path lacks a host or namespace, INSTANCEPATH uses these.
struct PathDefaults {
    std::string host;
    std::string nameSpace;
};

// <CLASSPATH><NAMESPACEPATH><HOST/><LOCALNAMESPACEPATH/></NAMESPACEPATH><CLASSNAME/>.
void writeClassPath(XmlWriter& out, std::string_view host, std::string_view nameSpace, std::string_view className);
// <INSTANCENAME CLASSNAME=...> with one KEYBINDING per key.
void writeInstanceName(XmlWriter& out, const CMPIObjectPath* path);
// <INSTANCEPATH><NAMESPACEPATH><HOST/><LOCALNAMESPACEPATH/></NAMESPACEPATH><INSTANCENAME/>.
void writeInstancePath(XmlWriter& out, const CMPIObjectPath* path, const PathDefaults& defaults);
// <VALUE.REFERENCE> with INSTANCEPATH when the path has a host, LOCALINSTANCEPATH when it
// has only a namespace, else INSTANCENAME.
void writeValueReference(XmlWriter& out, const CMPIObjectPath* path);
// <INSTANCE CLASSNAME=...> with its properties.
void writeInstance(XmlWriter& out, const CMPIInstance* instance, const InstanceEncoding& encoding);
// The same where the class name is known (that of the instance's path).
void writeInstance(XmlWriter& out, const CMPIInstance* instance, std::string_view className,
                   const InstanceEncoding& encoding);
// <VALUE.NAMEDINSTANCE>: INSTANCENAME and INSTANCE.
void writeNamedInstance(XmlWriter& out, const CMPIInstance* instance, const InstanceEncoding& encoding);
// `element` (VALUE.OBJECTWITHPATH, VALUE.INSTANCEWITHPATH) holding INSTANCEPATH and INSTANCE.
void writeInstanceWithPath(XmlWriter& out, std::string_view element, const CMPIInstance* instance,
                           const PathDefaults& defaults, const InstanceEncoding& encoding);
// The INSTANCE element alone, as text (the value of an embedded instance).
std::string instanceText(const CMPIInstance* instance);

// The class name of a path / an instance's path ("" when unknown).
std::string pathClassName(const CMPIObjectPath* path);
// The same without a copy, valid while the path is.
std::string_view pathClassChars(const CMPIObjectPath* path);
std::string instanceClassName(const CMPIInstance* instance);

}  // namespace orv::cimxml
