// Tokenizer for MOF text: identifiers, string / char16 / integer / real
// literals and punctuation, skipping blanks and // and /* */ comments.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>

namespace orv::repository::mof {

enum class TokenKind : std::uint8_t {
    End,
    Identifier,
    String,   // text holds the decoded value of one literal
    Char16,   // 'x'
    Integer,  // magnitude + negative
    Real,
    Punct,    // one of { } ( ) [ ] ; , : = #
};

struct Token {
    TokenKind kind = TokenKind::End;
    int line = 1;
    std::string_view spelling;  // the source text of the token
    std::string text;           // decoded string literal
    std::uint64_t magnitude = 0;
    bool negative = false;
    double real = 0.0;
    char16_t ch = 0;

    bool isPunct(char c) const noexcept {
        return kind == TokenKind::Punct && spelling.size() == 1 && spelling[0] == c;
    }
    bool isWord(std::string_view word) const noexcept;
};

class Lexer {
public:
    // Lexical errors throw MofError with this file name.
    Lexer(std::string_view source, std::string fileName);

    Token next();
    const std::string& fileName() const noexcept { return file_; }

private:
    [[noreturn]] void fail(const std::string& message) const;
    void skipBlanksAndComments();
    Token lexIdentifier();
    Token lexNumber();
    Token lexString();
    Token lexChar();
    char32_t lexEscape();
    bool atEnd() const noexcept { return pos_ >= src_.size(); }
    char peek(std::size_t ahead = 0) const noexcept {
        return pos_ + ahead < src_.size() ? src_[pos_ + ahead] : '\0';
    }

    std::string_view src_;
    std::string file_;
    std::size_t pos_ = 0;
    int line_ = 1;
};

}  // namespace orv::repository::mof
