#include "query.hpp"

#include <cctype>
#include <cstdlib>

#include "names.hpp"

namespace orv::host::detail {

namespace {

struct Token {
    enum Kind { Word, Text, Number, Symbol, End } kind = End;
    std::string text;
};

class Lexer {
public:
    explicit Lexer(std::string_view text) : text_(text) {}

    Token next() {
        while (pos_ < text_.size() && std::isspace(static_cast<unsigned char>(text_[pos_])) != 0) {
            ++pos_;
        }
        if (pos_ >= text_.size()) {
            return {};
        }
        char c = text_[pos_];
        if (c == '\'' || c == '"') {
            return quoted(c);
        }
        if (std::isalpha(static_cast<unsigned char>(c)) != 0 || c == '_') {
            return run(Token::Word, [](char ch) { return std::isalnum(static_cast<unsigned char>(ch)) != 0 || ch == '_' || ch == '.'; });
        }
        if (std::isdigit(static_cast<unsigned char>(c)) != 0 || c == '-' || c == '+') {
            return run(Token::Number, [](char ch) { return std::isalnum(static_cast<unsigned char>(ch)) != 0 || ch == '.' || ch == '-' || ch == '+'; });
        }
        return symbol();
    }

private:
    template <class Pred>
    Token run(Token::Kind kind, Pred inRun) {
        std::size_t start = pos_++;
        while (pos_ < text_.size() && inRun(text_[pos_])) {
            ++pos_;
        }
        return {kind, std::string(text_.substr(start, pos_ - start))};
    }

    Token quoted(char quote) {
        std::string value;
        for (++pos_; pos_ < text_.size() && text_[pos_] != quote; ++pos_) {
            if (text_[pos_] == '\\' && pos_ + 1 < text_.size()) {
                ++pos_;
            }
            value += text_[pos_];
        }
        if (pos_ >= text_.size()) {
            return {Token::Symbol, "unterminated"};
        }
        ++pos_;
        return {Token::Text, value};
    }

    Token symbol() {
        static constexpr std::string_view kTwo[] = {"<>", "!=", "<=", ">="};
        for (std::string_view two : kTwo) {
            if (text_.substr(pos_, 2) == two) {
                pos_ += 2;
                return {Token::Symbol, std::string(two)};
            }
        }
        return {Token::Symbol, std::string(1, text_[pos_++])};
    }

    std::string_view text_;
    std::size_t pos_ = 0;
};

bool isWord(const Token& token, std::string_view word) {
    return token.kind == Token::Word && equalsNoCase(token.text, word);
}

std::optional<CMPIPredOp> operatorOf(const Token& token) {
    if (isWord(token, "LIKE")) return CMPI_PredOp_Like;
    if (isWord(token, "ISA")) return CMPI_PredOp_Isa;
    if (token.kind != Token::Symbol) return std::nullopt;
    if (token.text == "=") return CMPI_PredOp_Equals;
    if (token.text == "<>" || token.text == "!=") return CMPI_PredOp_NotEquals;
    if (token.text == "<") return CMPI_PredOp_LessThan;
    if (token.text == "<=") return CMPI_PredOp_LessThanOrEquals;
    if (token.text == ">") return CMPI_PredOp_GreaterThan;
    if (token.text == ">=") return CMPI_PredOp_GreaterThanOrEquals;
    return std::nullopt;
}

using Dnf = std::vector<Conjunction>;
constexpr std::size_t kMaxGroups = 256;

// The operator that holds exactly when `op` does not (for a non-null value).
CMPIPredOp negation(CMPIPredOp op) {
    switch (op) {
    case CMPI_PredOp_Equals: return CMPI_PredOp_NotEquals;
    case CMPI_PredOp_NotEquals: return CMPI_PredOp_Equals;
    case CMPI_PredOp_LessThan: return CMPI_PredOp_GreaterThanOrEquals;
    case CMPI_PredOp_GreaterThanOrEquals: return CMPI_PredOp_LessThan;
    case CMPI_PredOp_GreaterThan: return CMPI_PredOp_LessThanOrEquals;
    case CMPI_PredOp_LessThanOrEquals: return CMPI_PredOp_GreaterThan;
    case CMPI_PredOp_Isa: return CMPI_PredOp_NotIsa;
    case CMPI_PredOp_NotIsa: return CMPI_PredOp_Isa;
    case CMPI_PredOp_Like: return CMPI_PredOp_NotLike;
    case CMPI_PredOp_NotLike: return CMPI_PredOp_Like;
    case CMPI_PredOp_Null: return CMPI_PredOp_Not_Null;
    case CMPI_PredOp_Not_Null: return CMPI_PredOp_Null;
    default: return op;
    }
}

// The operator that compares the other way round (a < b is b > a).
CMPIPredOp mirrored(CMPIPredOp op) {
    switch (op) {
    case CMPI_PredOp_LessThan: return CMPI_PredOp_GreaterThan;
    case CMPI_PredOp_GreaterThan: return CMPI_PredOp_LessThan;
    case CMPI_PredOp_LessThanOrEquals: return CMPI_PredOp_GreaterThanOrEquals;
    case CMPI_PredOp_GreaterThanOrEquals: return CMPI_PredOp_LessThanOrEquals;
    default: return op;
    }
}

class Parser {
public:
    Parser(std::string_view text, std::string* error) : lexer_(text), error_(error) { advance(); }

