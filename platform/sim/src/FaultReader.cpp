// The "faults" section: which calls fail, where and when.
#include "KsiNodeNames.h"
#include "ReaderParts.h"

namespace orv::platform::sim {
namespace {

void checkStatus(const FaultRule& rule, const JsonNode& node)
{
    if (rule.status && *rule.status == 0) {
        node.fail("a failure status must not be 0");
    }
}

// The version service's code may carry the errno and message it stands for.
void readVersionStatus(JsonObject& object, FaultRule& rule, std::map<TmkuserStatus_Code, StatusText>& codes)
{
    if (rule.call != "TmkuserVersion_GetSystemVersion" || !rule.status) {
        return;
    }
    if (object.optional("errno") || object.optional("message")) {
        codes[static_cast<TmkuserStatus_Code>(*rule.status)] = readStatusText(object);
    }
}

// A getifaddrs rule with "family" adds an entry for its "nic" (an address of
// that family, or none for null) instead of failing the call.
void readInterfaceEntry(JsonObject& object, FaultRule& rule)
{
    std::optional<JsonNode> field = object.optional("family");
    if (!field) {
        return;
    }
    if (rule.call != "getifaddrs") {
        field->fail("only getifaddrs rules add an entry");
    }
    if (!rule.nic) {
        field->fail("an added entry needs \"nic\", the interface it belongs to");
    }
    rule.addsEntry = true;
    if (!field->isNull()) {
        rule.entryFamily = static_cast<uint16_t>(field->unsignedInteger(UINT16_MAX));
    }
}

FaultRule readRule(const JsonNode& node, std::map<TmkuserStatus_Code, StatusText>& codes)
{
    JsonObject object = node.object();
    FaultRule rule;
    JsonNode call = object.required("call");
    rule.call = call.text(SIZE_MAX, true);
    if (!isKnownCall(rule.call)) {
        call.fail("unknown call \"" + rule.call + "\"");
    }
    if (std::optional<JsonNode> field = object.optional("node")) {
        rule.node = field->text(SIZE_MAX, true);
        if (!callReadsNode(rule.call)) {
            field->fail("only KSI_Get and KSI_GetInstanceListAlloc read a node");
        }
        if (!nodeByName(*rule.node)) {
            field->fail("unknown node \"" + *rule.node + "\"");
        }
    }
    if (std::optional<JsonNode> field = object.optional("param")) {
        rule.param = field->text(SIZE_MAX);
    }
    if (std::optional<JsonNode> field = object.optional("nic")) {
        rule.nic = field->text(SIZE_MAX, true);
    }
    if (std::optional<JsonNode> field = object.optional("nth")) {
        rule.nth = field->unsignedInteger(UINT64_MAX);
        if (*rule.nth == 0) {
            field->fail("nth counts from 1");
        }
    }
    if (std::optional<JsonNode> field = object.optional("status")) {
        rule.status = field->integer(INT32_MIN, UINT32_MAX);
        checkStatus(rule, *field);
    }
    readInterfaceEntry(object, rule);
    readVersionStatus(object, rule, codes);
    if (std::optional<JsonNode> field = object.optional("message")) {
        rule.message = field->text(SIZE_MAX);
    }
    object.finish();
    return rule;
}

} // namespace

FaultTable readFaults(const JsonNode& node, std::map<TmkuserStatus_Code, StatusText>& codes)
{
    std::vector<FaultRule> rules;
    for (const JsonNode& item : node.array()) {
        rules.push_back(readRule(item, codes));
    }
    return FaultTable(std::move(rules));
}

} // namespace orv::platform::sim
