// The texts that name a hypervisor image in its software identity.
#include <cstring>
#include <string>

#include "HypervisorSWID-Version.h"

namespace HypervisorSWID {
namespace {

constexpr const char* kAltBootBankPrefix = "Alt Boot Bank: ";
constexpr const char* kAltBootBankSuffix = " Alternate Boot Bank";

}  // namespace

std::string field(const char (&text)[32]) { return std::string(text, strnlen(text, sizeof text)); }

bool isAltBootBank(const TmkuserVersion_SystemVersionInfo& record) { return record.buildVersion[0] == '\0'; }

std::string versionString(const TmkuserVersion_SystemVersionInfo& record) {
    return field(record.productVersion) + " build-" + std::to_string(record.talmekBuild);
}

std::string buildInstanceId(const TmkuserVersion_SystemVersionInfo& record) {
    const std::string prefix = isAltBootBank(record) ? kAltBootBankPrefix : "";
    return prefix + field(record.product) + " " + versionString(record);
}

std::string displayName(const TmkuserVersion_SystemVersionInfo& record) {
    return field(record.product) + (isAltBootBank(record) ? kAltBootBankSuffix : "");
}

}  // namespace HypervisorSWID
