// Version records of the hypervisor images and the texts derived from them:
// the alternate boot bank's boot.cfg reader, the build-number and release-date
// conversions, and the identity texts of a record.
//
// Nothing here talks to the broker or the platform, so the boot.cfg reader can
// also be driven by the fuzz target and the unit tests.
#pragma once

#include <cstdint>
#include <cstdio>
#include <string>

#include <tmkuser/Version.h>

namespace HypervisorSWID {

// Product name given to the hypervisor kernel's images (and to the alternate bank).
inline constexpr const char* kKernelProduct = "Orvane Zolti";

// A text field of the record, up to its NUL or its 32nd byte.
std::string field(const char (&text)[32]);

// A record is the alternate bank's exactly when its buildVersion is empty.
bool isAltBootBank(const TmkuserVersion_SystemVersionInfo& record);

// "[Alt Boot Bank: ]<product> <productVersion> build-<talmekBuild>".
std::string buildInstanceId(const TmkuserVersion_SystemVersionInfo& record);

// "<productVersion> build-<talmekBuild>".
std::string versionString(const TmkuserVersion_SystemVersionInfo& record);

// "<product>", plus " Alternate Boot Bank" for the alternate record.
std::string displayName(const TmkuserVersion_SystemVersionInfo& record);

// The build number of the text after the "-" of a "build=" value: c for
// "a.b.c", a for "a", when the numbers read back as exactly that text;
// otherwise -1 (as 0xffffffff).
std::uint32_t buildNumberOf(const char* text);

// Reads a boot configuration from file into record, which the caller has
// zero-filled: the first line beginning with "build=" gives productVersion,
// product and talmekBuild. Without such a line, or without a "-" in its
// value, record stays as it is. The file is not closed.
void readAlternateBootConfig(std::FILE* file, TmkuserVersion_SystemVersionInfo& record);

// Month number 0-11 of a month name: the first letter must be upper case, the
// letters after it may be either case; anything unrecognised is 0.
int charToNumMonth(const char* month);

// Local midnight (daylight saving off) of a "<month> <day> <year>" text in
// microseconds since the epoch; false when the text does not read as all three.
bool releaseDateOf(const char* buildDate, std::uint64_t& microseconds);

}  // namespace HypervisorSWID
