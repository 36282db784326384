// The "system" section: the machine's firmware identity.
#include "ReaderParts.h"

namespace orv::platform::sim {
namespace {

// DMI strings are at most 255 bytes.
constexpr size_t kMaxIdentityText = 255;

std::optional<std::string> readField(JsonObject& object, const char* key)
{
    if (std::optional<JsonNode> node = object.optionalNonNull(key)) {
        return node->text(kMaxIdentityText, true);
    }
    return std::nullopt;
}

} // namespace

SystemIdentity readSystemIdentity(const JsonNode& node)
{
    JsonObject object = node.object();
    SystemIdentity identity;
    identity.vendor = readField(object, "vendor");
    identity.product = readField(object, "product");
    identity.serialNumber = readField(object, "serialNumber");
    identity.uuid = readField(object, "uuid");
    object.finish();
    return identity;
}

} // namespace orv::platform::sim
