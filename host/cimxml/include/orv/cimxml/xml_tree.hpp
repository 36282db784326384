// A read-only element tree built from an XML document with expat.
//
// CIM-XML requests are small and their meaning depends on nesting, so the parser
// first builds the whole tree (within limits) and the request reader walks it.
#pragma once

#include <cstddef>
#include <memory>
#include <stdexcept>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace orv::cimxml {

struct XmlElement {
    std::string name;
    std::vector<std::pair<std::string, std::string>> attributes;
    // The elements inside this one; all elements of a document live in its root's
    // node store and go with the root.
    std::vector<XmlElement*> children;
    std::string text;  // character data directly inside this element
    int line = 0;

    XmlElement();
    ~XmlElement();
    XmlElement(const XmlElement&) = delete;
    XmlElement& operator=(const XmlElement&) = delete;

    // The attribute's value, or nullptr when absent.
    const std::string* attribute(std::string_view key) const noexcept;
    // The first child element with this name, or nullptr.
    const XmlElement* child(std::string_view childName) const noexcept;

    // The elements below the root, allocated in a few blocks rather than one by one.
    class NodeStore;
    std::unique_ptr<NodeStore> nodes;  // set on a document's root only
};

struct XmlLimits {
    std::size_t maxDepth = 64;
    std::size_t maxElements = 200000;
};

// Not well-formed XML, or a document that goes beyond the limits or declares entities.
class XmlSyntaxError : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

// Parses a whole document; throws XmlSyntaxError.
std::unique_ptr<XmlElement> parseXmlDocument(std::string_view document, const XmlLimits& limits = {});

}  // namespace orv::cimxml
