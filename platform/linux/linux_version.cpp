#include "linux_backend.hpp"
#include "fixed_text.hpp"
#include "linux_call_error.hpp"

#include <algorithm>
#include <cctype>
#include <cstring>
#include <string>

namespace orv::linuxhost {

void fillVersionRecord(const SystemVersion& version, TmkuserVersion_SystemVersionInfo& info)
{
    putFixedText(info.product, version.product);
    putFixedText(info.productVersion, version.productVersion);
    putFixedText(info.buildVersion, version.buildVersion);
    putFixedText(info.buildDate, version.buildDate);
    putFixedText(info.buildTime, version.buildTime);
    info.talmekBuild = version.build;
}

bool parseHostTypeSetting(const char* value)
{
    if (!value) return false;
    std::string text(value);
    std::transform(text.begin(), text.end(), text.begin(), [](unsigned char c) { return std::tolower(c); });
    return text == "1" || text == "true" || text == "yes";
}

LinuxVersion::LinuxVersion(std::string root, bool hypervisorKernel)
    : root_(std::move(root)), hypervisorKernel_(hypervisorKernel)
{
}

TmkuserStatus_Code LinuxVersion::getSystemVersion(TmkuserVersion_SystemVersionInfo& info)
{
    try {
        fillVersionRecord(readSystemVersion(root_), info);
        return TMKUSER_STATUS_OK;
    } catch (const LinuxCallError& error) {
        return static_cast<TmkuserStatus_Code>(error.error());  // the code is the errno
    }
}

int LinuxVersion::codeToErrno(TmkuserStatus_Code code) { return static_cast<int>(code); }

std::string LinuxVersion::codeToString(TmkuserStatus_Code code)
{
    if (code == TMKUSER_STATUS_OK) return "Success";
    return std::string("System version unavailable: ") + std::strerror(static_cast<int>(code));
}

bool LinuxVersion::osIsTmk() { return hypervisorKernel_; }

}  // namespace orv::linuxhost
