#include "IpIndicationFixture.h"

#include <orv/platform/InterfaceAddresses.h>
#include <orv/platform/backend/Selector.h>

#include <cmpift.h>

#include <optional>
#include <stdexcept>

namespace ipindication {
namespace {

using orv::providertest::classNameOf;
using orv::providertest::propertiesOf;
using orv::providertest::valueText;

constexpr const char* kDateTimeText = "<date-time>";

std::vector<NamedValue> topLevel(const CMPIInstance* indication, Delivered& record) {
    std::vector<NamedValue> properties;
    CMPIStatus st{CMPI_RC_OK, nullptr};
    const CMPICount count = indication->ft->getPropertyCount(indication, &st);
    for (CMPICount i = 0; i < count; ++i) {
        CMPIString* name = nullptr;
        const CMPIData data = indication->ft->getPropertyAt(indication, i, &name, &st);
        NamedValue value{name->ft->getCharPtr(name, nullptr), data.type, ""};
        if (data.type == CMPI_instance && data.value.inst != nullptr) {
            value.text = classNameOf(data.value.inst);
            const std::vector<NamedValue> embedded = propertiesOf(data.value.inst);
            (value.name == "SourceInstance" ? record.sourceInstance : record.previousInstance) = embedded;
        } else if (data.type == CMPI_dateTime && data.value.dateTime != nullptr) {
            value.text = kDateTimeText;
            record.timeMicroseconds = data.value.dateTime->ft->getBinaryFormat(data.value.dateTime, nullptr);
            record.timeIsInterval = data.value.dateTime->ft->isInterval(data.value.dateTime, nullptr) != 0;
        } else {
            value.text = valueText(data);
        }
        properties.push_back(value);
    }
    return properties;
}

Delivered readIndication(std::string_view ns, const CMPIInstance* indication) {
    Delivered record;
    record.nameSpace = std::string(ns);
    record.className = classNameOf(indication);
    record.properties = topLevel(indication, record);
    return record;
}

}  // namespace

IndicationRecorder::IndicationRecorder(orv::host::BrokerCore& core) : core_(core) {
    id_ = core_.addIndicationSubscriber([this](std::string_view ns, const CMPIInstance* indication) {
        Delivered record = readIndication(ns, indication);
        std::lock_guard<std::mutex> lock(mutex_);
        delivered_.push_back(std::move(record));
    });
}

IndicationRecorder::~IndicationRecorder() { core_.removeIndicationSubscriber(id_); }

std::vector<Delivered> IndicationRecorder::delivered() const {
    std::lock_guard<std::mutex> lock(mutex_);
    return delivered_;
}

std::size_t IndicationRecorder::count() const {
    std::lock_guard<std::mutex> lock(mutex_);
    return delivered_.size();
}

void IndicationRecorder::clear() {
    std::lock_guard<std::mutex> lock(mutex_);
    delivered_.clear();
}

namespace {

std::vector<NamedValue> onSystem(std::vector<NamedValue> properties, const std::string& systemName) {
    for (NamedValue& value : properties) {
        if (value.name == "SystemName") {
            value.text = systemName;
        }
    }
    return properties;
}

}  // namespace

std::vector<NamedValue> ipv6Endpoint(const std::string& ifname, const std::string& address, unsigned prefixLength,
                                     const std::string& systemName) {
    std::vector<NamedValue> properties = kernelip::commonProperties(kernelip::kIPv6Class, ifname, 4097);
    properties.push_back({"IPv6ddress", CMPI_string, address});
    properties.push_back({"PrefixLength", CMPI_uint8, std::to_string(prefixLength)});
    return onSystem(properties, systemName);
}

std::vector<NamedValue> ipv4Endpoint(const std::string& ifname, const std::string& address, const std::string& netmask,
                                     const std::string& systemName) {
    return onSystem(kernelip::ipv4Properties(kernelip::kIPv4Class, ifname, address, netmask), systemName);
}

std::string modelPath(const std::string& endpointClass, const std::string& ifname, const std::string& systemName) {
    return "root/cimv2:" + endpointClass + ".SystemCreationClassName=\"OMC_UnitaryComputerSystem\",SystemName=\"" +
           systemName + "\",CreationClassName=\"" + endpointClass + "\",Name=\"" + ifname + "\"";
}

namespace {

// Value of a property in an expected endpoint list.
std::string endpointValue(const std::vector<NamedValue>& endpoint, const std::string& name) {
    for (const NamedValue& value : endpoint) {
        if (value.name == name) {
            return value.text;
        }
    }
    throw std::logic_error("expected endpoint without " + name);
}

}  // namespace

void expectIndication(const Delivered& delivered, const std::string& ifname,
                      const std::vector<NamedValue>& previous, const std::vector<NamedValue>& source,
                      std::time_t from, std::time_t to) {
    const std::string sourceClass = endpointValue(source, "CreationClassName");
    const std::string previousClass = endpointValue(previous, "CreationClassName");
    const std::string newAddress =
        sourceClass == kernelip::kIPv4Class ? endpointValue(source, "IPv4Address") : endpointValue(source, "IPv6ddress");
    EXPECT_EQ(delivered.nameSpace, "root/cimv2");
    EXPECT_EQ(delivered.className, kIndicationClass);
    EXPECT_EQ(delivered.properties, (std::vector<NamedValue>{
                                        {"IndicationIdentifier", CMPI_string, "Orvane:" + ifname},
                                        {"IndicationTime", CMPI_dateTime, kDateTimeText},
                                        {"PerceivedSeverity", CMPI_uint16, "3"},
                                        {"SourceInstance", CMPI_instance, sourceClass},
                                        {"PreviousInstance", CMPI_instance, previousClass},
                                        {"SourceInstanceModelPath", CMPI_string,
                                         modelPath(sourceClass, ifname, endpointValue(source, "SystemName"))},
                                        {"SourceInstanceHost", CMPI_string, newAddress},
                                    }));
    EXPECT_EQ(delivered.sourceInstance, source);
    EXPECT_EQ(delivered.previousInstance, previous);
    EXPECT_FALSE(delivered.timeIsInterval);
    EXPECT_EQ(delivered.timeMicroseconds % 1000000, 0U) << "whole seconds";
    EXPECT_GE(delivered.timeMicroseconds / 1000000, static_cast<std::uint64_t>(from));
    EXPECT_LE(delivered.timeMicroseconds / 1000000, static_cast<std::uint64_t>(to));
}

Json hostWith(const std::vector<Vnic>& vnics, const Json& faults) {
    return kernelip::hostWith(std::vector<std::optional<Vnic>>(vnics.begin(), vnics.end()), faults);
}

Json injectedEntry(const std::string& nic, const Json& family) {
    return {{"call", "getifaddrs"}, {"nic", nic}, {"family", family}};
}

DetectorHarness::DetectorHarness()
    : recorder_(std::make_unique<IndicationRecorder>(provider_.core())),
      brokerHolder_(std::make_unique<CmpiBaseMI>(CmpiBroker(provider_.broker()), CmpiContext(nullptr))),
      broker_(provider_.broker()),
      context_(nullptr) {
    // The platform library of this process chose its substitute when it was
    // loaded, before the test set the environment.
    orv::platform::reselectBackend();
    brokerHolder_->setProviderBase(nullptr);
}

DetectorHarness::~DetectorHarness() = default;

IpIndicationTest::IpIndicationTest() {
    serve(std::vector<Vnic>{});
    harness_ = std::make_unique<DetectorHarness>();
}

IpIndicationTest::~IpIndicationTest() = default;

std::vector<ORV::KernelIpIndication::AddressPtr> IpIndicationTest::recordsOf(const Json& fixture) {
    serve(fixture);
    ifaddrs* list = nullptr;
    if (OrvHost_GetIfAddrs(&list) != 0) {
        throw std::runtime_error("the simulated interface list cannot be read");
    }
    std::vector<ORV::KernelIpIndication::AddressPtr> records;
    for (const ifaddrs* entry = list; entry != nullptr; entry = entry->ifa_next) {
        if (entry->ifa_addr != nullptr &&
            (entry->ifa_addr->sa_family == AF_INET || entry->ifa_addr->sa_family == AF_INET6)) {
            records.push_back(ORV::KernelIpIndication::getAddressPtr(entry));
        }
    }
    OrvHost_FreeIfAddrs(list);
    return records;
}

}  // namespace ipindication
