// The running system's version record from /etc/os-release and uname.
#pragma once

#include <cstdint>
#include <map>
#include <string>
#include <string_view>

namespace orv::linuxhost {

// KEY=value lines; values may be quoted with " or ' and use backslash escapes.
std::map<std::string, std::string> parseOsRelease(std::string_view text);

struct KernelIdentity {
    std::string release;  // uname -r
    std::string version;  // uname -v, e.g. "#1 SMP PREEMPT_DYNAMIC Debian 6.1.76-1 (2024-02-01)"
};

struct SystemVersion {
    std::string product;         // NAME
    std::string productVersion;  // VERSION_ID
    std::string buildVersion;    // kernel release
    std::string buildDate;       // "Feb 1 2024" from the kernel version text, or empty
    std::string buildTime;       // "hh:mm:ss" from the kernel version text, or empty
    std::uint32_t build = 0;     // the kernel's build counter ("#N")
};

SystemVersion describeSystem(const std::map<std::string, std::string>& osRelease, const KernelIdentity& kernel);
// The build date in the kernel version text: "Mon Jan  1 10:00:00 UTC 2024" or "(2024-02-01)".
std::string buildDateOf(std::string_view kernelVersion);
std::string buildTimeOf(std::string_view kernelVersion);

// Reads <root>/etc/os-release, else <root>/usr/lib/os-release, and uname.
// Throws LinuxCallError when neither file can be read.
SystemVersion readSystemVersion(const std::string& root = "");

}  // namespace orv::linuxhost
