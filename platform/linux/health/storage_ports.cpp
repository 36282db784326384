#include "storage_ports.hpp"

#include "../text_files.hpp"
#include "health_state.hpp"
#include "sysfs_dir.hpp"

#include <cmath>
#include <cstdlib>

namespace orv::linuxhost::health {

namespace {

std::optional<std::uint64_t> rateAt(const std::string& path)
{
    std::optional<std::string> text = readLine(path);
    return text ? linkRateBits(*text) : std::nullopt;
}

StoragePort readSasPhy(const std::string& dir, const std::string& entry)
{
    StoragePort port;
    const std::optional<std::string> address = readLine(dir + "/sas_address");
    const std::optional<std::uint64_t> phy = readNumber(dir + "/phy_identifier");
    if (address && phy) {
        port.id = "sas:" + *address + "/phy" + std::to_string(*phy);
        port.name = "SAS phy " + std::to_string(*phy) + " of " + *address;
    } else {
        port.id = "sas:" + entry;
        port.name = "SAS " + entry;
    }
    port.speed = rateAt(dir + "/negotiated_linkrate");
    port.invalidDwords = readNumber(dir + "/invalid_dword_count");
    port.disparityErrors = readNumber(dir + "/running_disparity_error_count");
    port.lostDwordSync = readNumber(dir + "/loss_of_dword_sync_count");
    port.resetProblems = readNumber(dir + "/phy_reset_problem_count");
    return port;
}

// The speed-down counts of the devices behind a link (its devX[.Y].Z folders).
std::optional<std::uint64_t> speedDownsBehind(const std::string& linkDevice)
{
    std::optional<std::uint64_t> total;
    for (const std::string& dev : entriesStartingWith(linkDevice, "dev")) {
        std::optional<std::uint64_t> count = readNumber(linkDevice + "/" + dev + "/ata_device/" + dev + "/spdn_cnt");
        if (count) total = total.value_or(0) + *count;
    }
    return total;
}

// The part after the dot of "link1.3" (a port-multiplier port), or empty.
std::string pmpPortOf(const std::string& entry)
{
    const std::size_t dot = entry.find('.');
    return dot == std::string::npos ? std::string() : entry.substr(dot);
}

std::optional<StoragePort> readAtaLink(const std::string& sysRoot, const std::string& classDir, const std::string& entry)
{
    // <devices>/<host>/ataN/linkN[/…]/ata_link/linkN: the link device is two up.
    std::optional<std::string> path = devicePath(sysRoot, classDir + "/" + entry);
    if (!path) return std::nullopt;
    const std::string linkDevice = path->substr(0, path->rfind("/ata_link/"));
    const std::size_t portAt = linkDevice.rfind("/ata");
    if (portAt == std::string::npos) return std::nullopt;
    const std::string portDevice = linkDevice.substr(0, linkDevice.find('/', portAt + 1));
    const std::string portName = portDevice.substr(portAt + 1);
    const std::string host = portDevice.substr(0, portAt);
    const std::string devices = sysRoot + "/devices/";
    const std::string portNumber = readLine(devices + portDevice + "/ata_port/" + portName + "/port_no").value_or(portName);
    const std::string hostName = pciAddressIn(host).value_or(host);
    StoragePort port;
    port.id = "ata:" + hostName + "/port" + portNumber + pmpPortOf(entry);
    port.name = "SATA port " + portNumber + pmpPortOf(entry) + " of " + hostName;
    port.speed = rateAt(classDir + "/" + entry + "/sata_spd");
    port.speedDowns = speedDownsBehind(devices + linkDevice);
    return port;
}

}  // namespace

std::optional<std::uint64_t> linkRateBits(std::string_view text)
{
    text = trimmed(text);
    const std::size_t space = text.find(' ');
    if (space == std::string_view::npos) return std::nullopt;
    const std::string_view unit = text.substr(space + 1);
    if (unit != "Gbit" && unit != "Gbps") return std::nullopt;
    const std::string number(text.substr(0, space));
    char* end = nullptr;
    const double gigabits = std::strtod(number.c_str(), &end);
    if (end != number.c_str() + number.size() || !(gigabits > 0)) return std::nullopt;
    return static_cast<std::uint64_t>(std::llround(gigabits * 1e9));
}

std::vector<StoragePort> readSasPhys(const std::string& sysRoot)
{
    std::vector<StoragePort> ports;
    const std::string classDir = sysRoot + "/class/sas_phy";
    for (const std::string& entry : directoryEntries(classDir)) ports.push_back(readSasPhy(classDir + "/" + entry, entry));
    return ports;
}

std::vector<StoragePort> readAtaLinks(const std::string& sysRoot)
{
    std::vector<StoragePort> ports;
    const std::string classDir = sysRoot + "/class/ata_link";
    for (const std::string& entry : directoryEntries(classDir)) {
        if (std::optional<StoragePort> port = readAtaLink(sysRoot, classDir, entry)) ports.push_back(std::move(*port));
    }
    return ports;
}

std::optional<std::uint16_t> storagePortHealth(const StoragePort& port)
{
    const std::optional<std::uint64_t>* counters[] = {&port.invalidDwords, &port.disparityErrors, &port.lostDwordSync,
                                                      &port.resetProblems, &port.speedDowns};
    std::optional<std::uint16_t> state;
    for (const auto* counter : counters) {
        if (*counter) state = worse(state, **counter > 0 ? kDegraded : kOk);
    }
    return state;
}

}  // namespace orv::linuxhost::health
