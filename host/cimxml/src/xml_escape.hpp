// The escaping of text and attribute values, writing into a buffer the caller has sized.
#pragma once

#include <cstddef>
#include <string_view>

namespace orv::cimxml {

// The most one input byte can become ("&quot;").
inline constexpr std::size_t kMaxEscapedBytesPerByte = 6;

// Writes `text` to `out` with &, <, >, " and ' as entity references, tab, line feed and
// carriage return as character references, the other control characters XML 1.0 cannot
// carry as their control pictures and NUL dropped; returns the end of what it wrote.
// `out` must have room for kMaxEscapedBytesPerByte * text.size() bytes.
char* escapeInto(char* out, std::string_view text) noexcept;

}  // namespace orv::cimxml
