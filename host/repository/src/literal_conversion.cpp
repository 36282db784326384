#include "literal_conversion.hpp"

#include <cstdint>
#include <limits>

#include "orv/repository/errors.hpp"

namespace orv::repository::mof {
namespace {

unsigned integerBits(CimType type) noexcept {
    switch (type) {
        case CimType::Uint8:
        case CimType::Sint8: return 8;
        case CimType::Uint16:
        case CimType::Sint16: return 16;
        case CimType::Uint32:
        case CimType::Sint32: return 32;
        default: return 64;
    }
}

bool fitsUnsigned(const Literal& lit, CimType type) noexcept {
    const unsigned bits = integerBits(type);
    return !lit.negative &&
           (bits == 64 || lit.magnitude <= ((std::uint64_t{1} << bits) - 1));
}

bool fitsSigned(const Literal& lit, CimType type) noexcept {
    const std::uint64_t limit = std::uint64_t{1} << (integerBits(type) - 1);
    return lit.negative ? lit.magnitude <= limit : lit.magnitude < limit;
}

std::int64_t signedValue(const Literal& lit) noexcept {
    if (!lit.negative) {
        return static_cast<std::int64_t>(lit.magnitude);
    }
    // -magnitude computed in unsigned arithmetic, so INT64_MIN needs no special case.
    return static_cast<std::int64_t>(~lit.magnitude + 1);
}

double realValue(const Literal& lit) noexcept {
    if (lit.kind == Literal::Kind::Real) {
        return lit.real;
    }
    const auto m = static_cast<double>(lit.magnitude);
    return lit.negative ? -m : m;
}

// The scalar for a literal, or nothing when it does not fit the type.
std::optional<Scalar> convert(const Literal& lit, CimType type) {
    using K = Literal::Kind;
    switch (type) {
        case CimType::Boolean:
            return lit.kind == K::Boolean ? std::optional<Scalar>(lit.boolean) : std::nullopt;
        case CimType::String:
        case CimType::Datetime:
        case CimType::Reference:
            return lit.kind == K::String ? std::optional<Scalar>(lit.text) : std::nullopt;
        case CimType::Char16:
            return lit.kind == K::Char16 ? std::optional<Scalar>(lit.ch) : std::nullopt;
        case CimType::Real32:
        case CimType::Real64:
            return (lit.kind == K::Real || lit.kind == K::Integer)
                       ? std::optional<Scalar>(realValue(lit))
                       : std::nullopt;
        default:
            break;
    }
    if (lit.kind != K::Integer) {
        return std::nullopt;
    }
    if (isUnsignedInteger(type)) {
        return fitsUnsigned(lit, type) ? std::optional<Scalar>(lit.magnitude) : std::nullopt;
    }
    return fitsSigned(lit, type) ? std::optional<Scalar>(signedValue(lit)) : std::nullopt;
}

}  // namespace

Value toValue(const ValueSyntax& value, const DataType& type, const std::string& file,
              std::string_view what) {
    if (!value.present) {
        return Value::null();
    }
    const auto bad = [&](const std::string& why) {
        return MofError(file, value.line, why + " for " + std::string(what));
    };
    if (value.isArray && !type.isArray) {
        throw bad("unexpected array value");
    }
    if (!value.isArray && value.items.front().kind == Literal::Kind::Null) {
        return Value::null();
    }
    std::vector<Scalar> items;
    items.reserve(value.items.size());
    for (const Literal& lit : value.items) {
        if (lit.kind == Literal::Kind::Null) {
            throw bad("unexpected null inside array value");
        }
        auto scalar = convert(lit, type.type);
        if (!scalar) {
            throw bad("expected a " + std::string(cimTypeName(type.type)) + " value");
        }
        items.push_back(std::move(*scalar));
    }
    if (type.isArray) {
        return Value::array(std::move(items));
    }
    return Value::scalar(std::move(items.front()));
}

DataType inferType(const ValueSyntax& value) {
    DataType t;
    t.isArray = value.isArray;
    t.type = CimType::Boolean;
    if (!value.present) {
        return t;
    }
    t.type = CimType::String;
    for (const Literal& lit : value.items) {
        switch (lit.kind) {
            case Literal::Kind::Boolean: t.type = CimType::Boolean; return t;
            case Literal::Kind::Integer:
                t.type = lit.negative ? CimType::Sint64 : CimType::Uint64;
                return t;
            case Literal::Kind::Real: t.type = CimType::Real64; return t;
            case Literal::Kind::Char16: t.type = CimType::Char16; return t;
            case Literal::Kind::String: return t;
            case Literal::Kind::Null: break;
        }
    }
    return t;
}

}  // namespace orv::repository::mof
