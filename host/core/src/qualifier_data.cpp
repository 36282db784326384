#include "qualifier_data.hpp"

#include <variant>

#include "object.hpp"
#include "string.hpp"

namespace orv::host::detail {

namespace repo = orv::repository;

const repo::QualifierList* qualifierList(const repo::ClassDecl& cls, char elementKind, std::string_view element) {
    switch (elementKind) {
    case 'c': return &cls.qualifiers;
    case 'p': {
        const repo::PropertyDecl* property = cls.findProperty(element);
        return property != nullptr ? &property->qualifiers : nullptr;
    }
    case 'm': {
        const repo::MethodDecl* method = cls.findMethod(element);
        return method != nullptr ? &method->qualifiers : nullptr;
    }
    default: {
        std::size_t dot = element.find('.');
        const repo::MethodDecl* method = dot == std::string_view::npos ? nullptr : cls.findMethod(element.substr(0, dot));
        const repo::ParameterDecl* parameter = method != nullptr ? method->findParameter(element.substr(dot + 1)) : nullptr;
        return parameter != nullptr ? &parameter->qualifiers : nullptr;
    }
    }
}

CMPIData qualifierData(const repo::Qualifier& qualifier, CMPIrc* rc) {
    CMPIData data{};
    if (qualifier.value.isNull()) {
        *rc = CMPI_RC_OK;
        return nullData();
    }
    if (qualifier.value.isArray()) {
        *rc = CMPI_RC_ERR_NOT_SUPPORTED;
        return nullData();
    }
    const repo::Scalar& value = qualifier.value.get();
    if (const bool* flag = std::get_if<bool>(&value)) {
        data.type = CMPI_boolean;
        data.value.boolean = *flag ? 1 : 0;
    } else if (const auto* unsignedValue = std::get_if<std::uint64_t>(&value)) {
        data.type = CMPI_uint64;
        data.value.uint64 = *unsignedValue;
    } else if (const auto* signedValue = std::get_if<std::int64_t>(&value)) {
        data.type = CMPI_sint64;
        data.value.sint64 = *signedValue;
    } else if (const auto* real = std::get_if<double>(&value)) {
        data.type = CMPI_real64;
        data.value.real64 = *real;
    } else if (const auto* character = std::get_if<char16_t>(&value)) {
        data.type = CMPI_char16;
        data.value.char16 = *character;
    } else {
        data.type = CMPI_string;
        data.value.string = newString(std::get<std::string>(value), Owner::Arena);
    }
    *rc = CMPI_RC_OK;
    return data;
}

}  // namespace orv::host::detail
