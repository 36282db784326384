// The IP change detector driven on its own through the broker core: the
// core's broker builds every object and receives every delivered indication,
// which a recording subscriber keeps; the platform is a simulated host that
// the test rewrites between calls.
#pragma once

#include <gtest/gtest.h>

#include <cmpi/CmpiBaseMI.h>
#include <cmpi/CmpiBroker.h>
#include <cmpi/CmpiContext.h>

#include <cstdint>
#include <ctime>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

#include "KernelIPFixture.h"
#include "KernelIpIndication.h"

namespace ipindication {

using kernelip::IPv6;
using kernelip::Json;
using kernelip::Vnic;
using orv::providertest::NamedValue;

inline constexpr const char* kIndicationClass = "Orvane_KernelIPChangedIndication";

// One indication as the broker received it.
struct Delivered {
    std::string nameSpace;
    std::string className;
    // Every property in order; an embedded instance reads as its class name,
    // the date-time as "<date-time>" (its value is in timeMicroseconds).
    std::vector<NamedValue> properties;
    std::vector<NamedValue> sourceInstance;
    std::vector<NamedValue> previousInstance;
    std::uint64_t timeMicroseconds = 0;
    bool timeIsInterval = true;
};

// Keeps every indication delivered to a broker core.
class IndicationRecorder {
public:
    explicit IndicationRecorder(orv::host::BrokerCore& core);
    ~IndicationRecorder();
    IndicationRecorder(const IndicationRecorder&) = delete;
    IndicationRecorder& operator=(const IndicationRecorder&) = delete;

    std::vector<Delivered> delivered() const;
    std::size_t count() const;
    void clear();

private:
    orv::host::BrokerCore& core_;
    std::uint64_t id_;
    mutable std::mutex mutex_;
    std::vector<Delivered> delivered_;
};

// The endpoint properties of an IPv6 record (the address under IPv6ddress)
// and of an IPv4 record, on the host named `systemName`.
std::vector<NamedValue> ipv6Endpoint(const std::string& ifname, const std::string& address, unsigned prefixLength,
                                     const std::string& systemName = orv::providertest::SimHost::kFqdn);
std::vector<NamedValue> ipv4Endpoint(const std::string& ifname, const std::string& address, const std::string& netmask,
                                     const std::string& systemName = orv::providertest::SimHost::kFqdn);

// The model path of the endpoint of class `endpointClass` on `ifname`.
std::string modelPath(const std::string& endpointClass, const std::string& ifname,
                      const std::string& systemName = orv::providertest::SimHost::kFqdn);

// Checks one delivered indication of a replacement on `ifname`: every property
// in order, both embedded endpoints, and a time taken between `from` and `to`.
void expectIndication(const Delivered& delivered, const std::string& ifname,
                      const std::vector<NamedValue>& previous, const std::vector<NamedValue>& source,
                      std::time_t from, std::time_t to);

// A host whose default stack lists `vnics`, with these fault rules.
Json hostWith(const std::vector<Vnic>& vnics, const Json& faults = Json::array());
// A getifaddrs rule adding an entry for `nic` of `family` (null: no address).
Json injectedEntry(const std::string& nic, const Json& family);

// A detector with the broker core it builds its objects with and delivers to,
// on the platform substitute the environment names (chosen again here).
class DetectorHarness {
public:
    DetectorHarness();
    ~DetectorHarness();
    DetectorHarness(const DetectorHarness&) = delete;
    DetectorHarness& operator=(const DetectorHarness&) = delete;

    void testAndSend() { detector_.testAndSend(context_, &broker_); }

    ORV::KernelIpIndication& detector() { return detector_; }
    CmpiBroker& broker() { return broker_; }
    CmpiContext& context() { return context_; }
    IndicationRecorder& recorder() { return *recorder_; }
    orv::providertest::ProviderCore& core() { return provider_; }

private:
    orv::providertest::ProviderCore provider_;
    std::unique_ptr<IndicationRecorder> recorder_;
    // Makes the core's broker the one the binding's object constructors use.
    std::unique_ptr<CmpiBaseMI> brokerHolder_;
    CmpiBroker broker_;
    CmpiContext context_;
    ORV::KernelIpIndication detector_;
};

class IpIndicationTest : public ::testing::Test {
protected:
    IpIndicationTest();
    ~IpIndicationTest() override;

    // Writes the host the detector reads on its next refresh.
    void serve(const Json& fixture) { host_.write(fixture); }
    void serve(const std::vector<Vnic>& vnics) { serve(hostWith(vnics)); }

    void testAndSend() { harness_->testAndSend(); }

    ORV::KernelIpIndication& detector() { return harness_->detector(); }
    CmpiBroker& broker() { return harness_->broker(); }
    CmpiContext& context() { return harness_->context(); }
    IndicationRecorder& recorder() { return harness_->recorder(); }
    orv::providertest::ProviderCore& core() { return harness_->core(); }

    // Records of the entries of the simulated host's current list, in order.
    std::vector<ORV::KernelIpIndication::AddressPtr> recordsOf(const Json& fixture);

private:
    orv::providertest::SimHost host_;  // before the harness: it selects the platform
    std::unique_ptr<DetectorHarness> harness_;
};

}  // namespace ipindication
