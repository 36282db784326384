// The complete types behind the opaque KSI_Param and KSI_ParamList of the
// kernel system-information calls, as every substitute sees them.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "ksi/Ksi.h"

struct KSI_Param {
    enum class Kind : uint8_t { Empty, Int, String };

    Kind kind = Kind::Empty;
    int64_t intValue = 0;
    std::string text;

    static KSI_Param ofInt(int64_t value) { return KSI_Param{Kind::Int, value, {}}; }
    static KSI_Param ofString(std::string value) { return KSI_Param{Kind::String, 0, std::move(value)}; }

    // The parameter as the fixture names it: the text, or the number in decimal.
    std::string describe() const { return kind == Kind::String ? text : kind == Kind::Int ? std::to_string(intValue) : std::string(); }
};

namespace orv::platform {
// A parameter or instance list: a slot of Kind::Empty holds no parameter.
using KsiParams = std::vector<KSI_Param>;
} // namespace orv::platform

struct KSI_ParamList {
    orv::platform::KsiParams items;
};
