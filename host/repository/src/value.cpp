#include "orv/repository/value.hpp"

#include <charconv>
#include <type_traits>

#include "text.hpp"

namespace orv::repository {

Value Value::scalar(Scalar item) {
    Value v;
    v.kind_ = Kind::One;
    v.items_.push_back(std::move(item));
    return v;
}

Value Value::array(std::vector<Scalar> items) {
    Value v;
    v.kind_ = Kind::Array;
    v.items_ = std::move(items);
    return v;
}

std::string scalarToText(const Scalar& value) {
    return std::visit(
        [](const auto& v) -> std::string {
            using T = std::decay_t<decltype(v)>;
            if constexpr (std::is_same_v<T, bool>) {
                return v ? "true" : "false";
            } else if constexpr (std::is_same_v<T, std::string>) {
                return v;
            } else if constexpr (std::is_same_v<T, char16_t>) {
                std::string out;
                text::appendUtf8(out, v);
                return out;
            } else {
                char buf[64];
                const auto res = std::to_chars(buf, buf + sizeof buf, v);
                return std::string(buf, res.ptr);
            }
        },
        value);
}

}  // namespace orv::repository
