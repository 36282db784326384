// Fixture generator for simulated hosts of any size: N NICs, P packages of C
// cores, V virtual NICs with A IPv6 addresses each. The output is a complete
// fixture (every record filled) that the sim substitute loads as it is.
#pragma once

#include <nlohmann/json.hpp>

#include <string>

namespace orv::platform::simgen {

struct HostShape {
    unsigned nics = 4;
    unsigned nicsWithoutPci = 1;   // the last ones have no PCI device
    unsigned packages = 2;
    unsigned coresPerPackage = 8;
    unsigned threadsPerCore = 1;   // physical CPUs listed per core
    std::string htState = "HTBIOSDisabled";
    unsigned vnics = 2;
    unsigned ipv6PerVnic = 2;
    bool ipv4 = true;              // every vNIC has an IPv4 address
};

nlohmann::ordered_json generateHost(const HostShape& shape);

// generateHost as indented text.
std::string generateHostText(const HostShape& shape);

} // namespace orv::platform::simgen
