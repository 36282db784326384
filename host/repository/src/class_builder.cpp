#include "class_builder.hpp"

#include <utility>

#include "literal_conversion.hpp"
#include "orv/repository/errors.hpp"

namespace orv::repository::mof {
namespace {

class Builder {
public:
    Builder(const ClassSyntax& syntax, const NamespaceState& ns, const std::string& file,
            std::vector<std::string>& warnings)
        : syntax_(syntax), ns_(ns), file_(file), warnings_(warnings) {}

    ClassDecl run() {
        if (const ClassDecl* existing = ns_.findClass(syntax_.name)) {
            fail(syntax_.line, "duplicate class " + syntax_.name + " (first declared at " +
                                   existing->file + ":" + std::to_string(existing->line) + ")");
        }
        const ClassDecl* parent = nullptr;
        if (!syntax_.superClass.empty()) {
            parent = ns_.findClass(syntax_.superClass);
            if (parent == nullptr) {
                fail(syntax_.line, "unknown superclass " + syntax_.superClass + " of class " +
                                       syntax_.name);
            }
        }
        ClassDecl c;
        c.name = syntax_.name;
        c.superClass = syntax_.superClass;
        c.file = file_;
        c.line = syntax_.line;
        c.qualifiers = inherited(parent ? &parent->qualifiers : nullptr);
        mergeInto(c.qualifiers, qualifiers(syntax_.qualifiers, "class " + c.name));
        c.isAssociation = c.qualifiers.isTrue("Association") || (parent && parent->isAssociation);
        c.isIndication = c.qualifiers.isTrue("Indication") || (parent && parent->isIndication);
        c.isAbstract = ownQualifierTrue(syntax_.qualifiers, "Abstract");
        if (parent != nullptr) {
            c.properties = propagate(parent->properties);
            c.methods = propagate(parent->methods);
        }
        for (const PropertySyntax& p : syntax_.properties) {
            c.ownProperties.push_back(property(p));
            place(c.properties, c.ownProperties.back(), p.line, "property");
        }
        for (const MethodSyntax& m : syntax_.methods) {
            c.ownMethods.push_back(method(m));
            place(c.methods, c.ownMethods.back(), m.line, "method");
        }
        for (PropertyDecl& p : c.properties) {
            p.key = p.qualifiers.isTrue("Key");
        }
        c.indexProperties();
        return c;
    }

private:
    [[noreturn]] void fail(int line, const std::string& message) const {
        throw MofError(file_, line, message);
    }

    static bool ownQualifierTrue(const QualifierSyntaxList& list, std::string_view name) {
        for (const QualifierSyntax& q : list) {
            if (text::iequals(q.name, name)) {
                return !q.value.present ||
                       (q.value.items.front().kind == Literal::Kind::Boolean &&
                        q.value.items.front().boolean);
            }
        }
        return false;
    }

    // The qualifiers a parent element passes to its heir: those flavored ToSubclass.
    static QualifierList inherited(const QualifierList* parent) {
        QualifierList out;
        if (parent == nullptr) {
            return out;
        }
        for (const Qualifier& q : parent->items()) {
            if (q.flavors.toSubclass) {
                Qualifier copy = q;
                copy.propagated = true;
                out.items().push_back(std::move(copy));
            }
        }
        return out;
    }

    static void mergeInto(QualifierList& into, QualifierList own) {
        for (Qualifier& q : own.items()) {
            into.set(std::move(q));
        }
    }

    template <typename Decl>
    static std::vector<Decl> propagate(const std::vector<Decl>& parentItems) {
        std::vector<Decl> out;
        out.reserve(parentItems.size());
        for (const Decl& d : parentItems) {
            Decl copy = d;
            copy.propagated = true;
            copy.qualifiers = inherited(&d.qualifiers);
            out.push_back(std::move(copy));
        }
        return out;
    }

    QualifierList qualifiers(const QualifierSyntaxList& list, const std::string& owner) const {
        QualifierList out;
        const bool declared = !ns_.qualifiers.empty();
        for (const QualifierSyntax& s : list) {
            if (out.find(s.name) != nullptr) {
                fail(s.line, "duplicate qualifier " + s.name + " on " + owner);
            }
            const QualifierDeclaration* decl = ns_.findQualifier(s.name);
            if (declared && decl == nullptr) {
                fail(s.line, "unknown qualifier " + s.name + " on " + owner);
            }
            Qualifier q;
            q.name = s.name;
            q.type = decl ? decl->type : inferType(s.value);
            q.flavors = s.flavors ? *s.flavors : (decl ? decl->flavors : Flavors{});
            if (s.value.present) {
                q.value = toValue(s.value, q.type, file_, "qualifier " + s.name);
            } else if (q.type.type == CimType::Boolean && !q.type.isArray) {
                q.value = Value::scalar(true);
            }
            out.items().push_back(std::move(q));
        }
        return out;
    }

    void checkReference(const DataType& type, int line, const std::string& owner) const {
        if (type.type == CimType::Reference && !text::iequals(type.referenceClass, syntax_.name) &&
            ns_.findClass(type.referenceClass) == nullptr) {
            fail(line, "unknown class " + type.referenceClass + " referenced by " + owner);
        }
    }

