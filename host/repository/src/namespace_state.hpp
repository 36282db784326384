// The contents of one namespace: classes in declaration order with a
// case-insensitive index, the subclass lists, and qualifier declarations.
#pragma once

#include <cstddef>
#include <memory>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

#include "orv/repository/class_decl.hpp"
#include "orv/repository/qualifier.hpp"
#include "text.hpp"

namespace orv::repository {

template <typename V>
using NameMap = std::unordered_map<std::string, V, text::CaseInsensitiveHash, text::CaseInsensitiveEqual>;

struct NamespaceState {
    std::string name;  // as first spelled
    std::vector<std::shared_ptr<const ClassDecl>> classes;
    NameMap<std::size_t> classIndex;
    NameMap<std::vector<std::size_t>> children;  // superclass name -> direct subclasses
    std::vector<std::shared_ptr<const QualifierDeclaration>> qualifiers;
    NameMap<std::size_t> qualifierIndex;

    const ClassDecl* findClass(std::string_view className) const noexcept {
        const auto it = classIndex.find(className);
        return it == classIndex.end() ? nullptr : classes[it->second].get();
    }
    const QualifierDeclaration* findQualifier(std::string_view qualifierName) const noexcept {
        const auto it = qualifierIndex.find(qualifierName);
        return it == qualifierIndex.end() ? nullptr : qualifiers[it->second].get();
    }
    void addClass(std::shared_ptr<const ClassDecl> decl) {
        const std::size_t index = classes.size();
        classIndex.emplace(decl->name, index);
        if (!decl->superClass.empty()) {
            children[decl->superClass].push_back(index);
        }
        classes.push_back(std::move(decl));
    }
    void addQualifier(std::shared_ptr<const QualifierDeclaration> decl) {
        qualifierIndex.emplace(decl->name, qualifiers.size());
        qualifiers.push_back(std::move(decl));
    }
};

}  // namespace orv::repository
