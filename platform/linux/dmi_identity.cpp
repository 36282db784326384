#include "dmi_identity.hpp"

#include "text_files.hpp"

namespace orv::linuxhost {

namespace {

constexpr const char* kDmiFolder = "/sys/class/dmi/id/";

std::optional<std::string> dmiValue(const std::string& root, const char* file)
{
    std::optional<std::string> line = readLine(root + kDmiFolder + file);
    if (!line || line->empty()) return std::nullopt;
    return line;
}

}  // namespace

orv::platform::SystemIdentity readDmiIdentity(const std::string& root)
{
    orv::platform::SystemIdentity identity;
    identity.vendor = dmiValue(root, "sys_vendor");
    identity.product = dmiValue(root, "product_name");
    identity.serialNumber = dmiValue(root, "product_serial");
    identity.uuid = dmiValue(root, "product_uuid");
    return identity;
}

}  // namespace orv::linuxhost