    std::optional<Query> parse() {
        Query query;
        if (!expectWord("SELECT") || !parseProjection(query) || !expectWord("FROM")) {
            return std::nullopt;
        }
        if (current_.kind != Token::Word) {
            return fail("a class name after FROM");
        }
        query.fromClass = current_.text;
        advance();
        if (isWord(current_, "WHERE")) {
            advance();
            if (!parseCondition(query)) {
                return std::nullopt;
            }
        }
        if (current_.kind != Token::End) {
            return fail("the end of the query");
        }
        return query;
    }

private:
    void advance() { current_ = lexer_.next(); }

    std::nullopt_t fail(const std::string& expected) {
        if (failed_) {
            return std::nullopt;  // the first error is the one reported
        }
        failed_ = true;
        if (error_ != nullptr) {
            *error_ = "expected " + expected + (current_.kind == Token::End ? " at the end" : " before '" + current_.text + "'");
        }
        return std::nullopt;
    }

    bool expectWord(std::string_view word) {
        if (!isWord(current_, word)) {
            fail(std::string(word));
            return false;
        }
        advance();
        return true;
    }

    bool parseProjection(Query& query) {
        if (current_.kind == Token::Symbol && current_.text == "*") {
            advance();
            return true;
        }
        while (current_.kind == Token::Word) {
            query.projection.push_back(current_.text);
            advance();
            if (!(current_.kind == Token::Symbol && current_.text == ",")) {
                return true;
            }
            advance();
        }
        fail("'*' or a property name");
        return false;
    }

    // condition := term { OR term }; term := factor { AND factor };
    // factor := NOT factor | "(" condition ")" | predicate. Each level answers
    // its condition in disjunctive normal form, NOT pushed into the predicates.
    bool parseCondition(Query& query) {
        std::optional<Dnf> dnf = parseOr(false);
        if (!dnf) {
            return false;
        }
        query.where = std::move(*dnf);
        return true;
    }

    std::optional<Dnf> parseOr(bool negated) {
        std::optional<Dnf> left = parseAnd(negated);
        while (left && isWord(current_, "OR")) {
            advance();
            std::optional<Dnf> right = parseAnd(negated);
            if (!right) {
                return std::nullopt;
            }
            left = negated ? both(*left, *right) : either(std::move(*left), std::move(*right));
        }
        return left;
    }

    std::optional<Dnf> parseAnd(bool negated) {
        std::optional<Dnf> left = parseFactor(negated);
        while (left && isWord(current_, "AND")) {
            advance();
            std::optional<Dnf> right = parseFactor(negated);
            if (!right) {
                return std::nullopt;
            }
            left = negated ? either(std::move(*left), std::move(*right)) : both(*left, *right);
        }
        return left;
    }

    std::optional<Dnf> parseFactor(bool negated) {
        if (isWord(current_, "NOT")) {
            advance();
            return parseFactor(!negated);
        }
        if (current_.kind == Token::Symbol && current_.text == "(") {
            advance();
            std::optional<Dnf> inner = parseOr(negated);
            if (!inner) {
                return std::nullopt;
            }
            if (!(current_.kind == Token::Symbol && current_.text == ")")) {
                return fail("')'");
            }
            advance();
            return inner;
        }
        std::optional<Predicate> predicate = parsePredicate();
        if (!predicate) {
            return std::nullopt;
        }
        if (negated) {
            predicate->op = negation(predicate->op);
        }
        return Dnf{Conjunction{std::move(*predicate)}};
    }

    static Dnf either(Dnf left, Dnf right) {
        for (Conjunction& group : right) {
            left.push_back(std::move(group));
        }
        return left;
    }

    // (a OR b) AND (c OR d) = ac OR ad OR bc OR bd, refused past kMaxGroups.
    std::optional<Dnf> both(const Dnf& left, const Dnf& right) {
        if (left.size() * right.size() > kMaxGroups) {
            return fail("a simpler condition (more than " + std::to_string(kMaxGroups) + " alternatives)");
        }
        Dnf out;
        for (const Conjunction& a : left) {
            for (const Conjunction& b : right) {
                Conjunction group = a;
                group.insert(group.end(), b.begin(), b.end());
                out.push_back(std::move(group));
            }
        }
        return out;
    }

