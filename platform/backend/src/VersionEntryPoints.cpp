// The system version service and the host-type query, answered by the
// selected substitute.
#include <cerrno>
#include <algorithm>
#include <cstring>
#include <string>

#include "ksi/HostType.h"
#include "orv/platform/backend/Selector.h"
#include "tmkuser/Version.h"

namespace {

// Code answered when the substitute itself broke down mid-call.
constexpr TmkuserStatus_Code kInternalFailure = 0xBAD00002u;

} // namespace

extern "C" {

TmkuserStatus_Code TmkuserVersion_GetSystemVersion(TmkuserVersion_SystemVersionInfo* info)
{
    if (info == nullptr) {
        return kInternalFailure;
    }
    try {
        orv::platform::activeBackend().beginBatch();
        return orv::platform::activeBackend().version().getSystemVersion(*info);
    } catch (...) {
        return kInternalFailure;
    }
}

int TmkuserStatus_CodeToErrno(TmkuserStatus_Code code)
{
    try {
        return orv::platform::activeBackend().version().codeToErrno(code);
    } catch (...) {
        return EIO;
    }
}

const char* TmkuserStatus_CodeToString(TmkuserStatus_Code code, char* buffer, size_t bufferSize)
{
    if (buffer == nullptr || bufferSize == 0) {
        return buffer;
    }
    std::string text;
    try {
        text = orv::platform::activeBackend().version().codeToString(code);
    } catch (...) {
        text = "status text unavailable";
    }
    const size_t length = std::min(text.size(), bufferSize - 1);
    std::memcpy(buffer, text.data(), length);
    buffer[length] = '\0';
    return buffer;
}

bool HostType_OSIsTMK(void)
{
    try {
        orv::platform::activeBackend().beginBatch();
        return orv::platform::activeBackend().version().osIsTmk();
    } catch (...) {
        return false;
    }
}

} // extern "C"
