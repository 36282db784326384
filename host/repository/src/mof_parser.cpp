#include "mof_parser.hpp"

#include <array>
#include <utility>

#include "mof_lexer.hpp"
#include "orv/repository/errors.hpp"

namespace orv::repository::mof {
namespace {

struct ScopeWord {
    std::string_view word;
    Scope scope;
};

constexpr std::array<ScopeWord, 9> kScopeWords{{
    {"class", Scope::Class},
    {"association", Scope::Association},
    {"indication", Scope::Indication},
    {"property", Scope::Property},
    {"reference", Scope::Reference},
    {"method", Scope::Method},
    {"parameter", Scope::Parameter},
    {"qualifier", Scope::Qualifier},
    {"any", Scope::Any},
}};

class Parser {
public:
    Parser(std::string_view source, const std::string& fileName)
        : lexer_(source, fileName), tok_(lexer_.next()) {}

    std::vector<Production> run() {
        std::vector<Production> out;
        while (tok_.kind != TokenKind::End) {
            out.push_back(production());
        }
        return out;
    }

private:
    [[noreturn]] void fail(const std::string& message) const {
        throw MofError(lexer_.fileName(), tok_.line, message);
    }
    void advance() {
        previousLine_ = tok_.line;
        tok_ = lexer_.next();
    }
    // A missing closing token is reported on the line of what it should follow.
    void expectPunct(char c, std::string_view where) {
        if (!tok_.isPunct(c)) {
            throw MofError(lexer_.fileName(), previousLine_,
                           std::string("expected '") + c + "' " + std::string(where));
        }
        advance();
    }
    bool acceptPunct(char c) {
        if (tok_.isPunct(c)) {
            advance();
            return true;
        }
        return false;
    }
    std::string identifier(std::string_view what) {
        if (tok_.kind != TokenKind::Identifier) {
            fail("expected " + std::string(what));
        }
        std::string name(tok_.spelling);
        advance();
        return name;
    }

    Production production() {
        if (tok_.isPunct('#')) {
            return pragma();
        }
        if (tok_.isWord("qualifier")) {
            return qualifierDeclaration();
        }
        QualifierSyntaxList qualifiers;
        if (tok_.isPunct('[')) {
            qualifiers = qualifierList();
        }
        if (tok_.isWord("instance")) {
            advance();
            const std::string target = tok_.isWord("of") ? (advance(), identifier("class name"))
                                                         : std::string("?");
            throw MofError(lexer_.fileName(), tok_.line,
                           "instance declarations are not supported (instance of " + target + ")");
        }
        if (!tok_.isWord("class")) {
            fail("expected 'class', 'qualifier', 'instance of' or '#pragma'");
        }
        return classDeclaration(std::move(qualifiers));
    }

    PragmaSyntax pragma() {
        PragmaSyntax p;
        p.line = tok_.line;
        advance();
        if (!tok_.isWord("pragma")) {
            fail("expected 'pragma' after '#'");
        }
        advance();
        p.name = identifier("pragma name");
        expectPunct('(', "after pragma name");
        if (tok_.kind == TokenKind::String) {
            p.argument = concatenatedString();
        } else if (tok_.kind == TokenKind::Identifier) {
            p.argument = identifier("pragma parameter");
        } else {
            fail("expected a string as pragma parameter");
        }
        expectPunct(')', "after pragma parameter");
        return p;
    }

    std::string concatenatedString() {
        std::string s;
        while (tok_.kind == TokenKind::String) {
            s += tok_.text;
            advance();
        }
        return s;
    }

    QualifierSyntaxList qualifierList() {
        QualifierSyntaxList list;
        advance();  // '['
        do {
            list.push_back(qualifier());
        } while (acceptPunct(','));
        expectPunct(']', "at end of qualifier list");
        return list;
    }

    QualifierSyntax qualifier() {
        QualifierSyntax q;
        q.line = tok_.line;
        q.name = identifier("qualifier name");
        if (acceptPunct('(')) {
            q.value = constantValue();
            expectPunct(')', "after qualifier value");
        } else if (tok_.isPunct('{')) {
            q.value = arrayInitializer();
        }
        if (acceptPunct(':')) {
            q.flavors = flavorWords(Flavors{});
        }
        return q;
    }

