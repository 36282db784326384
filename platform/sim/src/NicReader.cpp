// The "nics" section: one physical NIC per entry with every record it serves.
#include <cstdio>

#include "ReaderParts.h"
#include "orv/platform/sim/RecordFields.h"

namespace orv::platform::sim {
namespace {

using namespace NodeMgr::Network;

template <typename Enum>
Enum enumOf(const JsonNode& node, const EnumNames& names)
{
    return static_cast<Enum>(node.enumerator(names, INT32_MIN, INT32_MAX));
}

template <typename Record, typename Value, typename Read>
void readFields(JsonObject& object, Record& record, const FieldTable<Record, Value>& table, Read read)
{
    for (const auto& [key, member] : table) {
        record.*member = read(object.required(key));
    }
}

uint32_t u32(const JsonNode& node)
{
    return static_cast<uint32_t>(node.unsignedInteger(UINT32_MAX));
}

MacBytes readMac(const JsonNode& node)
{
    const std::string text = node.text(17);
    MacBytes mac{};
    unsigned int parts[6];
    char tail = 0;
    if (std::sscanf(text.c_str(), "%2x:%2x:%2x:%2x:%2x:%2x%c", &parts[0], &parts[1], &parts[2], &parts[3], &parts[4],
                    &parts[5], &tail) != 6 ||
        text.size() != 17) {
        node.fail("expected a MAC address as six hexadecimal pairs separated by ':', got \"" + text + "\"");
    }
    for (size_t i = 0; i < mac.size(); ++i) {
        mac[i] = static_cast<unsigned char>(parts[i]);
    }
    return mac;
}

PciModel readPci(const JsonNode& node)
{
    JsonObject object = node.object();
    PciModel pci;
    pci.segment = static_cast<uint16_t>(object.required("segment").unsignedInteger(UINT16_MAX));
    pci.bus = static_cast<uint8_t>(object.required("bus").unsignedInteger(UINT8_MAX));
    pci.slot = static_cast<uint8_t>(object.required("slot").unsignedInteger(UINT8_MAX));
    pci.function = static_cast<uint8_t>(object.required("function").unsignedInteger(UINT8_MAX));
    pci.vendorId = static_cast<uint16_t>(object.required("vendorId").unsignedInteger(UINT16_MAX));
    pci.deviceId = static_cast<uint16_t>(object.required("deviceId").unsignedInteger(UINT16_MAX));
    object.finish();
    return pci;
}

template <typename Enum>
std::vector<Enum> readEnumList(const JsonNode& node, const EnumNames& names)
{
    std::vector<Enum> values;
    for (const JsonNode& item : node.array()) {
        values.push_back(enumOf<Enum>(item, names));
    }
    return values;
}

std::vector<LinkMode> readLinkModes(const JsonNode& node)
{
    std::vector<LinkMode> modes;
    for (const JsonNode& item : node.array()) {
        JsonObject object = item.object();
        LinkSpeed speed = enumOf<LinkSpeed>(object.required("speed"), linkSpeedNames());
        Duplex duplex = enumOf<Duplex>(object.required("duplex"), duplexNames());
        object.finish();
        modes.emplace_back(speed, duplex);
    }
    return modes;
}

PnicInfo readInfo(const JsonNode& node)
{
    JsonObject object = node.object();
    PnicInfo info;
    info.supportedPorts = readEnumList<PnicPortMode>(object.required("supportedPorts"), portModeNames());
    info.supportedLinkModes = readLinkModes(object.required("supportedLinkModes"));
    info.advertisedLinkModes = readLinkModes(object.required("advertisedLinkModes"));
    readFields(object, info, infoFlagFields(), [](const JsonNode& n) { return n.boolean(); });
    info.speed = enumOf<LinkSpeed>(object.required("speed"), linkSpeedNames());
    info.duplex = enumOf<Duplex>(object.required("duplex"), duplexNames());
    info.port = enumOf<PnicPortMode>(object.required("port"), portModeNames());
    info.PHYAD = u32(object.required("PHYAD"));
    info.transceiver = enumOf<TransceiverMode>(object.required("transceiver"), transceiverNames());
    info.supportsWakeOn = readEnumList<WakeOnMode>(object.required("supportsWakeOn"), wakeOnNames());
    info.wakeOn = readEnumList<WakeOnMode>(object.required("wakeOn"), wakeOnNames());
    info.messageLevel = u32(object.required("messageLevel"));
    info.viraddr = object.required("viraddr").text(SIZE_MAX);
    info.linkStatus = object.required("linkStatus").text(SIZE_MAX);
    object.finish();
    return info;
}

PnicDriverInfo readDriver(const JsonNode& node)
{
    JsonObject object = node.object();
    PnicDriverInfo driver;
    readFields(object, driver, driverFields(), [](const JsonNode& n) { return n.text(SIZE_MAX); });
    object.finish();
    return driver;
}

PnicStats readStats(const JsonNode& node)
{
    JsonObject object = node.object();
    PnicStats stats;
    readFields(object, stats, statsFields(), [](const JsonNode& n) { return n.unsignedInteger(UINT64_MAX); });
    object.finish();
    return stats;
}

PnicCoalesceInfo readCoalesce(const JsonNode& node)
{
    JsonObject object = node.object();
    PnicCoalesceInfo coalesce;
    readFields(object, coalesce, coalesceFlagFields(), [](const JsonNode& n) { return n.boolean(); });
    readFields(object, coalesce, coalesceCounterFields(), u32);
    object.finish();
    return coalesce;
}

PnicPauseInfo readPause(const JsonNode& node)
{
    JsonObject object = node.object();
    PnicPauseInfo pause;
    readFields(object, pause, pauseFlagFields(), [](const JsonNode& n) { return n.boolean(); });
    pause.rxAutoNegRes = enumOf<PauseAutoNegResult>(object.required("rxAutoNegRes"), pauseResultNames());
    pause.txAutoNegRes = enumOf<PauseAutoNegResult>(object.required("txAutoNegRes"), pauseResultNames());
    object.finish();
    return pause;
}

PnicRingInfo readRing(const JsonNode& node)
{
    JsonObject object = node.object();
    PnicRingInfo ring;
    ring.changed = static_cast<uint8_t>(object.required("changed").unsignedInteger(UINT8_MAX));
    readFields(object, ring, ringFields(), u32);
    object.finish();
    return ring;
}

RingsModel readRings(const JsonNode& node)
{
    JsonObject object = node.object();
    RingsModel rings;
    rings.current = readRing(object.required("current"));
    rings.preset = readRing(object.required("preset"));
    object.finish();
    return rings;
}

template <typename Value>
std::optional<Value> readOptional(JsonObject& object, const char* key, Value (*read)(const JsonNode&))
{
    std::optional<JsonNode> node = object.optional(key);
    return node ? std::optional<Value>(read(*node)) : std::nullopt;
}

NicModel readNic(const JsonNode& node)
{
    JsonObject object = node.object();
    NicModel nic;
    nic.name = object.required("name").text(SIZE_MAX, true);
    JsonNode pci = object.required("pci");
    if (!pci.isNull()) {
        nic.pci = readPci(pci);
    }
    nic.mac = readMac(object.required("mac"));
    nic.enabled = object.required("enabled").boolean();
    nic.linkUp = object.required("linkUp").boolean();
    nic.speed = enumOf<LinkSpeed>(object.required("speed"), linkSpeedNames());
    nic.duplex = enumOf<Duplex>(object.required("duplex"), duplexNames());
    nic.mtu = u32(object.required("mtu"));
    JsonObject wol = object.required("wakeOnLan").object();
    nic.wolSupported = wol.required("supported").boolean();
    nic.wolEnabled = wol.required("enabled").boolean();
    wol.finish();
    nic.info = readOptional(object, "info", readInfo);
    nic.driver = readOptional(object, "driver", readDriver);
    nic.stats = readOptional(object, "stats", readStats);
    nic.coalesce = readOptional(object, "coalesce", readCoalesce);
    nic.pause = readOptional(object, "pause", readPause);
    nic.rings = readOptional(object, "rings", readRings);
    object.finish();
    return nic;
}

} // namespace

std::vector<NicModel> readNics(const JsonNode& node, std::unordered_map<std::string, size_t>& index)
{
    std::vector<NicModel> nics;
    index.clear();
    for (const JsonNode& item : node.array()) {
        nics.push_back(readNic(item));
        if (!index.emplace(nics.back().name, nics.size() - 1).second) {
            item.fail("duplicate NIC name \"" + nics.back().name + "\"");
        }
    }
    return nics;
}

} // namespace orv::platform::sim
