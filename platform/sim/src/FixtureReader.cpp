#include "FixtureReader.h"

#include <cerrno>
#include <cstring>
#include <fstream>
#include <sstream>

#include "ReaderParts.h"

namespace orv::platform::sim {
namespace {

constexpr long kMaxUptime = 1L << 40;

void readHost(const JsonNode& node, HostModel& host)
{
    JsonObject object = node.object();
    host.hostName = object.required("name").text(SIZE_MAX, true);
    if (std::optional<JsonNode> fqdn = object.optionalNonNull("fqdn")) {
        host.fqdn = fqdn->text(SIZE_MAX, true);
    }
    host.osIsTmk = object.required("osIsTmk").boolean();
    if (std::optional<JsonNode> uptime = object.optionalNonNull("uptimeSeconds")) {
        host.uptimeSeconds = static_cast<long>(uptime->unsignedInteger(kMaxUptime));
    }
    object.finish();
}

std::shared_ptr<HostModel> readModel(const nlohmann::json& document)
{
    auto host = std::make_shared<HostModel>();
    JsonObject root = JsonNode(document, "$").object();
    readHost(root.required("host"), *host);
    if (std::optional<JsonNode> nics = root.optional("nics")) {
        host->nics = readNics(*nics, host->nicIndex);
    }
    if (std::optional<JsonNode> stacks = root.optional("tcpipStacks")) {
        host->tcpipStacks = readTcpipStacks(*stacks);
    }
    if (std::optional<JsonNode> cpu = root.optional("cpu")) {
        host->cpu = readCpu(*cpu);
    }
    if (std::optional<JsonNode> version = root.optional("version")) {
        host->version = readVersion(*version, host->statusCodes);
    }
    if (std::optional<JsonNode> health = root.optional("health")) {
        host->health = readHealth(*health);
    }
    if (std::optional<JsonNode> system = root.optional("system")) {
        host->system = readSystemIdentity(*system);
    }
    if (std::optional<JsonNode> faults = root.optional("faults")) {
        host->faults = readFaults(*faults, host->statusCodes);
    }
    root.finish();
    return host;
}

} // namespace

FixtureResult parseFixture(const std::string& text, const std::string& fileName)
{
    FixtureResult result;
    nlohmann::json document;
    try {
        document = nlohmann::json::parse(text);
    } catch (const nlohmann::json::parse_error& error) {
        result.error = fileName + ": $: not JSON: " + error.what();
        return result;
    }
    try {
        result.host = readModel(document);
    } catch (const FixtureError& error) {
        result.error = fileName + ": " + error.what();
    }
    return result;
}

FixtureResult readFixtureFile(const std::string& path)
{
    std::ifstream in(path, std::ios::binary);
    if (!in) {
        return FixtureResult{nullptr, path + ": cannot open: " + std::strerror(errno)};
    }
    std::ostringstream text;
    text << in.rdbuf();
    return parseFixture(text.str(), path);
}

} // namespace orv::platform::sim