    std::optional<Predicate> parsePredicate() {
        if (current_.kind == Token::Text || current_.kind == Token::Number) {
            return parseLiteralFirst();
        }
        if (current_.kind != Token::Word) {
            return fail("a property name");
        }
        Predicate predicate;
        predicate.lhs = current_.text;
        advance();
        if (isWord(current_, "IS")) {
            advance();
            bool negated = isWord(current_, "NOT");
            if (negated) {
                advance();
            }
            if (!expectWord("NULL")) {
                return std::nullopt;
            }
            predicate.op = negated ? CMPI_PredOp_Not_Null : CMPI_PredOp_Null;
            return predicate;
        }
        std::optional<CMPIPredOp> op = operatorOf(current_);
        if (!op) {
            return fail("a comparison operator");
        }
        predicate.op = *op;
        advance();
        return parseLiteral(predicate);
    }

    // literal op prop, read as prop op' literal with the comparison turned round
    // ('a' < Name is Name > 'a'); LIKE and ISA take the property first.
    std::optional<Predicate> parseLiteralFirst() {
        Predicate predicate;
        predicate.type = current_.kind == Token::Text ? CMPI_charString : CMPI_numericString;
        predicate.rhs = current_.text;
        advance();
        std::optional<CMPIPredOp> op = operatorOf(current_);
        if (!op || *op == CMPI_PredOp_Like || *op == CMPI_PredOp_Isa) {
            return fail("a comparison operator");
        }
        predicate.op = mirrored(*op);
        advance();
        if (current_.kind != Token::Word) {
            return fail("a property name");
        }
        predicate.lhs = current_.text;
        advance();
        return predicate;
    }

    std::optional<Predicate> parseLiteral(Predicate& predicate) {
        if (current_.kind == Token::Text) {
            predicate.type = CMPI_charString;
        } else if (current_.kind == Token::Number) {
            predicate.type = CMPI_numericString;
        } else if (isWord(current_, "TRUE") || isWord(current_, "FALSE")) {
            predicate.type = CMPI_booleanString;
        } else if (current_.kind == Token::Word && predicate.op == CMPI_PredOp_Isa) {
            predicate.type = CMPI_classNameString;
        } else {
            return fail("a literal");
        }
        predicate.rhs = current_.text;
        advance();
        return predicate;
    }

    Lexer lexer_;
    std::string* error_;
    Token current_;
    bool failed_ = false;
};

// SQL LIKE with '%' (any run) and '_' (one character).
bool like(std::string_view text, std::string_view pattern) {
    if (pattern.empty()) {
        return text.empty();
    }
    if (pattern[0] == '%') {
        for (std::size_t i = 0; i <= text.size(); ++i) {
            if (like(text.substr(i), pattern.substr(1))) {
                return true;
            }
        }
        return false;
    }
    return !text.empty() && (pattern[0] == '_' || pattern[0] == text[0]) && like(text.substr(1), pattern.substr(1));
}

// -1, 0, 1; numbers compare numerically, booleans without case, text as bytes.
int compare(const Predicate& predicate, const std::string& value) {
    if (predicate.type == CMPI_numericString) {
        double a = std::strtod(value.c_str(), nullptr);
        double b = std::strtod(predicate.rhs.c_str(), nullptr);
        return a < b ? -1 : (a > b ? 1 : 0);
    }
    if (predicate.type == CMPI_booleanString) {
        return equalsNoCase(value, predicate.rhs) ? 0 : 1;
    }
    int c = value.compare(predicate.rhs);
    return c < 0 ? -1 : (c > 0 ? 1 : 0);
}

}  // namespace

std::optional<Query> parseQuery(std::string_view text, std::string* error) {
    return Parser(text, error).parse();
}

bool predicateHolds(const Predicate& predicate, const std::string& value, bool isNull) {
    switch (predicate.op) {
    case CMPI_PredOp_Null: return isNull;
    case CMPI_PredOp_Not_Null: return !isNull;
    default: break;
    }
    if (isNull) {
        return false;
    }
    int c = compare(predicate, value);
    switch (predicate.op) {
    case CMPI_PredOp_Equals: return c == 0;
    case CMPI_PredOp_NotEquals: return c != 0;
    case CMPI_PredOp_LessThan: return c < 0;
    case CMPI_PredOp_LessThanOrEquals: return c <= 0;
    case CMPI_PredOp_GreaterThan: return c > 0;
    case CMPI_PredOp_GreaterThanOrEquals: return c >= 0;
    case CMPI_PredOp_Like: return like(value, predicate.rhs);
    case CMPI_PredOp_NotLike: return !like(value, predicate.rhs);
    default: return false;
    }
}

}  // namespace orv::host::detail
