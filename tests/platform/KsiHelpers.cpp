#include "KsiHelpers.h"

namespace orv::platform::test {

ListPtr stringParams(const std::vector<std::string>& values)
{
    ListPtr list(KSI_ParamListCreate(1, 1));
    for (const std::string& value : values) {
        KSI_ParamListAddString(list.get(), value.c_str());
    }
    return list;
}

ListPtr intParams(int64_t value)
{
    ListPtr list(KSI_ParamListCreate(1, 1));
    KSI_ParamListAddInt(list.get(), value);
    return list;
}

std::vector<std::string> instanceNames(const KSI_ParamList* list)
{
    std::vector<std::string> names;
    for (uint32_t i = 0; i < KSI_ParamListUsedCount(list); ++i) {
        const char* text = KSI_ParamGetString(KSI_ParamListGetParam(list, i));
        names.push_back(text != nullptr ? text : "");
    }
    return names;
}

KSI_Status checkSignature()
{
    char signature[KSI_SIGNATURE_LENGTH];
    std::copy(KSI_SIGNATURE, KSI_SIGNATURE + KSI_SIGNATURE_LENGTH, signature);
    uint32_t word = 0;
    return KSI_CheckSig(signature, KSI_SIGNATURE_LENGTH, &word);
}

} // namespace orv::platform::test
