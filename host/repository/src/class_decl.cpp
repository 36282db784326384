#include "orv/repository/class_decl.hpp"

#include "text.hpp"

namespace orv::repository {
namespace {

template <typename Item>
const Item* findByName(const std::vector<Item>& items, std::string_view name) noexcept {
    for (const auto& item : items) {
        if (text::iequals(item.name, name)) {
            return &item;
        }
    }
    return nullptr;
}

}  // namespace

bool ParameterDecl::isIn() const noexcept {
    if (qualifiers.find("In") != nullptr) {
        return qualifiers.isTrue("In");
    }
    return true;
}

bool ParameterDecl::isOut() const noexcept {
    return qualifiers.isTrue("Out");
}

const ParameterDecl* MethodDecl::findParameter(std::string_view paramName) const noexcept {
    return findByName(parameters, paramName);
}

const PropertyDecl* ClassDecl::findProperty(std::string_view propertyName) const noexcept {
    return findByName(properties, propertyName);
}

const MethodDecl* ClassDecl::findMethod(std::string_view methodName) const noexcept {
    return findByName(methods, methodName);
}

std::vector<std::string> ClassDecl::keyNames() const {
    std::vector<std::string> out;
    for (const auto& p : properties) {
        if (p.key) {
            out.push_back(p.name);
        }
    }
    return out;
}

std::vector<const PropertyDecl*> ClassDecl::referenceProperties() const {
    std::vector<const PropertyDecl*> out;
    for (const auto& p : properties) {
        if (p.isReference()) {
            out.push_back(&p);
        }
    }
    return out;
}

}  // namespace orv::repository
