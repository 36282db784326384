// A read-only element tree built from an XML document with expat.
//
// CIM-XML requests are small and their meaning depends on nesting, so the parser
// first builds the whole tree (within limits) and the request reader walks it.
#pragma once

#include <cstddef>
#include <memory>
#include <span>
#include <stdexcept>
#include <string>
#include <string_view>

namespace orv::cimxml {

struct XmlAttribute {
    std::string_view name;
    std::string_view value;
};

// An element of a parsed document. Names, texts, attributes and child lists are views
// into the memory of the document's root: they live as long as the root.
struct XmlElement {
    std::string_view name;
    std::span<const XmlAttribute> attributes;
    std::span<const XmlElement* const> children;
    std::string_view text;  // character data directly inside this element
    int line = 0;

    XmlElement();
    ~XmlElement();
    XmlElement(const XmlElement&) = delete;
    XmlElement& operator=(const XmlElement&) = delete;

    // The attribute's value, or nullptr when absent.
    const std::string_view* attribute(std::string_view key) const noexcept;
    // The first child element with this name, or nullptr.
    const XmlElement* child(std::string_view childName) const noexcept;

    // The memory of a whole document: elements and their text, taken in a few blocks.
    class Arena;
    std::unique_ptr<Arena> arena;  // set on a document's root only
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
