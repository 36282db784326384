// The CIM status codes each operation may answer, as DSP0200 1.3 lists them per
// operation, and the code an error is sent with when its own code is not on the
// operation's list (a provider answering CIM_ERR_NO_SUCH_PROPERTY to GetInstance,
// CIM_ERR_INVALID_CLASS for an association request, ...): the nearest code the
// operation may answer. The description travels unchanged.
#pragma once

#include <string_view>

namespace orv::cimhost::detail {

// The name that stands for extrinsic method calls in the table.
inline constexpr std::string_view kMethodCall = "(method call)";

// Whether `operation` (an intrinsic operation's name as DSP0200 spells it, or
// kMethodCall) may answer `code`. Operations without a list answer any code.
bool mayAnswer(std::string_view operation, int code);

// The code `operation` answers for an error of `code`: the code itself when the
// operation may answer it, else the first of the codes nearest to it (see
// operation_errors.cpp) that the operation may answer, else CIM_ERR_FAILED.
int answeredCode(std::string_view operation, int code);

}  // namespace orv::cimhost::detail
