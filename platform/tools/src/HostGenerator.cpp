#include "orv/platform/simgen/HostGenerator.h"

#include <cstdarg>
#include <cstdio>

#include "CompactJson.h"
#include "orv/platform/sim/RecordFields.h"

namespace orv::platform::simgen {
namespace {

using json = nlohmann::ordered_json;
using namespace orv::platform::sim;

__attribute__((format(printf, 1, 2))) std::string format(const char* pattern, ...)
{
    char buffer[64];
    va_list args;
    va_start(args, pattern);
    std::vsnprintf(buffer, sizeof buffer, pattern, args);
    va_end(args);
    return buffer;
}

// Every field of a table set to a value derived from its position and seed.
template <typename Record, typename Value, typename Make>
void fillTable(json& out, const FieldTable<Record, Value>& table, Make make)
{
    unsigned position = 0;
    for (const auto& entry : table) {
        out[entry.first] = make(position++);
    }
}

json linkModes(bool tenGig)
{
    json modes = json::array({{{"speed", "CONNECTION_1000"}, {"duplex", "DUPLEX_MODE_FULL"}}});
    if (tenGig) {
        modes.push_back({{"speed", "CONNECTION_10000"}, {"duplex", "DUPLEX_MODE_FULL"}});
    } else {
        modes.push_back({{"speed", "CONNECTION_100"}, {"duplex", "DUPLEX_MODE_HALF"}});
        modes.push_back({{"speed", "CONNECTION_100"}, {"duplex", "DUPLEX_MODE_FULL"}});
    }
    return modes;
}

json nicInfo(unsigned index, bool tenGig)
{
    json info;
    info["supportedPorts"] = tenGig ? json::array({"PNICPORT_MODE_FIBRE"}) : json::array({"PNICPORT_MODE_TP"});
    info["supportedLinkModes"] = linkModes(tenGig);
    info["advertisedLinkModes"] = linkModes(tenGig);
    fillTable(info, infoFlagFields(), [](unsigned) { return false; });
    info["supportsAutoNegotiation"] = true;
    info["advertisedAutoNegotiation"] = true;
    info["autoNegotiation"] = !tenGig;
    info["wolSupported"] = !tenGig;
    info["speed"] = tenGig ? "CONNECTION_10000" : "CONNECTION_1000";
    info["duplex"] = "DUPLEX_MODE_FULL";
    info["port"] = tenGig ? "PNICPORT_MODE_FIBRE" : "PNICPORT_MODE_TP";
    info["PHYAD"] = index;
    info["transceiver"] = tenGig ? "TRANSCEIVER_MODE_EXTERNAL" : "TRANSCEIVER_MODE_INTERNAL";
    info["supportsWakeOn"] = tenGig ? json::array() : json::array({"WAKEON_MODE_MAGIC", "WAKEON_MODE_PHY"});
    info["wakeOn"] = tenGig ? json::array({"WAKEON_MODE_DISABLE"}) : json::array({"WAKEON_MODE_MAGIC"});
    info["messageLevel"] = 7;
    info["viraddr"] = "";
    info["linkStatus"] = "Up";
    return info;
}

json ring(unsigned rx, unsigned tx)
{
    json out{{"changed", 0}};
    fillTable(out, ringFields(), [](unsigned) { return 0; });
    out["rx"] = rx;
    out["tx"] = tx;
    return out;
}

// Two functions per adapter, adapters on buses 3 to 255; a host with more
// adapters than that goes on to the next PCI segment, so every address stays
// within the 8-bit bus number and is unique.
struct PciAddress {
    unsigned segment;
    unsigned bus;
    unsigned function;
};

constexpr unsigned kFirstBus = 3;
constexpr unsigned kBusesPerSegment = 256 - kFirstBus;

PciAddress pciAddress(unsigned index)
{
    const unsigned adapter = index / 2;
    return {adapter / kBusesPerSegment, kFirstBus + adapter % kBusesPerSegment, index % 2};
}

json nic(const HostShape& shape, unsigned index)
{
    const bool hasPci = index + shape.nicsWithoutPci < shape.nics;
    const bool tenGig = index < 2;
    const PciAddress address = pciAddress(index);
    json out;
    out["name"] = format("vmnic%u", index);
    out["pci"] = hasPci ? json{{"segment", address.segment}, {"bus", address.bus}, {"slot", 0},
                               {"function", address.function}, {"vendorId", 0x8086},
                               {"deviceId", tenGig ? 0x10fb : 0x1521}}
                        : json(nullptr);
    out["mac"] = format("00:50:56:%02x:%02x:%02x", (index >> 16) & 0xff, (index >> 8) & 0xff, index & 0xff);
    out["enabled"] = true;
    out["linkUp"] = index % 4 != 3;
    out["speed"] = tenGig ? 10000 : 1000;
    out["duplex"] = "DUPLEX_MODE_FULL";
    out["mtu"] = tenGig ? 9000 : 1500;
    out["wakeOnLan"] = {{"supported", !tenGig}, {"enabled", false}};
    out["info"] = nicInfo(index, tenGig);
    const std::string bus =
        hasPci ? format("%04x:%02x:00.%u", address.segment, address.bus, address.function) : "N/A";
    out["driver"] = {{"name", tenGig ? "ixgben" : "igbn"}, {"version", tenGig ? "1.7.1" : "0.1.1.0"},
                     {"firmwareVersion", format("0x%08x", 0x80000000u + index)}, {"busInfo", bus}};
    json stats;
    fillTable(stats, statsFields(), [index](unsigned position) { return uint64_t{1000} * (index + 1) + position; });
    out["stats"] = stats;
    json coalesce;
    fillTable(coalesce, coalesceFlagFields(), [](unsigned) { return false; });
    fillTable(coalesce, coalesceCounterFields(), [](unsigned position) { return position * 2; });
    out["coalesce"] = coalesce;
    json pause;
    fillTable(pause, pauseFlagFields(), [](unsigned) { return true; });
    pause["rxAutoNegRes"] = "AUTO_NEG_ON";
    pause["txAutoNegRes"] = "AUTO_NEG_OFF";
    out["pause"] = pause;
    out["rings"] = {{"current", ring(512, 512)}, {"preset", ring(4096, 4096)}};
    return out;
}

json vnic(const HostShape& shape, unsigned index)
{
    json out{{"name", format("vif%u", index)}};
    if (shape.ipv4) {
        out["ipv4"] = {{"address", format("10.%u.%u.10", (index >> 8) & 0xff, index & 0xff)},
                       {"netmask", "255.255.255.0"}};
    }
    json addresses = json::array();
    for (unsigned a = 0; a < shape.ipv6PerVnic; ++a) {
        addresses.push_back({{"address", a == 0 ? format("fe80::250:56ff:fe%02x:%x", index & 0xff, index)
                                                : format("fd00:%x::%x", index, a)},
                             {"prefixLength", 64}});
    }
    out["ipv6"] = addresses;
    return out;
}

json intelCpuid()
{
    return {{"id0", {"0x00000016", "0x756E6547", "0x6C65746E", "0x49656E69"}},
            {"id1", {"0x00050654", "0x00400800", "0x7FFEFBFF", "0xBFEBFBFF"}},
            {"id80", {"0x80000008", "0x00000000", "0x00000000", "0x00000000"}},
            {"id81", {"0x00000000", "0x00000000", "0x00000121", "0x2C100800"}},
            {"id88", {"0x00003030", "0x00000000", "0x00000000", "0x00000000"}},
            {"id8a", {"0x00000000", "0x00000000", "0x00000000", "0x00000000"}}};
}

json cpuSide(const HostShape& shape)
{
    json packages = json::array();
    json cpus = json::array();
    unsigned pcpu = 0;
    for (unsigned p = 0; p < shape.packages; ++p) {
        packages.push_back({{"instance", p}, {"cores", shape.coresPerPackage}});
        for (unsigned t = 0; t < shape.coresPerPackage * shape.threadsPerCore; ++t, ++pcpu) {
            cpus.push_back({{"instance", pcpu}, {"family", 6}, {"model", 85}, {"type", 0}, {"stepping", 4},
                            {"cpuid", intelCpuid()}, {"halted", pcpu % 2 == 0}, {"activeLoad", pcpu % 3}});
        }
    }
    return {{"powerPolicy", {{"id", 2}, {"shortName", "dynamic"}, {"name", "Balanced"},
                             {"description", "Reduce energy consumption with minimal performance compromise"}}},
            {"htState", shape.htState},
            {"modelName", "Intel(R) Xeon(R) Gold 6130 CPU @ 2.10GHz"},
            {"packages", packages},
            {"cpus", cpus}};
}

} // namespace

json generateHost(const HostShape& shape)
{
    json host;
    host["host"] = {{"name", "orvhost01"}, {"fqdn", "orvhost01.lab.example.com"}, {"osIsTmk", true},
                    {"uptimeSeconds", 864000}};
    json nics = json::array();
    for (unsigned i = 0; i < shape.nics; ++i) {
        nics.push_back(nic(shape, i));
    }
    host["nics"] = nics;
    json vnics = json::array();
    for (unsigned i = 0; i < shape.vnics; ++i) {
        vnics.push_back(vnic(shape, i));
    }
    host["tcpipStacks"] = {{"defaultTcpipStack", {{"vnics", vnics}}}};
    host["cpu"] = cpuSide(shape);
    host["version"] = {{"product", "Orvane Zolti"}, {"productVersion", "6.0.0"}, {"buildVersion", "build-4192238"},
                       {"buildDate", "Jul 5 2016"}, {"buildTime", "12:34:56"}, {"talmekBuild", 4192238}};
    host["faults"] = json::array();
    return host;
}

std::string generateHostText(const HostShape& shape)
{
    return compactJson(generateHost(shape));
}

} // namespace orv::platform::simgen
