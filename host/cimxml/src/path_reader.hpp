// Readers of the DSP0201 elements that name objects and carry values, shared by the
// request parser's IPARAMVALUE and PARAMVALUE handling. Malformed content throws
// ProtocolError(NotValid).
#pragma once

#include <optional>
#include <string>
#include <vector>

#include "orv/cimxml/request.hpp"
#include "orv/cimxml/xml_tree.hpp"

namespace orv::cimxml::detail {

[[noreturn]] void invalid(const XmlElement& at, const std::string& why);
std::string_view requireAttribute(const XmlElement& element, const char* name);
// Throws unless the element has this name.
void expectName(const XmlElement& element, const char* name);
// The only child element; throws when there are none or several.
const XmlElement& onlyChild(const XmlElement& element);

// NAMESPACE children of a LOCALNAMESPACEPATH joined with '/'.
std::string readLocalNamespacePath(const XmlElement& element);
ObjectPathModel readInstanceName(const XmlElement& element);
// VALUE.REFERENCE, or any of the path elements it may hold.
ObjectPathModel readObjectPath(const XmlElement& element);
InstanceModel readInstance(const XmlElement& element);
std::vector<std::optional<std::string>> readValueArray(const XmlElement& element);

// Parameter values that only some operations take (object_readers.cpp).
ClassParam readClass(const XmlElement& element);
QualifierDeclarationParam readQualifierDeclaration(const XmlElement& element);
RefArrayParam readRefArray(const XmlElement& element);

}  // namespace orv::cimxml::detail
