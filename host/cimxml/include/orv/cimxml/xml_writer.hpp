// A small streaming XML writer: elements, attributes and escaped text into a buffer.
#pragma once

#include <cstring>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

namespace orv::cimxml {

namespace detail {
// The most one byte becomes when escaped ("&quot;").
inline constexpr std::size_t kMaxEscapedBytesPerByte = 6;
// Text longer than this is escaped in pieces, so that the room made for the worst case
// stays small.
inline constexpr std::size_t kEscapePiece = 4096;
// Writes `text` escaped (as escapeXml) to `out`, which has room for
// kMaxEscapedBytesPerByte bytes per byte of it; returns the end of what it wrote.
char* escapeInto(char* out, std::string_view text) noexcept;
}  // namespace detail

// Text with &, <, >, " and ' replaced by entity references, tab, line feed and carriage
// return as character references, and the control characters XML 1.0 cannot carry at
// all written as their Unicode control pictures (U+2401..U+241F), which the host's
// reader turns back into them (src/control_pictures.hpp).
std::string escapeXml(std::string_view text);
// The same, appended to `out`.
void appendEscapedXml(std::string& out, std::string_view text);

class XmlWriter {
public:
    // Starts <name ...>; attributes may follow until content or close().
    XmlWriter& open(std::string_view name);
    XmlWriter& attr(std::string_view name, std::string_view value);
    XmlWriter& text(std::string_view value) {
        finishStartTag();
        appendEscaped(value);
        return *this;
    }
    // Closes the innermost open element with an end tag.
    XmlWriter& close();
    // An element holding only text: <name>text</name>.
    XmlWriter& leaf(std::string_view name, std::string_view value);
    // Markup that is already well formed, copied as it is (encoders write whole elements
    // of a fixed shape so, piece by piece).
    XmlWriter& raw(std::string_view markup) {
        finishStartTag();
        append(markup);
        return *this;
    }

    // Room for at most `bytes` more bytes of well-formed markup after a pending start tag
    // is finished: the encoders of fixed shapes write through the pointer without a check
    // per piece and hand the end of what they wrote back with commit().
    char* claim(std::size_t bytes) {
        finishStartTag();
        reserveMore(bytes);
        return buffer_.get() + used_;
    }
    void commit(const char* end) noexcept { used_ = static_cast<std::size_t>(end - buffer_.get()); }

    std::size_t depth() const noexcept { return openStarts_.size(); }
    std::size_t size() const noexcept { return used_; }
    std::string_view str() const noexcept { return {buffer_.get(), used_}; }
    std::string take();
    // The text written so far, leaving the writer inside the same open elements: what
    // follows continues the document (a response sent in pieces).
    std::string drain();

private:
    void finishStartTag() {
        if (startTagPending_) {
            append(">");
            startTagPending_ = false;
        }
    }
    // Makes room for `bytes` more bytes after the text.
    void reserveMore(std::size_t bytes) {
        if (capacity_ - used_ < bytes) {
            grow(bytes);
        }
    }
    void grow(std::size_t bytes);
    void append(std::string_view markup) {
        if (markup.empty()) {
            return;  // its data() may be null, which memcpy must not see
        }
        reserveMore(markup.size());
        std::memcpy(buffer_.get() + used_, markup.data(), markup.size());
        used_ += markup.size();
    }
    void appendEscaped(std::string_view text) {
        if (text.size() > detail::kEscapePiece) {
            appendEscapedInPieces(text);
            return;
        }
        reserveMore(text.size() * detail::kMaxEscapedBytesPerByte);
        char* const start = buffer_.get() + used_;
        used_ += static_cast<std::size_t>(detail::escapeInto(start, text) - start);
    }
    void appendEscapedInPieces(std::string_view text);
    void popName();

    // The document is the first used_ bytes; the rest of the capacity_ bytes is room to
    // write into, never read (and never filled in advance).
    std::unique_ptr<char[]> buffer_;
    std::size_t capacity_ = 0;
    std::size_t used_ = 0;
    // The names of the open elements, one after the other, and where each starts: no
    // allocation per element once the writer has grown.
    std::string openNames_;
    std::vector<std::size_t> openStarts_;
    bool startTagPending_ = false;
};

}  // namespace orv::cimxml
