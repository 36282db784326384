#include "orv/cimxml/xml_writer.hpp"

#include <array>
#include <cstddef>
#include <cstdint>
#include <cstring>

#if defined(__SSE2__)
#include <emmintrin.h>
#endif

#include "control_pictures.hpp"

namespace orv::cimxml::detail {

namespace {

// What each byte becomes: copied as it is, replaced by an entity or character reference,
// sent as its control picture (control_pictures.hpp), or dropped (NUL).
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

std::string_view replacement(char c) noexcept {
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

// Writes what one byte that is not copied as it is becomes.
char* escapeByte(char* out, unsigned char c) noexcept {
    switch (kEscape[c]) {
        case kReplace: {
            const std::string_view text = replacement(static_cast<char>(c));
            std::memcpy(out, text.data(), text.size());
            return out + text.size();
        }
        case kPicture: return writeControlPicture(out, c);
        case kDrop: return out;
        default: *out = static_cast<char>(c); return out + 1;
    }
}

#if defined(__SSE2__)
// One bit per byte of the block that is not copied as it is: below 0x20, or one of
// & ' (0x26, 0x27: equal to 0x27 once bit 0 is set), < > (0x3C, 0x3E: 0x3E once bit 1
// is set) and ".
unsigned specialBytes(__m128i block) noexcept {
    const __m128i control = _mm_cmpeq_epi8(_mm_min_epu8(block, _mm_set1_epi8(0x1F)), block);
    const __m128i ampApos = _mm_cmpeq_epi8(_mm_or_si128(block, _mm_set1_epi8(0x01)), _mm_set1_epi8(0x27));
    const __m128i angles = _mm_cmpeq_epi8(_mm_or_si128(block, _mm_set1_epi8(0x02)), _mm_set1_epi8(0x3E));
    const __m128i quote = _mm_cmpeq_epi8(block, _mm_set1_epi8('"'));
    return static_cast<unsigned>(
        _mm_movemask_epi8(_mm_or_si128(_mm_or_si128(control, ampApos), _mm_or_si128(angles, quote))));
}
#endif

}  // namespace

#if defined(__SSE2__)
namespace {

std::uint64_t load8(const char* in) noexcept {
    std::uint64_t word;
    std::memcpy(&word, in, sizeof word);
    return word;
}

std::uint32_t load4(const char* in) noexcept {
    std::uint32_t word;
    std::memcpy(&word, in, sizeof word);
    return word;
}

// The last `rest` (1 to 15) bytes of a text, written as they are when none of them needs
// escaping; false, writing nothing, otherwise (the bytes are then taken one by one).
// Reads only inside the text: the last sixteen bytes of a longer text whose bytes before
// the rest were copied as they are (to `out - (16 - rest)` on), else two words that
// overlap in the middle.
bool copyPlainTail(char*& out, const char* in, std::size_t rest, bool sixteenBefore) noexcept {
    if (sixteenBefore) {
        const std::size_t back = 16 - rest;
        const __m128i block = _mm_loadu_si128(reinterpret_cast<const __m128i*>(in - back));
        if ((specialBytes(block) >> back) != 0) {
            return false;
        }
        _mm_storeu_si128(reinterpret_cast<__m128i*>(out - back), block);
    } else if (rest >= 8) {
        const std::uint64_t head = load8(in);
        const std::uint64_t tail = load8(in + rest - 8);
        if (specialBytes(_mm_set_epi64x(static_cast<long long>(tail), static_cast<long long>(head))) != 0) {
            return false;
        }
        std::memcpy(out, &head, 8);
        std::memcpy(out + rest - 8, &tail, 8);
    } else if (rest >= 4) {
        const std::uint32_t head = load4(in);
        const std::uint32_t tail = load4(in + rest - 4);
        const auto h = static_cast<int>(head);
        const auto t = static_cast<int>(tail);
        if (specialBytes(_mm_set_epi32(t, h, t, h)) != 0) {
            return false;
        }
        std::memcpy(out, &head, 4);
        std::memcpy(out + rest - 4, &tail, 4);
    } else {
        return false;
    }
    out += rest;
    return true;
}

}  // namespace
#endif

char* escapeInto(char* out, std::string_view text) noexcept {
    const char* in = text.data();
    const char* const end = in + text.size();
#if defined(__SSE2__)
    // Sixteen bytes at a time while as many remain: the block is stored as it is, and
    // where it holds a byte to escape, the bytes before it are kept and the rest is
    // read again after it. `plainFrom` is where the bytes copied as they are begin.
    const char* plainFrom = in;
    while (end - in >= 16) {
        const __m128i block = _mm_loadu_si128(reinterpret_cast<const __m128i*>(in));
        _mm_storeu_si128(reinterpret_cast<__m128i*>(out), block);
        const unsigned special = specialBytes(block);
        if (special == 0) {
            in += 16;
            out += 16;
            continue;
        }
        const auto plain = static_cast<unsigned>(__builtin_ctz(special));
        out = escapeByte(out + plain, static_cast<unsigned char>(in[plain]));
        in += plain + 1;
        plainFrom = in;
    }
    const auto rest = static_cast<std::size_t>(end - in);
    if (rest == 0 || copyPlainTail(out, in, rest, in - plainFrom >= static_cast<std::ptrdiff_t>(16 - rest))) {
        return out;
    }
#endif
    for (; in != end; ++in) {
        const auto c = static_cast<unsigned char>(*in);
        if (kEscape[c] == kCopy) {
            *out++ = static_cast<char>(c);
        } else {
            out = escapeByte(out, c);
        }
    }
    return out;
}

}  // namespace orv::cimxml::detail
