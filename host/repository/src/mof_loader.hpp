// Reads MOF files into repository state: follows "#pragma include" relative
// to the including file and "#pragma namespace", ignores other pragmas.
#pragma once

#include <filesystem>
#include <string>
#include <string_view>
#include <vector>

#include "namespace_state.hpp"

namespace orv::repository {

// All namespaces of a repository, keyed by normalized name (lower case, no
// leading or trailing '/').
struct RepositoryState {
    std::vector<NamespaceState> namespaces;
    std::unordered_map<std::string, std::size_t> index;
    // "file:line: message" for what the MOF may declare but should not, in load order.
    std::vector<std::string> warnings;

    static std::string normalize(std::string_view ns);
    const NamespaceState* find(std::string_view ns) const;
    NamespaceState& obtain(std::string_view ns);
};

// Throws MofError; `state` may be partly updated then, so callers load into a copy.
void loadMofFile(RepositoryState& state, const std::filesystem::path& file, std::string_view ns);
void loadMofText(RepositoryState& state, std::string_view source, const std::string& fileName,
                 std::string_view ns);

}  // namespace orv::repository