    Flavors flavorWords(Flavors flavors) {
        if (!applyFlavor(flavors)) {
            fail("expected a flavor (EnableOverride, DisableOverride, ToSubclass, Restricted, Translatable)");
        }
        while (applyFlavor(flavors)) {
        }
        return flavors;
    }

    bool applyFlavor(Flavors& f) {
        if (tok_.isWord("enableoverride")) {
            f.enableOverride = true;
        } else if (tok_.isWord("disableoverride")) {
            f.enableOverride = false;
        } else if (tok_.isWord("tosubclass")) {
            f.toSubclass = true;
        } else if (tok_.isWord("restricted")) {
            f.toSubclass = false;
        } else if (tok_.isWord("translatable")) {
            f.translatable = true;
        } else {
            return false;
        }
        advance();
        return true;
    }

    Literal literal() {
        Literal lit;
        switch (tok_.kind) {
            case TokenKind::Integer:
                lit.kind = Literal::Kind::Integer;
                lit.magnitude = tok_.magnitude;
                lit.negative = tok_.negative;
                break;
            case TokenKind::Real:
                lit.kind = Literal::Kind::Real;
                lit.real = tok_.real;
                break;
            case TokenKind::Char16:
                lit.kind = Literal::Kind::Char16;
                lit.ch = tok_.ch;
                break;
            case TokenKind::String:
                lit.kind = Literal::Kind::String;
                lit.text = concatenatedString();
                return lit;
            case TokenKind::Identifier:
                if (tok_.isWord("true") || tok_.isWord("false")) {
                    lit.kind = Literal::Kind::Boolean;
                    lit.boolean = tok_.isWord("true");
                    break;
                }
                if (tok_.isWord("null")) {
                    break;
                }
                [[fallthrough]];
            default:
                fail("expected a value");
        }
        advance();
        return lit;
    }

    ValueSyntax constantValue() {
        ValueSyntax v;
        v.present = true;
        v.line = tok_.line;
        v.items.push_back(literal());
        return v;
    }

    ValueSyntax arrayInitializer() {
        ValueSyntax v;
        v.present = true;
        v.isArray = true;
        v.line = tok_.line;
        advance();  // '{'
        if (!tok_.isPunct('}')) {
            do {
                v.items.push_back(literal());
            } while (acceptPunct(','));
        }
        expectPunct('}', "at end of array value");
        return v;
    }

    ValueSyntax initializer() {
        return tok_.isPunct('{') ? arrayInitializer() : constantValue();
    }

    // "[]" or "[5]" after a name; no-op when there is no bracket.
    void arraySuffix(DataType& type) {
        if (!acceptPunct('[')) {
            return;
        }
        type.isArray = true;
        if (tok_.kind == TokenKind::Integer) {
            if (tok_.negative || tok_.magnitude > 0xFFFFFFFFULL) {
                fail("expected an array size between 0 and 4294967295");
            }
            type.arraySize = static_cast<std::uint32_t>(tok_.magnitude);
            advance();
        }
        expectPunct(']', "after array size");
    }

    DataType dataType(std::string_view what) {
        if (tok_.kind != TokenKind::Identifier) {
            fail("expected a data type " + std::string(what));
        }
        const auto type = cimTypeFromName(tok_.spelling);
        if (!type) {
            fail("unknown data type '" + std::string(tok_.spelling) + "' " + std::string(what));
        }
        advance();
        DataType t;
        t.type = *type;
        return t;
    }

    // A type: a data type keyword or "ClassName REF".
    DataType featureType(std::string_view what) {
        if (tok_.kind != TokenKind::Identifier) {
            fail("expected a data type " + std::string(what));
        }
        const std::string_view firstWord = tok_.spelling;
        const int firstLine = tok_.line;
        advance();
        if (tok_.isWord("ref")) {
            advance();
            DataType t;
            t.type = CimType::Reference;
            t.referenceClass = std::string(firstWord);
            return t;
        }
        const auto type = cimTypeFromName(firstWord);
        if (!type) {
            throw MofError(lexer_.fileName(), firstLine,
                           "unknown data type '" + std::string(firstWord) + "' " +
                               std::string(what));
        }
        DataType t;
        t.type = *type;
        return t;
    }

