#include "orv/repository/qualifier.hpp"

#include "text.hpp"

namespace orv::repository {

const Qualifier* QualifierList::find(std::string_view name) const noexcept {
    for (const auto& q : items_) {
        if (text::iequals(q.name, name)) {
            return &q;
        }
    }
    return nullptr;
}

bool QualifierList::isTrue(std::string_view name) const noexcept {
    const Qualifier* q = find(name);
    if (q == nullptr) {
        return false;
    }
    if (q->value.isNull()) {
        return true;
    }
    if (q->value.isArray()) {
        return false;
    }
    const bool* b = std::get_if<bool>(&q->value.get());
    return b != nullptr && *b;
}

std::optional<std::string> QualifierList::stringValue(std::string_view name) const {
    const Qualifier* q = find(name);
    if (q == nullptr || q->value.isNull() || q->value.isArray()) {
        return std::nullopt;
    }
    const auto* s = std::get_if<std::string>(&q->value.get());
    if (s == nullptr) {
        return std::nullopt;
    }
    return *s;
}

void QualifierList::set(Qualifier qualifier) {
    for (auto& q : items_) {
        if (text::iequals(q.name, qualifier.name)) {
            q = std::move(qualifier);
            return;
        }
    }
    items_.push_back(std::move(qualifier));
}

}  // namespace orv::repository
