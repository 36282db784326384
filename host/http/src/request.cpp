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

}  // namespace orv::http
