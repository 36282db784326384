#include "orv/cimxml/xml_tree.hpp"

#include "control_pictures.hpp"

#include <expat.h>

#include <climits>

namespace orv::cimxml {

const std::string* XmlElement::attribute(std::string_view key) const noexcept {
    for (const auto& [attrName, value] : attributes) {
        if (attrName == key) {
            return &value;
        }
    }
    return nullptr;
}

const XmlElement* XmlElement::child(std::string_view childName) const noexcept {
    for (const auto& element : children) {
        if (element->name == childName) {
            return element.get();
        }
    }
    return nullptr;
}

namespace {

// State shared with expat's callbacks while one document is read.
class TreeBuilder {
public:
    TreeBuilder(XML_Parser parser, const XmlLimits& limits) : parser_(parser), limits_(limits) {}

    void start(const XML_Char* name, const XML_Char** attrs) {
        if (stack_.size() >= limits_.maxDepth) {
            fail("elements nested too deeply");
            return;
        }
        if (++elementCount_ > limits_.maxElements) {
            fail("too many elements");
            return;
        }
        auto element = std::make_unique<XmlElement>();
        element->name = name;
        element->line = static_cast<int>(XML_GetCurrentLineNumber(parser_));
        for (std::size_t i = 0; attrs[i] != nullptr; i += 2) {
            element->attributes.emplace_back(attrs[i], fromControlPictures(attrs[i + 1]));
        }
        XmlElement* raw = element.get();
        if (stack_.empty()) {
            root_ = std::move(element);
        } else {
            stack_.back()->children.push_back(std::move(element));
        }
        stack_.push_back(raw);
    }

    void end() {
        // After a stop expat may still report the end of the element whose start was refused.
        if (error_.empty() && !stack_.empty()) {
            std::string& text = stack_.back()->text;
            if (text.find('\xE2') != std::string::npos) {
                text = fromControlPictures(text);
            }
            stack_.pop_back();
        }
    }

    void characters(const XML_Char* text, int length) {
        if (error_.empty() && !stack_.empty()) {
            stack_.back()->text.append(text, static_cast<std::size_t>(length));
        }
    }

    void fail(const char* why) {
        error_ = why;
        XML_StopParser(parser_, XML_FALSE);
    }

    const std::string& error() const noexcept { return error_; }
    std::unique_ptr<XmlElement> takeRoot() { return std::move(root_); }

private:
    XML_Parser parser_;
    const XmlLimits& limits_;
    std::unique_ptr<XmlElement> root_;
    std::vector<XmlElement*> stack_;
    std::size_t elementCount_ = 0;
    std::string error_;
};

void XMLCALL onStart(void* data, const XML_Char* name, const XML_Char** attrs) {
    static_cast<TreeBuilder*>(data)->start(name, attrs);
}

void XMLCALL onEnd(void* data, const XML_Char* /*name*/) {
    static_cast<TreeBuilder*>(data)->end();
}

void XMLCALL onCharacters(void* data, const XML_Char* text, int length) {
    static_cast<TreeBuilder*>(data)->characters(text, length);
}

// Entity declarations are how XML bombs are built; requests never need them.
void XMLCALL onEntityDecl(void* data, const XML_Char*, int, const XML_Char*, int, const XML_Char*,
                          const XML_Char*, const XML_Char*, const XML_Char*) {
    static_cast<TreeBuilder*>(data)->fail("entity declarations are not accepted");
}

struct ParserDeleter {
    void operator()(XML_ParserStruct* parser) const noexcept { XML_ParserFree(parser); }
};

}  // namespace

std::unique_ptr<XmlElement> parseXmlDocument(std::string_view document, const XmlLimits& limits) {
    if (document.size() > static_cast<std::size_t>(INT_MAX)) {
        throw XmlSyntaxError("document too large");
    }
    std::unique_ptr<XML_ParserStruct, ParserDeleter> parser(XML_ParserCreate("UTF-8"));
    if (!parser) {
        throw std::bad_alloc();
    }
    TreeBuilder builder(parser.get(), limits);
    XML_SetUserData(parser.get(), &builder);
    XML_SetElementHandler(parser.get(), onStart, onEnd);
    XML_SetCharacterDataHandler(parser.get(), onCharacters);
    XML_SetEntityDeclHandler(parser.get(), onEntityDecl);
    XML_SetParamEntityParsing(parser.get(), XML_PARAM_ENTITY_PARSING_NEVER);

    const XML_Status status =
        XML_Parse(parser.get(), document.data(), static_cast<int>(document.size()), XML_TRUE);
    if (!builder.error().empty()) {
        throw XmlSyntaxError(builder.error());
    }
    if (status != XML_STATUS_OK) {
        throw XmlSyntaxError("line " + std::to_string(XML_GetCurrentLineNumber(parser.get())) + ": " +
                             XML_ErrorString(XML_GetErrorCode(parser.get())));
    }
    auto root = builder.takeRoot();
    if (!root) {
        throw XmlSyntaxError("no root element");
    }
    return root;
}

}  // namespace orv::cimxml
