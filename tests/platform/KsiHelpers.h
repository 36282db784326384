// Small helpers for driving the KSI calls in tests.
#pragma once

#include <memory>
#include <string>
#include <vector>

#include "ksi/Ksi.h"

namespace orv::platform::test {

struct ListDeleter {
    void operator()(KSI_ParamList* list) const { KSI_ParamListDestroy(list); }
};
using ListPtr = std::unique_ptr<KSI_ParamList, ListDeleter>;

// A parameter list holding the given strings.
ListPtr stringParams(const std::vector<std::string>& values);
// A parameter list holding one integer.
ListPtr intParams(int64_t value);
// The strings of an instance list (empty text for empty slots).
std::vector<std::string> instanceNames(const KSI_ParamList* list);
KSI_Status checkSignature();

} // namespace orv::platform::test
