#include <gtest/gtest.h>

#include <vector>

#include "mof_lexer.hpp"
#include "orv/repository/errors.hpp"

namespace orv::repository::mof {
namespace {

std::vector<Token> lexAll(std::string_view text) {
    Lexer lexer(text, "lex.mof");
    std::vector<Token> out;
    for (Token t = lexer.next(); t.kind != TokenKind::End; t = lexer.next()) {
        out.push_back(t);
    }
    return out;
}

std::string lexError(std::string_view text) {
    try {
        lexAll(text);
    } catch (const MofError& e) {
        return e.what();
    }
    return "no error";
}

TEST(MofLexer, SkipsLineAndBlockCommentsAndCountsLines) {
    const auto tokens = lexAll("// one\n/* two\nthree */ class\n// four\nA");
    ASSERT_EQ(tokens.size(), 2U);
    EXPECT_TRUE(tokens[0].isWord("CLASS"));
    EXPECT_EQ(tokens[0].line, 3);
    EXPECT_EQ(tokens[1].spelling, "A");
    EXPECT_EQ(tokens[1].line, 5);
}

TEST(MofLexer, DecodesEveryStringEscape) {
    const auto tokens = lexAll(R"("a\nb\tc\"d\\e\x41\X00e9\b\f\r\'")");
    ASSERT_EQ(tokens.size(), 1U);
    EXPECT_EQ(tokens[0].kind, TokenKind::String);
    EXPECT_EQ(tokens[0].text, "a\nb\tc\"d\\eA\xC3\xA9\b\f\r'");
}

TEST(MofLexer, ReadsIntegersInEveryBase) {
    const auto tokens = lexAll("42 0x1F 0X1f 1010b 1010B 017 0 -5 +7");
    ASSERT_EQ(tokens.size(), 9U);
    const std::uint64_t expected[] = {42, 31, 31, 10, 10, 15, 0, 5, 7};
    for (std::size_t i = 0; i < tokens.size(); ++i) {
        EXPECT_EQ(tokens[i].kind, TokenKind::Integer) << i;
        EXPECT_EQ(tokens[i].magnitude, expected[i]) << i;
    }
    EXPECT_TRUE(tokens[7].negative);
    EXPECT_FALSE(tokens[8].negative);
}

TEST(MofLexer, ReadsRealsWithExponents) {
    const auto tokens = lexAll("1.5 -0.25 .5 2.5e3 1.0E-2");
    ASSERT_EQ(tokens.size(), 5U);
    EXPECT_DOUBLE_EQ(tokens[0].real, 1.5);
    EXPECT_DOUBLE_EQ(tokens[1].real, -0.25);
    EXPECT_DOUBLE_EQ(tokens[2].real, 0.5);
    EXPECT_DOUBLE_EQ(tokens[3].real, 2500.0);
    EXPECT_DOUBLE_EQ(tokens[4].real, 0.01);
}

TEST(MofLexer, ReadsChar16Literals) {
    const auto tokens = lexAll(R"('a' '\n' '\x263A' '\'')");
    ASSERT_EQ(tokens.size(), 4U);
    EXPECT_EQ(tokens[0].ch, u'a');
    EXPECT_EQ(tokens[1].ch, u'\n');
    EXPECT_EQ(tokens[2].ch, u'\u263A');
    EXPECT_EQ(tokens[3].ch, u'\'');
}

TEST(MofLexer, PunctuationIsOneCharacterEach) {
    const auto tokens = lexAll("{}()[];,:=#");
    ASSERT_EQ(tokens.size(), 11U);
    EXPECT_TRUE(tokens[0].isPunct('{'));
    EXPECT_TRUE(tokens[10].isPunct('#'));
}

TEST(MofLexer, RejectsMalformedLiteralsWithLine) {
    EXPECT_EQ(lexError("\n\"open"), "lex.mof:2: unterminated string literal");
    EXPECT_EQ(lexError("/* never closed\n\n"), "lex.mof:1: unterminated comment");
    EXPECT_EQ(lexError("0x"), "lex.mof:1: malformed integer literal '0x'");
    EXPECT_EQ(lexError("012b9"), "lex.mof:1: malformed integer literal '012b9'");
    EXPECT_EQ(lexError("018"), "lex.mof:1: malformed integer literal '018'");
    EXPECT_EQ(lexError("99999999999999999999"),
              "lex.mof:1: malformed integer literal '99999999999999999999'");
    EXPECT_EQ(lexError(R"("\q")"), "lex.mof:1: unknown escape sequence '\\q'");
    EXPECT_EQ(lexError(R"("\x")"), "lex.mof:1: expected hex digits after \\x");
    EXPECT_EQ(lexError("'ab'"), "lex.mof:1: expected ' after char16 literal");
    EXPECT_EQ(lexError("\n\n@"), "lex.mof:3: unexpected character '@'");
}

}  // namespace
}  // namespace orv::repository::mof
