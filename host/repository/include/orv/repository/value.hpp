// Values of properties, parameters and qualifiers as read from MOF.
//
// Literals are converted to the declared type when they are read, so a value
// holds exactly one alternative per type:
//   boolean -> bool, uint8..uint64 -> std::uint64_t, sint8..sint64 -> std::int64_t,
//   real32/real64 -> double, char16 -> char16_t,
//   string, datetime and reference (an object path) -> std::string.
#pragma once

#include <cstdint>
#include <string>
#include <variant>
#include <vector>

namespace orv::repository {

using Scalar = std::variant<bool, std::uint64_t, std::int64_t, double, char16_t, std::string>;

// Text form of a scalar as CIM-XML writes it in <VALUE>: "true"/"false", decimal
// integers, reals in shortest round-trip form, strings and char16 as UTF-8.
std::string scalarToText(const Scalar& value);

class Value {
public:
    Value() = default;  // null
    static Value null() { return Value(); }
    static Value scalar(Scalar item);
    static Value array(std::vector<Scalar> items);

    bool isNull() const noexcept { return kind_ == Kind::Null; }
    bool isArray() const noexcept { return kind_ == Kind::Array; }
    // The scalar; only when !isNull() && !isArray().
    const Scalar& get() const { return items_.front(); }
    // The elements; only when isArray().
    const std::vector<Scalar>& elements() const noexcept { return items_; }

    bool operator==(const Value&) const = default;

private:
    enum class Kind : std::uint8_t { Null, One, Array };
    Kind kind_ = Kind::Null;
    std::vector<Scalar> items_;
};

}  // namespace orv::repository
