#include "orv/cimxml/xml_writer.hpp"

#include <algorithm>
#include <cstring>
#include <memory>
#include <stdexcept>


namespace orv::cimxml {

using detail::escapeInto;
using detail::kEscapePiece;
using detail::kMaxEscapedBytesPerByte;

void appendEscapedXml(std::string& out, std::string_view text) {
    const std::size_t start = out.size();
    out.resize(start + text.size() * kMaxEscapedBytesPerByte);
    out.resize(static_cast<std::size_t>(escapeInto(out.data() + start, text) - out.data()));
}

std::string escapeXml(std::string_view text) {
    std::string out;
    appendEscapedXml(out, text);
    return out;
}

void XmlWriter::grow(std::size_t bytes) {
    const std::size_t capacity = std::max({capacity_ * 2, used_ + bytes, std::size_t{256}});
    auto larger = std::make_unique_for_overwrite<char[]>(capacity);
    if (used_ != 0) {
        std::memcpy(larger.get(), buffer_.get(), used_);
    }
    buffer_ = std::move(larger);
    capacity_ = capacity;
}

void XmlWriter::appendEscapedInPieces(std::string_view text) {
    while (!text.empty()) {
        const std::string_view piece = text.substr(0, kEscapePiece);
        appendEscaped(piece);
        text.remove_prefix(piece.size());
    }
}

XmlWriter& XmlWriter::open(std::string_view name) {
    finishStartTag();
    append("<");
    append(name);
    openStarts_.push_back(openNames_.size());
    openNames_ += name;
    startTagPending_ = true;
    return *this;
}

XmlWriter& XmlWriter::attr(std::string_view name, std::string_view value) {
    if (!startTagPending_) {
        throw std::logic_error("XmlWriter: attribute outside a start tag");
    }
    append(" ");
    append(name);
    append("=\"");
    appendEscaped(value);
    append("\"");
    return *this;
}

XmlWriter& XmlWriter::close() {
    if (openStarts_.empty()) {
        throw std::logic_error("XmlWriter: close without an open element");
    }
    // Always an explicit end tag: some CIM-XML clients do not read empty-element tags.
    finishStartTag();
    append("</");
    append(std::string_view(openNames_).substr(openStarts_.back()));
    append(">");
    popName();
    return *this;
}

XmlWriter& XmlWriter::leaf(std::string_view name, std::string_view value) {
    finishStartTag();
    append("<");
    append(name);
    append(">");
    appendEscaped(value);
    append("</");
    append(name);
    append(">");
    return *this;
}

std::string XmlWriter::take() {
    std::string result(str());
    used_ = 0;
    openNames_.clear();
    openStarts_.clear();
    startTagPending_ = false;
    return result;
}

std::string XmlWriter::drain() {
    std::string text(str());
    used_ = 0;
    return text;
}

void XmlWriter::popName() {
    openNames_.resize(openStarts_.back());
    openStarts_.pop_back();
}

}  // namespace orv::cimxml
