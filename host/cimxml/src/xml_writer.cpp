#include "orv/cimxml/xml_writer.hpp"

#include <cstdio>
#include <stdexcept>

#include "control_pictures.hpp"

namespace orv::cimxml {

namespace {

void appendCharacterReference(std::string& out, unsigned char c) {
    char buffer[8];
    std::snprintf(buffer, sizeof buffer, "&#%u;", static_cast<unsigned>(c));
    out += buffer;
}

}  // namespace

std::string escapeXml(std::string_view text) {
    std::string out;
    out.reserve(text.size());
    for (char c : text) {
        switch (c) {
            case '&': out += "&amp;"; break;
            case '<': out += "&lt;"; break;
            case '>': out += "&gt;"; break;
            case '"': out += "&quot;"; break;
            case '\'': out += "&apos;"; break;
            case '\t':
            case '\n':
            case '\r': appendCharacterReference(out, static_cast<unsigned char>(c)); break;
            default:
                if (needsControlPicture(static_cast<unsigned char>(c))) {
                    appendControlPicture(out, static_cast<unsigned char>(c));
                    break;
                }
                out += c;
        }
    }
    return out;
}

XmlWriter& XmlWriter::open(std::string_view name) {
    finishStartTag();
    out_ += '<';
    out_ += name;
    open_.emplace_back(name);
    startTagPending_ = true;
    return *this;
}

XmlWriter& XmlWriter::attr(std::string_view name, std::string_view value) {
    if (!startTagPending_) {
        throw std::logic_error("XmlWriter: attribute outside a start tag");
    }
    out_ += ' ';
    out_ += name;
    out_ += "=\"";
    out_ += escapeXml(value);
    out_ += '"';
    return *this;
}

XmlWriter& XmlWriter::text(std::string_view value) {
    finishStartTag();
    out_ += escapeXml(value);
    return *this;
}

XmlWriter& XmlWriter::close() {
    if (open_.empty()) {
        throw std::logic_error("XmlWriter: close without an open element");
    }
    // Always an explicit end tag: some CIM-XML clients do not read empty-element tags.
    finishStartTag();
    out_ += "</";
    out_ += open_.back();
    out_ += '>';
    open_.pop_back();
    return *this;
}

XmlWriter& XmlWriter::leaf(std::string_view name, std::string_view value) {
    open(name);
    finishStartTag();
    text(value);
    out_ += "</";
    out_ += name;
    out_ += '>';
    open_.pop_back();
    return *this;
}

XmlWriter& XmlWriter::raw(std::string_view markup) {
    finishStartTag();
    out_ += markup;
    return *this;
}

std::string XmlWriter::take() {
    std::string result;
    result.swap(out_);
    open_.clear();
    startTagPending_ = false;
    return result;
}

void XmlWriter::finishStartTag() {
    if (startTagPending_) {
        out_ += '>';
        startTagPending_ = false;
    }
}

}  // namespace orv::cimxml
