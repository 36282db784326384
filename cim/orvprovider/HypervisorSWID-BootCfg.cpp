// The alternate boot bank's boot.cfg: its first "build=" line names the
// version and build of the image that the host would boot next.
#include <sys/types.h>

#include <cctype>
#include <cstdlib>
#include <cstring>

#include "HypervisorSWID-Version.h"

namespace HypervisorSWID {
namespace {

constexpr const char kBuildKey[] = "build=";
constexpr std::size_t kBuildKeyLength = sizeof kBuildKey - 1;
// First size of the line buffer; getline grows it for longer lines.
constexpr std::size_t kFirstLineBufferSize = 39;
constexpr int kNoBuildNumber = -1;

void stripTrailingSpace(char* text) {
    std::size_t length = std::strlen(text);
    while (length > 0 && std::isspace(static_cast<unsigned char>(text[length - 1])) != 0) {
        text[--length] = '\0';
    }
}

// Whether text reads back exactly as the numbers that were read from it
// (no leading zeros, signs other than "-", blanks or anything after them).
bool rebuildsTo(const char* text, int a, int b, int c) {
    char rebuilt[3 * 12 + 3];
    std::snprintf(rebuilt, sizeof rebuilt, "%d.%d.%d", a, b, c);
    return std::strcmp(rebuilt, text) == 0;
}

bool rebuildsTo(const char* text, int a) {
    char rebuilt[12 + 1];
    std::snprintf(rebuilt, sizeof rebuilt, "%d", a);
    return std::strcmp(rebuilt, text) == 0;
}

// The value of a "build=" line: "<productVersion>-<build text>".
void applyBuildValue(char* value, TmkuserVersion_SystemVersionInfo& record) {
    stripTrailingSpace(value);
    char* dash = std::strchr(value, '-');
    if (dash == nullptr) {
        return;
    }
    *dash = '\0';
    std::strncpy(record.productVersion, value, sizeof record.productVersion - 1);
    std::strncpy(record.product, kKernelProduct, sizeof record.product - 1);
    record.talmekBuild = buildNumberOf(dash + 1);
}

}  // namespace

std::uint32_t buildNumberOf(const char* text) {
    int a = 0;
    int b = 0;
    int c = 0;
    int number = kNoBuildNumber;
    switch (std::sscanf(text, "%d.%d.%d", &a, &b, &c)) {
    case 3:
        number = rebuildsTo(text, a, b, c) ? c : kNoBuildNumber;
        break;
    case 1:
        number = rebuildsTo(text, a) ? a : kNoBuildNumber;
        break;
    default:
        break;
    }
    return static_cast<std::uint32_t>(number);
}

void readAlternateBootConfig(std::FILE* file, TmkuserVersion_SystemVersionInfo& record) {
    std::size_t capacity = kFirstLineBufferSize;
    char* line = static_cast<char*>(std::malloc(capacity));
    if (line == nullptr) {
        return;
    }
    while (::getline(&line, &capacity, file) != -1) {
        if (std::strncmp(line, kBuildKey, kBuildKeyLength) == 0) {
            applyBuildValue(line + kBuildKeyLength, record);
            break;
        }
    }
    std::free(line);
}

}  // namespace HypervisorSWID
