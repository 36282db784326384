#include "mof_loader.hpp"

#include <fstream>
#include <sstream>
#include <variant>

#include "class_builder.hpp"
#include "mof_parser.hpp"
#include "orv/repository/errors.hpp"

namespace orv::repository {

std::string RepositoryState::normalize(std::string_view ns) {
    while (!ns.empty() && ns.front() == '/') {
        ns.remove_prefix(1);
    }
    while (!ns.empty() && ns.back() == '/') {
        ns.remove_suffix(1);
    }
    return text::toLower(ns);
}

const NamespaceState* RepositoryState::find(std::string_view ns) const {
    const auto it = index.find(normalize(ns));
    return it == index.end() ? nullptr : &namespaces[it->second];
}

NamespaceState& RepositoryState::obtain(std::string_view ns) {
    const auto [it, added] = index.emplace(normalize(ns), namespaces.size());
    if (added) {
        NamespaceState fresh;
        fresh.name = std::string(ns);
        namespaces.push_back(std::move(fresh));
    }
    return namespaces[it->second];
}

namespace {

constexpr std::size_t kMaxIncludeDepth = 32;

class Loader {
public:
    Loader(RepositoryState& state, std::string_view ns) : state_(state), namespace_(ns) {}

    void file(const std::filesystem::path& path, const std::string& includer, int includerLine) {
        std::ifstream in(path, std::ios::binary);
        if (!in) {
            if (includer.empty()) {
                throw MofError(path.string(), 0, "cannot open file");
            }
            throw MofError(includer, includerLine,
                           "cannot open included file '" + path.string() + "'");
        }
        std::ostringstream buf;
        buf << in.rdbuf();
        text(buf.str(), path.string());
    }

    void text(std::string_view source, const std::string& fileName) {
        if (stack_.size() >= kMaxIncludeDepth) {
            throw MofError(fileName, 1, "includes nested too deeply");
        }
        const std::filesystem::path normal = std::filesystem::path(fileName).lexically_normal();
        for (const auto& open : stack_) {
            if (open == normal) {
                throw MofError(fileName, 1, "include cycle: " + fileName + " includes itself");
            }
        }
        stack_.push_back(normal);
        for (const mof::Production& p : mof::parse(source, fileName)) {
            std::visit([&](const auto& item) { handle(item, fileName); }, p);
        }
        stack_.pop_back();
    }

private:
    void handle(const mof::PragmaSyntax& pragma, const std::string& fileName) {
        if (text::iequals(pragma.name, "include")) {
            const auto base = std::filesystem::path(fileName).parent_path();
            file(base / pragma.argument, fileName, pragma.line);
        } else if (text::iequals(pragma.name, "namespace")) {
            namespace_ = pragma.argument;
        }
        // "#pragma locale" and others carry nothing the repository keeps.
    }

    void handle(const mof::ClassSyntax& syntax, const std::string& fileName) {
        NamespaceState& ns = state_.obtain(namespace_);
        ns.addClass(std::make_shared<const ClassDecl>(mof::buildClass(syntax, ns, fileName, state_.warnings)));
    }

    void handle(const mof::QualifierDeclSyntax& syntax, const std::string& fileName) {
        NamespaceState& ns = state_.obtain(namespace_);
        if (ns.findQualifier(syntax.name) != nullptr) {
            throw MofError(fileName, syntax.line,
                           "duplicate qualifier declaration " + syntax.name);
        }
        ns.addQualifier(std::make_shared<const QualifierDeclaration>(
            mof::buildQualifierDeclaration(syntax, fileName)));
    }

    RepositoryState& state_;
    std::string namespace_;
    std::vector<std::filesystem::path> stack_;
};

}  // namespace

void loadMofFile(RepositoryState& state, const std::filesystem::path& file, std::string_view ns) {
    Loader(state, ns).file(file, {}, 0);
}

void loadMofText(RepositoryState& state, std::string_view source, const std::string& fileName,
                 std::string_view ns) {
    Loader(state, ns).text(source, fileName);
}

}  // namespace orv::repository
