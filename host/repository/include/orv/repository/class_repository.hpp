// The class repository: CIM classes and qualifier declarations read from MOF,
// grouped in namespaces.
//
// Loading is not thread-safe and must finish before readers start; after that
// every const member may be called from any number of threads at once. Pointers
// and references handed out stay valid until the repository is destroyed or
// loaded into again.
//
// Class, property, qualifier and namespace names compare case-insensitively;
// results spell class names as they were declared.
#pragma once

#include <filesystem>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "orv/repository/class_decl.hpp"
#include "orv/repository/errors.hpp"
#include "orv/repository/qualifier.hpp"

namespace orv::repository {

inline constexpr std::string_view kDefaultNamespace = "root/cimv2";

class ClassRepository {
public:
    ClassRepository();
    ~ClassRepository();
    ClassRepository(ClassRepository&&) noexcept;
    ClassRepository& operator=(ClassRepository&&) noexcept;
    ClassRepository(const ClassRepository&) = delete;
    ClassRepository& operator=(const ClassRepository&) = delete;

    // Reads a MOF file into `ns` (until a "#pragma namespace" switches it).
    // "#pragma include("x.mof")" is resolved relative to the including file's
    // folder; "#pragma locale" and other pragmas are ignored.
    // Throws MofError; on error the repository is left as it was before the call.
    void loadFile(const std::filesystem::path& file, std::string_view ns = kDefaultNamespace);
    // Same for MOF text in memory; `fileName` is used in error messages and
    // to resolve includes.
    void loadText(std::string_view text, std::string_view fileName,
                  std::string_view ns = kDefaultNamespace);

    // What the loaded MOF declares against a schema rule the repository does not
    // enforce, one "file:line: message" line each, in load order (a property
    // declared again with another type than the one it inherits).
    const std::vector<std::string>& warnings() const noexcept;

    // Namespaces that hold at least one class or qualifier declaration, as first spelled.
    std::vector<std::string> namespaces() const;
    bool hasNamespace(std::string_view ns) const noexcept;

    // The class, or nullptr when the namespace or the class does not exist.
    const ClassDecl* getClass(std::string_view ns, std::string_view className) const noexcept;
    const QualifierDeclaration* getQualifierDeclaration(std::string_view ns,
                                                        std::string_view name) const noexcept;
    // Qualifier declarations of the namespace, in load order.
    std::vector<const QualifierDeclaration*> qualifierDeclarations(std::string_view ns) const;

    // True when `className` is `ancestor` or derives from it. False when either is unknown.
    bool isA(std::string_view ns, std::string_view className,
             std::string_view ancestor) const noexcept;
    // The ancestors of the class, nearest first (the class itself not included).
    // Empty for a root class or an unknown one.
    std::vector<std::string> superclassChain(std::string_view ns, std::string_view className) const;
    // Subclasses, direct only or all descendants. Direct subclasses come in
    // declaration order; deep lists go depth-first (each class followed by its
    // own subclasses). Empty for an unknown class.
    std::vector<std::string> subclasses(std::string_view ns, std::string_view className,
                                        bool deep) const;
    // EnumerateClassNames: with an empty className the root classes (deep: every
    // class), otherwise the class's subclasses (direct or deep), ordered as above.
    std::vector<std::string> classNames(std::string_view ns, std::string_view className,
                                        bool deep) const;
    // Key property names, inherited ones included, in schema order.
    std::vector<std::string> keyNames(std::string_view ns, std::string_view className) const;
    bool isAssociation(std::string_view ns, std::string_view className) const noexcept;
    bool isIndication(std::string_view ns, std::string_view className) const noexcept;
    // Reference properties of the class (the ends of an association), schema order.
    std::vector<const PropertyDecl*> referenceProperties(std::string_view ns,
                                                         std::string_view className) const;

private:
    struct State;
    std::unique_ptr<State> state_;
};

}  // namespace orv::repository
