#include "mof_lexer.hpp"

#include <cerrno>
#include <cstdlib>
#include <limits>

#include "orv/repository/errors.hpp"
#include "text.hpp"

namespace orv::repository::mof {
namespace {

bool isDigit(char c) noexcept { return c >= '0' && c <= '9'; }
bool isIdentStart(char c) noexcept {
    return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || c == '_' ||
           static_cast<unsigned char>(c) >= 0x80;
}
bool isIdentChar(char c) noexcept { return isIdentStart(c) || isDigit(c); }

int hexDigit(char c) noexcept {
    if (isDigit(c)) {
        return c - '0';
    }
    const char l = text::lower(c);
    return (l >= 'a' && l <= 'f') ? l - 'a' + 10 : -1;
}

// Value of `digits` in `base`; false on overflow or a digit outside the base.
bool accumulate(std::string_view digits, unsigned base, std::uint64_t& out) noexcept {
    out = 0;
    for (char c : digits) {
        const int d = hexDigit(c);
        if (d < 0 || static_cast<unsigned>(d) >= base) {
            return false;
        }
        if (out > (std::numeric_limits<std::uint64_t>::max() - static_cast<unsigned>(d)) / base) {
            return false;
        }
        out = out * base + static_cast<unsigned>(d);
    }
    return true;
}

}  // namespace

bool Token::isWord(std::string_view word) const noexcept {
    return kind == TokenKind::Identifier && text::iequals(spelling, word);
}

Lexer::Lexer(std::string_view source, std::string fileName)
    : src_(source), file_(std::move(fileName)) {}

void Lexer::fail(const std::string& message) const {
    throw MofError(file_, line_, message);
}

void Lexer::skipBlanksAndComments() {
    while (!atEnd()) {
        const char c = peek();
        if (c == '\n') {
            ++line_;
            ++pos_;
        } else if (c == ' ' || c == '\t' || c == '\r' || c == '\f' || c == '\v') {
            ++pos_;
        } else if (c == '/' && peek(1) == '/') {
            while (!atEnd() && peek() != '\n') {
                ++pos_;
            }
        } else if (c == '/' && peek(1) == '*') {
            const int startLine = line_;
            pos_ += 2;
            while (!(peek() == '*' && peek(1) == '/')) {
                if (atEnd()) {
                    throw MofError(file_, startLine, "unterminated comment");
                }
                line_ += peek() == '\n' ? 1 : 0;
                ++pos_;
            }
            pos_ += 2;
        } else {
            return;
        }
    }
}

Token Lexer::next() {
    skipBlanksAndComments();
    if (atEnd()) {
        Token t;
        t.line = line_;
        return t;
    }
    const char c = peek();
    if (isIdentStart(c)) {
        return lexIdentifier();
    }
    if (isDigit(c) || ((c == '-' || c == '+') && (isDigit(peek(1)) || peek(1) == '.')) ||
        (c == '.' && isDigit(peek(1)))) {
        return lexNumber();
    }
    if (c == '"') {
        return lexString();
    }
    if (c == '\'') {
        return lexChar();
    }
    if (std::string_view("{}()[];,:=#").find(c) != std::string_view::npos) {
        Token t;
        t.kind = TokenKind::Punct;
        t.line = line_;
        t.spelling = src_.substr(pos_++, 1);
        return t;
    }
    fail(std::string("unexpected character '") + c + "'");
}

Token Lexer::lexIdentifier() {
    Token t;
    t.kind = TokenKind::Identifier;
    t.line = line_;
    const std::size_t start = pos_;
    while (!atEnd() && isIdentChar(peek())) {
        ++pos_;
    }
    t.spelling = src_.substr(start, pos_ - start);
    return t;
}

Token Lexer::lexNumber() {
    Token t;
    t.line = line_;
    const std::size_t start = pos_;
    if (peek() == '-' || peek() == '+') {
        t.negative = peek() == '-';
        ++pos_;
    }
    const std::size_t digitsStart = pos_;
    while (!atEnd() && (isIdentChar(peek()) || peek() == '.' ||
                        ((peek() == '-' || peek() == '+') && text::lower(src_[pos_ - 1]) == 'e' &&
                         src_.substr(digitsStart, pos_ - digitsStart).find('.') !=
                             std::string_view::npos))) {
        ++pos_;
    }
    t.spelling = src_.substr(start, pos_ - start);
    const std::string_view body = src_.substr(digitsStart, pos_ - digitsStart);
    if (body.find('.') != std::string_view::npos) {
        t.kind = TokenKind::Real;
        const std::string copy(t.spelling);
        char* end = nullptr;
        errno = 0;
        t.real = std::strtod(copy.c_str(), &end);
        if (end != copy.c_str() + copy.size() || errno == ERANGE) {
            fail("malformed real literal '" + copy + "'");
        }
        return t;
    }
    t.kind = TokenKind::Integer;
    bool ok = false;
    if (body.size() > 2 && body[0] == '0' && text::lower(body[1]) == 'x') {
        ok = accumulate(body.substr(2), 16, t.magnitude);
    } else if (body.size() > 1 && text::lower(body.back()) == 'b') {
        ok = accumulate(body.substr(0, body.size() - 1), 2, t.magnitude);
    } else if (body.size() > 1 && body[0] == '0') {
        ok = accumulate(body.substr(1), 8, t.magnitude);
    } else {
        ok = accumulate(body, 10, t.magnitude);
    }
    if (!ok) {
        fail("malformed integer literal '" + std::string(t.spelling) + "'");
    }
    return t;
}

char32_t Lexer::lexEscape() {
    ++pos_;  // the backslash
    const char c = peek();
    ++pos_;
    switch (c) {
        case 'b': return U'\b';
        case 't': return U'\t';
        case 'n': return U'\n';
        case 'f': return U'\f';
        case 'r': return U'\r';
        case '"': return U'"';
        case '\'': return U'\'';
        case '\\': return U'\\';
        case 'x':
        case 'X': {
            char32_t cp = 0;
            int count = 0;
            while (count < 4 && hexDigit(peek()) >= 0) {
                cp = cp * 16 + static_cast<char32_t>(hexDigit(peek()));
                ++pos_;
                ++count;
            }
            if (count == 0) {
                fail("expected hex digits after \\x");
            }
            return cp;
        }
        default:
            fail(std::string("unknown escape sequence '\\") + c + "'");
    }
}

Token Lexer::lexString() {
    Token t;
    t.kind = TokenKind::String;
    t.line = line_;
    const std::size_t start = pos_++;
    while (peek() != '"') {
        if (atEnd() || peek() == '\n') {
            throw MofError(file_, t.line, "unterminated string literal");
        }
        if (peek() == '\\') {
            text::appendUtf8(t.text, lexEscape());
        } else {
            t.text.push_back(src_[pos_++]);
        }
    }
    ++pos_;
    t.spelling = src_.substr(start, pos_ - start);
    return t;
}

Token Lexer::lexChar() {
    Token t;
    t.kind = TokenKind::Char16;
    t.line = line_;
    const std::size_t start = pos_++;
    char32_t cp = 0;
    if (peek() == '\\') {
        cp = lexEscape();
    } else if (!atEnd() && peek() != '\'' && peek() != '\n') {
        cp = static_cast<unsigned char>(src_[pos_++]);
    } else {
        fail("expected a character in char16 literal");
    }
    if (peek() != '\'') {
        fail("expected ' after char16 literal");
    }
    ++pos_;
    if (cp > 0xFFFF) {
        fail("char16 literal out of range");
    }
    t.ch = static_cast<char16_t>(cp);
    t.spelling = src_.substr(start, pos_ - start);
    return t;
}

}  // namespace orv::repository::mof
