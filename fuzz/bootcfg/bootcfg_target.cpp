// libFuzzer target for the alternate boot bank's boot.cfg reader: any file
// content must leave a record that is safe to print, whose texts end within
// their fields and whose product is either unset or the kernel product.
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <vector>

#include "HypervisorSWID-Version.h"

namespace {

bool endsWithinField(const char (&field)[32]) { return std::memchr(field, '\0', sizeof field) != nullptr; }

void check(bool condition) {
    if (!condition) {
        __builtin_trap();
    }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    std::vector<char> content(data, data + size);
    content.push_back('\0');  // fmemopen needs a buffer of at least one byte
    std::FILE* file = ::fmemopen(content.data(), size == 0 ? 1 : size, "r");
    if (file == nullptr) {
        return 0;
    }
    TmkuserVersion_SystemVersionInfo record{};
    HypervisorSWID::readAlternateBootConfig(file, record);
    std::fclose(file);
    check(endsWithinField(record.product) && endsWithinField(record.productVersion));
    check(record.product[0] == '\0' || std::strcmp(record.product, HypervisorSWID::kKernelProduct) == 0);
    check(record.buildVersion[0] == '\0' && record.buildDate[0] == '\0' && record.buildTime[0] == '\0');
    check(record.product[0] != '\0' || record.talmekBuild == 0);
    (void)HypervisorSWID::buildInstanceId(record);
    return 0;
}