    PropertyDecl property(const PropertySyntax& s) const {
        const std::string owner = (s.type.type == CimType::Reference ? "reference " : "property ") +
                                  syntax_.name + "." + s.name;
        checkReference(s.type, s.line, owner);
        PropertyDecl p;
        p.name = s.name;
        p.type = s.type;
        p.defaultValue = toValue(s.defaultValue, s.type, file_, owner);
        p.qualifiers = qualifiers(s.qualifiers, owner);
        p.key = p.qualifiers.isTrue("Key");
        p.classOrigin = syntax_.name;
        return p;
    }

    MethodDecl method(const MethodSyntax& s) const {
        const std::string owner = "method " + syntax_.name + "." + s.name;
        checkReference(s.returnType, s.line, owner);
        MethodDecl m;
        m.name = s.name;
        m.returnType = s.returnType;
        m.qualifiers = qualifiers(s.qualifiers, owner);
        m.classOrigin = syntax_.name;
        for (const ParameterSyntax& ps : s.parameters) {
            const std::string paramOwner = "parameter " + ps.name + " of " + owner;
            if (m.findParameter(ps.name) != nullptr) {
                fail(ps.line, "duplicate " + paramOwner);
            }
            checkReference(ps.type, ps.line, paramOwner);
            m.parameters.push_back(
                ParameterDecl{ps.name, ps.type, qualifiers(ps.qualifiers, paramOwner)});
        }
        return m;
    }

    // Puts an own declaration into the effective list: in place of the inherited
    // element it overrides (same name, or the one its Override qualifier names),
    // otherwise at the end.
    template <typename Decl>
    void place(std::vector<Decl>& effective, const Decl& own, int line, const char* kind) const {
        const auto overrideName = own.qualifiers.stringValue("Override");
        const std::string& target = overrideName ? *overrideName : own.name;
        for (Decl& existing : effective) {
            if (text::iequals(existing.name, own.name) && !existing.propagated) {
                fail(line, std::string("duplicate ") + kind + " " + own.name + " in class " +
                               syntax_.name);
            }
        }
        for (Decl& existing : effective) {
            if (existing.propagated && text::iequals(existing.name, target)) {
                if constexpr (std::is_same_v<Decl, PropertyDecl>) {
                    checkSameType(existing, own, line);
                }
                existing = overriding(existing, own);
                return;
            }
        }
        if (overrideName) {
            fail(line, std::string("Override(\"") + *overrideName + "\") on " + kind + " " +
                           own.name + " names no " + kind + " of " + syntax_.superClass);
        }
        effective.push_back(own);
    }

    static std::string typeText(const DataType& type) {
        std::string text = type.type == CimType::Reference ? type.referenceClass + " REF"
                                                           : std::string(cimTypeName(type.type));
        return type.isArray ? text + "[]" : text;
    }

    // An inherited property keeps its type in a subclass (a reference may name a
    // subclass of its class); the repository takes the new type as declared, since
    // providers serve it, but says so, because a parent-class enumeration then
    // carries values of a type the parent class does not declare.
    void checkSameType(const PropertyDecl& inheritedDecl, const PropertyDecl& own, int line) const {
        if (inheritedDecl.type.type == own.type.type && inheritedDecl.type.isArray == own.type.isArray) {
            return;
        }
        warnings_.push_back(file_ + ":" + std::to_string(line) + ": property " + syntax_.name + "." +
                            own.name + " is " + typeText(own.type) + " but overrides " + inheritedDecl.name +
                            " of " + inheritedDecl.classOrigin + ", which is " + typeText(inheritedDecl.type) +
                            "; an inherited property cannot change its type");
    }

    template <typename Decl>
    static Decl overriding(const Decl& inheritedDecl, const Decl& own) {
        Decl merged = own;
        merged.qualifiers = inheritedDecl.qualifiers;
        mergeInto(merged.qualifiers, own.qualifiers);
        if constexpr (std::is_same_v<Decl, PropertyDecl>) {
            if (merged.defaultValue.isNull()) {
                merged.defaultValue = inheritedDecl.defaultValue;
            }
        }
        return merged;
    }

    const ClassSyntax& syntax_;
    const NamespaceState& ns_;
    const std::string& file_;
    std::vector<std::string>& warnings_;
};

}  // namespace

ClassDecl buildClass(const ClassSyntax& syntax, const NamespaceState& ns, const std::string& file,
                     std::vector<std::string>& warnings) {
    return Builder(syntax, ns, file, warnings).run();
}

QualifierDeclaration buildQualifierDeclaration(const QualifierDeclSyntax& syntax,
                                               const std::string& file) {
    QualifierDeclaration d;
    d.name = syntax.name;
    d.type = syntax.type;
    d.defaultValue = toValue(syntax.defaultValue, syntax.type, file, "qualifier " + syntax.name);
    d.scopes = syntax.scopes;
    d.flavors = syntax.flavors.value_or(Flavors{});
    return d;
}

}  // namespace orv::repository::mof
