// Pieces of markup written through a pointer into room claimed from an XmlWriter
// (XmlWriter::claim); the caller claims enough for all of them.
#pragma once

#include <cstring>
#include <string_view>

#include "orv/cimxml/xml_writer.hpp"

namespace orv::cimxml {

// Room `text` may need once escaped.
inline std::size_t escapedRoom(std::string_view text) noexcept {
    return text.size() * detail::kMaxEscapedBytesPerByte;
}

// Markup copied as it is (a literal, mostly: then the copy is a few moves).
inline char* put(char* at, std::string_view markup) noexcept {
    std::memcpy(at, markup.data(), markup.size());
    return at + markup.size();
}

inline char* putEscaped(char* at, std::string_view text) noexcept {
    return detail::escapeInto(at, text);
}

}  // namespace orv::cimxml
