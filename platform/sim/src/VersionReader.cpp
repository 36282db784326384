// The "version" section: the running system's record, or the failure the
// version service answers.
#include "ReaderParts.h"

namespace orv::platform::sim {
namespace {

constexpr size_t kTextField = 31;  // 32-byte fields, always NUL-terminated

} // namespace

StatusText readStatusText(JsonObject& object)
{
    StatusText text;
    text.errnoValue = static_cast<int>(object.required("errno").integer(0, 4095));
    text.message = object.required("message").text(1023);
    return text;
}

VersionModel readVersion(const JsonNode& node, std::map<TmkuserStatus_Code, StatusText>& codes)
{
    JsonObject object = node.object();
    VersionModel version;
    if (std::optional<JsonNode> failure = object.optional("failure")) {
        JsonObject fields = failure->object();
        JsonNode codeNode = fields.required("code");
        version.failureCode = static_cast<TmkuserStatus_Code>(codeNode.unsignedInteger(UINT32_MAX));
        if (version.failureCode == TMKUSER_STATUS_OK) {
            codeNode.fail("a failure code must not be 0");
        }
        codes[version.failureCode] = readStatusText(fields);
        fields.finish();
        object.finish();
        return version;
    }
    TmkuserVersion_SystemVersionInfo record{};
    copyText(record.product, object.required("product").text(kTextField));
    copyText(record.productVersion, object.required("productVersion").text(kTextField));
    copyText(record.buildVersion, object.required("buildVersion").text(kTextField));
    copyText(record.buildDate, object.required("buildDate").text(kTextField));
    copyText(record.buildTime, object.required("buildTime").text(kTextField));
    record.talmekBuild = static_cast<uint32_t>(object.required("talmekBuild").unsignedInteger(UINT32_MAX));
    object.finish();
    version.record = record;
    return version;
}

} // namespace orv::platform::sim