    ClassSyntax classDeclaration(QualifierSyntaxList qualifiers) {
        ClassSyntax c;
        c.line = tok_.line;
        c.qualifiers = std::move(qualifiers);
        advance();  // 'class'
        c.name = identifier("class name after 'class'");
        if (acceptPunct(':')) {
            c.superClass = identifier("superclass name after ':'");
        }
        expectPunct('{', "to open the class body");
        while (!acceptPunct('}')) {
            if (tok_.kind == TokenKind::End) {
                fail("expected '}' at end of class " + c.name);
            }
            feature(c);
        }
        expectPunct(';', "after class declaration");
        return c;
    }

    void feature(ClassSyntax& c) {
        QualifierSyntaxList qualifiers;
        const int line = tok_.line;
        if (tok_.isPunct('[')) {
            qualifiers = qualifierList();
        }
        DataType type = featureType("in property, reference or method declaration");
        std::string name = identifier("property or method name");
        if (tok_.isPunct('(')) {
            c.methods.push_back(method(std::move(qualifiers), type, std::move(name), line));
            return;
        }
        PropertySyntax p;
        p.line = line;
        p.qualifiers = std::move(qualifiers);
        p.type = std::move(type);
        p.name = std::move(name);
        if (p.type.type != CimType::Reference) {
            arraySuffix(p.type);
        }
        if (acceptPunct('=')) {
            p.defaultValue = initializer();
        }
        const bool isRef = p.type.type == CimType::Reference;
        expectPunct(';', isRef ? "after reference declaration" : "after property declaration");
        c.properties.push_back(std::move(p));
    }

    MethodSyntax method(QualifierSyntaxList qualifiers, DataType type, std::string name, int line) {
        MethodSyntax m;
        m.line = line;
        m.qualifiers = std::move(qualifiers);
        m.returnType = std::move(type);
        m.name = std::move(name);
        advance();  // '('
        if (!tok_.isPunct(')')) {
            do {
                m.parameters.push_back(parameter());
            } while (acceptPunct(','));
        }
        expectPunct(')', "at end of parameter list");
        expectPunct(';', "after method declaration");
        return m;
    }

    ParameterSyntax parameter() {
        ParameterSyntax p;
        p.line = tok_.line;
        if (tok_.isPunct('[')) {
            p.qualifiers = qualifierList();
        }
        p.type = featureType("in parameter declaration");
        p.name = identifier("parameter name");
        arraySuffix(p.type);
        if (acceptPunct('=')) {
            initializer();  // parameter defaults carry no meaning for the repository
        }
        return p;
    }

    QualifierDeclSyntax qualifierDeclaration() {
        QualifierDeclSyntax d;
        d.line = tok_.line;
        advance();  // 'qualifier'
        d.name = identifier("qualifier name after 'qualifier'");
        expectPunct(':', "after qualifier name");
        d.type = dataType("after ':' in qualifier declaration");
        arraySuffix(d.type);
        if (acceptPunct('=')) {
            d.defaultValue = initializer();
        }
        expectPunct(',', "before Scope in qualifier declaration");
        if (!tok_.isWord("scope")) {
            fail("expected 'Scope' in qualifier declaration");
        }
        advance();
        expectPunct('(', "after Scope");
        do {
            d.scopes |= scopeWord();
        } while (acceptPunct(','));
        expectPunct(')', "at end of Scope list");
        if (acceptPunct(',')) {
            if (!tok_.isWord("flavor")) {
                fail("expected 'Flavor' in qualifier declaration");
            }
            advance();
            expectPunct('(', "after Flavor");
            Flavors f;
            do {
                f = flavorWords(f);
            } while (acceptPunct(','));
            d.flavors = f;
            expectPunct(')', "at end of Flavor list");
        }
        expectPunct(';', "after qualifier declaration");
        return d;
    }

    std::uint16_t scopeWord() {
        for (const auto& [word, scope] : kScopeWords) {
            if (tok_.isWord(word)) {
                advance();
                return static_cast<std::uint16_t>(scope);
            }
        }
        fail("expected a scope (class, association, indication, property, reference, method, parameter, qualifier, any)");
    }

    Lexer lexer_;
    Token tok_;
    int previousLine_ = 1;
};

}  // namespace

std::vector<Production> parse(std::string_view source, const std::string& fileName) {
    return Parser(source, fileName).run();
}

}  // namespace orv::repository::mof
