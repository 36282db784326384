#include "orv/cimxml/xml_writer.hpp"

#include <array>
#include <stdexcept>

#include "control_pictures.hpp"

namespace orv::cimxml {

namespace {

// What each byte becomes in text and attribute values: copied as it is, replaced by an
// entity or character reference, sent as its control picture (control_pictures.hpp), or
// dropped (NUL).
enum : unsigned char { kCopy = 0, kReplace = 1, kPicture = 2, kDrop = 3 };

constexpr std::array<unsigned char, 256> escapeTable() {
    std::array<unsigned char, 256> table{};
    table[0] = kDrop;
    for (unsigned c = 1; c < 0x20; ++c) {
        // Not representable in XML 1.0 even as a reference.
        table[c] = kPicture;
    }
    for (unsigned char c : {'&', '<', '>', '"', '\'', '\t', '\n', '\r'}) {
        table[c] = kReplace;
    }
    return table;
}

constexpr std::array<unsigned char, 256> kEscape = escapeTable();

std::string_view replacement(char c) {
    switch (c) {
        case '&': return "&amp;";
        case '<': return "&lt;";
        case '>': return "&gt;";
        case '"': return "&quot;";
        case '\'': return "&apos;";
        case '\t': return "&#9;";
        case '\n': return "&#10;";
        default: return "&#13;";
    }
}

}  // namespace

void appendEscapedXml(std::string& out, std::string_view text) {
    const char* run = text.data();
    const char* const end = run + text.size();
    for (const char* p = run; p != end; ++p) {
        const unsigned char kind = kEscape[static_cast<unsigned char>(*p)];
        if (kind == kCopy) {
            continue;
        }
        out.append(run, static_cast<std::size_t>(p - run));
        if (kind == kReplace) {
            out += replacement(*p);
        } else if (kind == kPicture) {
            appendControlPicture(out, static_cast<unsigned char>(*p));
        }
        run = p + 1;
    }
    out.append(run, static_cast<std::size_t>(end - run));
}

std::string escapeXml(std::string_view text) {
    std::string out;
    out.reserve(text.size());
    appendEscapedXml(out, text);
    return out;
}

XmlWriter& XmlWriter::open(std::string_view name) {
    finishStartTag();
    out_ += '<';
    out_ += name;
    openStarts_.push_back(openNames_.size());
    openNames_ += name;
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
    appendEscapedXml(out_, value);
    out_ += '"';
    return *this;
}

XmlWriter& XmlWriter::text(std::string_view value) {
    finishStartTag();
    appendEscapedXml(out_, value);
    return *this;
}

XmlWriter& XmlWriter::close() {
    if (openStarts_.empty()) {
        throw std::logic_error("XmlWriter: close without an open element");
    }
    // Always an explicit end tag: some CIM-XML clients do not read empty-element tags.
    finishStartTag();
    out_ += "</";
    out_.append(openNames_, openStarts_.back());
    out_ += '>';
    popName();
    return *this;
}

XmlWriter& XmlWriter::leaf(std::string_view name, std::string_view value) {
    finishStartTag();
    out_ += '<';
    out_ += name;
    out_ += '>';
    appendEscapedXml(out_, value);
    out_ += "</";
    out_ += name;
    out_ += '>';
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
    openNames_.clear();
    openStarts_.clear();
    startTagPending_ = false;
    return result;
}

std::string XmlWriter::drain() {
    std::string text;
    text.swap(out_);
    out_.reserve(text.capacity());
    return text;
}

void XmlWriter::popName() {
    openNames_.resize(openStarts_.back());
    openStarts_.pop_back();
}

void XmlWriter::finishStartTag() {
    if (startTagPending_) {
        out_ += '>';
        startTagPending_ = false;
    }
}

}  // namespace orv::cimxml
