#include "orv/host/wql.hpp"

#include "query.hpp"
#include "select_exp.hpp"

namespace orv::host {

WqlQuery::WqlQuery(std::string text, std::shared_ptr<const detail::Query> query)
    : text_(std::move(text)), query_(std::move(query)) {}

WqlQuery WqlQuery::parse(std::string_view text) {
    std::string error;
    std::optional<detail::Query> query = detail::parseQuery(text, &error);
    if (!query) {
        throw WqlError(error);
    }
    return WqlQuery(std::string(text), std::make_shared<const detail::Query>(std::move(*query)));
}

const std::string& WqlQuery::fromClass() const noexcept { return query_->fromClass; }

const std::vector<std::string>& WqlQuery::selectList() const noexcept { return query_->projection; }

bool WqlQuery::matches(const CMPIInstance* instance) const { return detail::queryMatches(*query_, instance); }

}  // namespace orv::host
