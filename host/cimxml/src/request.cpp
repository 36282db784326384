#include "orv/cimxml/request.hpp"

#include <strings.h>

namespace orv::cimxml {

const ParamValue* CimRequest::param(std::string_view name) const noexcept {
    for (const auto& [paramName, value] : params) {
        if (paramName.size() == name.size() &&
            strncasecmp(paramName.c_str(), name.data(), name.size()) == 0) {
            return &value;
        }
    }
    return nullptr;
}

}  // namespace orv::cimxml
