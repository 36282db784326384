#include <strings.h>

#include "orv/http/http_server.hpp"

namespace orv::http {

const std::string* Request::header(std::string_view name) const noexcept {
    for (const auto& [key, value] : headers) {
        if (key.size() == name.size() && strncasecmp(key.data(), name.data(), name.size()) == 0) {
            return &value;
        }
    }
    return nullptr;
}

bool Request::headerIs(std::string_view name, std::string_view expected) const noexcept {
    const std::string* value = header(name);
    if (value == nullptr) {
        return false;
    }
    const std::string_view text = trimBlanks(*value);
    return text.size() == expected.size() && strncasecmp(text.data(), expected.data(), text.size()) == 0;
}

std::string_view trimBlanks(std::string_view text) noexcept {
    while (!text.empty() && (text.front() == ' ' || text.front() == '\t')) {
        text.remove_prefix(1);
    }
    while (!text.empty() && (text.back() == ' ' || text.back() == '\t')) {
        text.remove_suffix(1);
    }
    return text;
}

}  // namespace orv::http
