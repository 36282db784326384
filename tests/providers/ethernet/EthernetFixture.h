// Simulated hosts for the Ethernet port provider and the requests the tests
// send it: NICs with every record, injected NIC faults, and paths of ports and
// of the objects that hang off them.
#pragma once

#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

#include "orv/providertest/ProviderCore.h"
#include "orv/providertest/ReturnedValues.h"
#include "orv/providertest/SimHost.h"

namespace ethernet {

using Json = nlohmann::ordered_json;
using orv::providertest::NamedValue;
using orv::host::Reply;

inline constexpr const char* kPort = "Orvane_EthernetPort";
inline constexpr const char* kSystemClass = "OMC_UnitaryComputerSystem";

// The seven classes that hang off a port and their associations, in serving order.
struct FarEnd {
    const char* className;
    const char* assocClass;
    const char* portRole;
    const char* farRole;
};
const std::vector<FarEnd>& farEnds();
// The fifteen classes, in serving order.
std::vector<std::string> servedClasses();

// "Orvane:<class>:<name>".
std::string instanceId(const std::string& className, const std::string& name);

// A NIC with every record: name as given, PCI bus 171 slot 4 function 1
// vendor 0x8086 device 0x10fb segment 0x1a, MAC 0a:1b:2c:3d:4e:5f, enabled
// with the link up at 10000 Mb/s full duplex, MTU 9000, wake-on-LAN supported
// but not enabled; driver e1000e 3.2, firmware 0x800005b6; distinct counters
// (bytesRx above 2^32); ring sizes current 512/0/64/1024 (changed 1) and
// preset 4096/32/256/4096 (changed 0).
Json nic(const std::string& name);

// A fault rule: `call` fails on `nicName` (any NIC when empty), on the nth
// matching invocation only when nth > 0.
Json fault(const std::string& call, const std::string& nicName = {}, unsigned nth = 0);

// A fixture with these NICs and fault rules.
Json hostWith(const std::vector<Json>& nics, const Json& faults = Json::array());

class EthernetTest : public ::testing::Test {
protected:
    // Writes the fixture; the broker core is made on first use.
    void serve(const Json& fixture);
    orv::providertest::ProviderCore& provider();
    orv::host::BrokerCore& core() { return provider().core(); }

    // The port's path with its four keys (DeviceID first), or with DeviceID only.
    CMPIObjectPath* portPath(const std::string& name);
    CMPIObjectPath* portPathWithoutDeviceId();
    // The one-key path of a far-end class.
    CMPIObjectPath* farEndPath(const std::string& className, const std::string& id);

    // What the returned item at index holds.
    static const CMPIInstance* instanceAt(const Reply& reply, std::size_t index);

    orv::providertest::SimHost host_;

private:
    std::unique_ptr<orv::providertest::ProviderCore> provider_;
};

// A reference value as ReturnedValues renders it.
std::string portRefText(const std::string& name);
std::string farEndRefText(const std::string& className, const std::string& name);

}  // namespace ethernet
