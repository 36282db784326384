#include "orv/repository/class_repository.hpp"

#include "mof_loader.hpp"

namespace orv::repository {

struct ClassRepository::State : RepositoryState {};

ClassRepository::ClassRepository() : state_(std::make_unique<State>()) {}
ClassRepository::~ClassRepository() = default;
ClassRepository::ClassRepository(ClassRepository&&) noexcept = default;
ClassRepository& ClassRepository::operator=(ClassRepository&&) noexcept = default;

void ClassRepository::loadFile(const std::filesystem::path& file, std::string_view ns) {
    auto next = std::make_unique<State>(*state_);
    loadMofFile(*next, file, ns);
    state_ = std::move(next);
}

void ClassRepository::loadText(std::string_view text, std::string_view fileName,
                               std::string_view ns) {
    auto next = std::make_unique<State>(*state_);
    loadMofText(*next, text, std::string(fileName), ns);
    state_ = std::move(next);
}

const std::vector<std::string>& ClassRepository::warnings() const noexcept { return state_->warnings; }

std::vector<std::string> ClassRepository::namespaces() const {
    std::vector<std::string> out;
    for (const auto& ns : state_->namespaces) {
        out.push_back(ns.name);
    }
    return out;
}

bool ClassRepository::hasNamespace(std::string_view ns) const noexcept {
    return state_->find(ns) != nullptr;
}

const ClassDecl* ClassRepository::getClass(std::string_view ns,
                                           std::string_view className) const noexcept {
    const NamespaceState* n = state_->find(ns);
    return n == nullptr ? nullptr : n->findClass(className);
}

const QualifierDeclaration* ClassRepository::getQualifierDeclaration(
    std::string_view ns, std::string_view name) const noexcept {
    const NamespaceState* n = state_->find(ns);
    return n == nullptr ? nullptr : n->findQualifier(name);
}

std::vector<const QualifierDeclaration*> ClassRepository::qualifierDeclarations(
    std::string_view ns) const {
    std::vector<const QualifierDeclaration*> out;
    if (const NamespaceState* n = state_->find(ns)) {
        for (const auto& q : n->qualifiers) {
            out.push_back(q.get());
        }
    }
    return out;
}

bool ClassRepository::isA(std::string_view ns, std::string_view className,
                          std::string_view ancestor) const noexcept {
    const NamespaceState* n = state_->find(ns);
    if (n == nullptr || n->findClass(ancestor) == nullptr) {
        return false;
    }
    for (const ClassDecl* c = n->findClass(className); c != nullptr;
         c = c->superClass.empty() ? nullptr : n->findClass(c->superClass)) {
        if (text::iequals(c->name, ancestor)) {
            return true;
        }
    }
    return false;
}

std::vector<std::string> ClassRepository::superclassChain(std::string_view ns,
                                                          std::string_view className) const {
    std::vector<std::string> out;
    const NamespaceState* n = state_->find(ns);
    const ClassDecl* c = n == nullptr ? nullptr : n->findClass(className);
    while (c != nullptr && !c->superClass.empty()) {
        c = n->findClass(c->superClass);
        out.push_back(c->name);
    }
    return out;
}

namespace {

void collectSubclasses(const NamespaceState& n, std::string_view className, bool deep,
                       std::vector<std::string>& out) {
    const auto it = n.children.find(className);
    if (it == n.children.end()) {
        return;
    }
    for (std::size_t index : it->second) {
        out.push_back(n.classes[index]->name);
        if (deep) {
            collectSubclasses(n, n.classes[index]->name, deep, out);
        }
    }
}

}  // namespace

std::vector<std::string> ClassRepository::subclasses(std::string_view ns,
                                                     std::string_view className,
                                                     bool deep) const {
    std::vector<std::string> out;
    const NamespaceState* n = state_->find(ns);
    if (n != nullptr && n->findClass(className) != nullptr) {
        collectSubclasses(*n, className, deep, out);
    }
    return out;
}

std::vector<std::string> ClassRepository::classNames(std::string_view ns,
                                                     std::string_view className,
                                                     bool deep) const {
    if (!className.empty()) {
        return subclasses(ns, className, deep);
    }
    std::vector<std::string> out;
    const NamespaceState* n = state_->find(ns);
    if (n == nullptr) {
        return out;
    }
    for (const auto& c : n->classes) {
        if (c->superClass.empty()) {
            out.push_back(c->name);
            if (deep) {
                collectSubclasses(*n, c->name, true, out);
            }
        }
    }
    return out;
}

std::vector<std::string> ClassRepository::keyNames(std::string_view ns,
                                                   std::string_view className) const {
    const ClassDecl* c = getClass(ns, className);
    return c == nullptr ? std::vector<std::string>{} : c->keyNames();
}

bool ClassRepository::isAssociation(std::string_view ns,
                                    std::string_view className) const noexcept {
    const ClassDecl* c = getClass(ns, className);
    return c != nullptr && c->isAssociation;
}

bool ClassRepository::isIndication(std::string_view ns,
                                   std::string_view className) const noexcept {
    const ClassDecl* c = getClass(ns, className);
    return c != nullptr && c->isIndication;
}

std::vector<const PropertyDecl*> ClassRepository::referenceProperties(
    std::string_view ns, std::string_view className) const {
    const ClassDecl* c = getClass(ns, className);
    return c == nullptr ? std::vector<const PropertyDecl*>{} : c->referenceProperties();
}

}  // namespace orv::repository
