// DSP0201 encoding of what providers return: instances, instance names and the path
// forms the operation responses need, read through the CMPI function tables.
#pragma once

#include <cmpidt.h>
#include <cmpift.h>

#include <functional>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "orv/cimxml/xml_writer.hpp"

namespace orv::cimxml {

// What the encoder may know about a property from the class declaration.
struct PropertyInfo {
    std::string classOrigin;     // CLASSORIGIN when asked for
    std::string referenceClass;  // REFERENCECLASS of reference properties
    bool propagated = false;
};

// Declaration lookup: (class name, property name) -> info; nullopt when unknown. The
// instance encoder asks only where the answer shows in the start tag: for reference
// properties (REFERENCECLASS) and when class origins are asked for.
using PropertyLookup =
    std::function<std::optional<PropertyInfo>(std::string_view className, std::string_view property)>;

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
    PropertyLookup lookup;  // may be empty
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
// The INSTANCE element alone, as text (the value of an embedded instance).
std::string instanceText(const CMPIInstance* instance);

// The class name of a path / an instance's path ("" when unknown).
std::string pathClassName(const CMPIObjectPath* path);
std::string instanceClassName(const CMPIInstance* instance);

}  // namespace orv::cimxml
