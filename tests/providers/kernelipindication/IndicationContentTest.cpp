// What one IP-changed indication carries, and how a refused delivery is handled.
#include <syslog.h>

#include <cmpift.h>

#include "IpIndicationFixture.h"
#include "orv/testsupport/SyslogCapture.h"

namespace ipindication {
namespace {

using orv::testsupport::SyslogCapture;
using orv::testsupport::SyslogLine;

// A broker that refuses chosen deliveries with a status code and passes every
// other call to the broker core it stands in front of.
class RefusingBroker {
public:
    RefusingBroker(const CMPIBroker* core, std::vector<bool> refusals, CMPIrc code)
        : core_(core), table_(*core->bft), refusals_(std::move(refusals)), code_(code) {
        broker_ = *core;
        table_.deliverIndication = &RefusingBroker::deliver;
        broker_.bft = &table_;
        active_ = this;
    }
    ~RefusingBroker() { active_ = nullptr; }
    RefusingBroker(const RefusingBroker&) = delete;
    RefusingBroker& operator=(const RefusingBroker&) = delete;

    const CMPIBroker* broker() const { return &broker_; }
    unsigned attempts() const { return attempts_; }

private:
    static CMPIStatus deliver(const CMPIBroker*, const CMPIContext* ctx, const char* ns, const CMPIInstance* ind) {
        RefusingBroker& self = *active_;
        const unsigned attempt = self.attempts_++;
        if (attempt < self.refusals_.size() && self.refusals_[attempt]) {
            return CMPIStatus{self.code_, nullptr};
        }
        return self.core_->bft->deliverIndication(self.core_, ctx, ns, ind);
    }

    static inline RefusingBroker* active_ = nullptr;
    const CMPIBroker* core_;
    CMPIBrokerFT table_;
    CMPIBroker broker_{};
    std::vector<bool> refusals_;
    CMPIrc code_;
    unsigned attempts_ = 0;
};

using IpChangedIndicationTest = IpIndicationTest;

TEST_F(IpChangedIndicationTest, Ipv4ModelPathNamesTheIpv4ClassTwiceAndTheInterfaceAsName) {
    serve({Vnic{"vif1", {{"172.16.0.2", "255.255.0.0"}}, {}}});
    detector().enableIndication();
    serve({Vnic{"vif1", {{"172.16.0.3", "255.255.0.0"}}, {}}});
    testAndSend();
    const std::vector<Delivered> delivered = recorder().delivered();
    ASSERT_EQ(delivered.size(), 1U);
    EXPECT_EQ(delivered[0].properties[5],
              (NamedValue{"SourceInstanceModelPath", CMPI_string,
                          "root/cimv2:Orvane_KernelIPv4ProtocolEndpoint.SystemCreationClassName="
                          "\"OMC_UnitaryComputerSystem\",SystemName=\"simhost.providers.test\",CreationClassName="
                          "\"Orvane_KernelIPv4ProtocolEndpoint\",Name=\"vif1\""}));
    EXPECT_EQ(delivered[0].properties[6], (NamedValue{"SourceInstanceHost", CMPI_string, "172.16.0.3"}));
}

TEST_F(IpChangedIndicationTest, ModelPathQuotesTheInterfaceNameWithoutEscaping) {
    const std::string name = "we\"ird\\if";
    serve({Vnic{name, std::nullopt, {{"fd00::1", 64}}}});
    detector().enableIndication();
    serve({Vnic{name, std::nullopt, {{"fd00::2", 64}}}});
    const std::time_t from = std::time(nullptr);
    testAndSend();
    const std::time_t to = std::time(nullptr);
    const std::vector<Delivered> delivered = recorder().delivered();
    ASSERT_EQ(delivered.size(), 1U);
    expectIndication(delivered[0], name, ipv6Endpoint(name, "fd00::1", 64), ipv6Endpoint(name, "fd00::2", 64), from, to);
    EXPECT_EQ(delivered[0].properties[5].text,
              "root/cimv2:Orvane_KernelIPv6ProtocolEndpoint.SystemCreationClassName=\"OMC_UnitaryComputerSystem\","
              "SystemName=\"simhost.providers.test\",CreationClassName=\"Orvane_KernelIPv6ProtocolEndpoint\","
              "Name=\"we\"ird\\if\"");
}

TEST_F(IpChangedIndicationTest, IndicationIdentifierIsTheSameForEveryIndicationOfOneInterface) {
    serve({Vnic{"vif0", {{"10.0.0.5", "255.255.255.0"}}, {{"fd00::5", 64}}},
           Vnic{"vif1", {{"10.0.1.5", "255.255.255.0"}}, {}}});
    detector().enableIndication();
    serve({Vnic{"vif0", {{"10.0.0.6", "255.255.255.0"}}, {{"fd00::6", 64}}},
           Vnic{"vif1", {{"10.0.1.6", "255.255.255.0"}}, {}}});
    const std::time_t from = std::time(nullptr);
    testAndSend();
    const std::time_t to = std::time(nullptr);
    const std::vector<Delivered> delivered = recorder().delivered();
    ASSERT_EQ(delivered.size(), 3U);
    // Interfaces in name order, each one's addresses in list order (IPv4 first).
    expectIndication(delivered[0], "vif0", ipv4Endpoint("vif0", "10.0.0.5", "255.255.255.0"),
                     ipv4Endpoint("vif0", "10.0.0.6", "255.255.255.0"), from, to);
    expectIndication(delivered[1], "vif0", ipv6Endpoint("vif0", "fd00::5", 64), ipv6Endpoint("vif0", "fd00::6", 64),
                     from, to);
    expectIndication(delivered[2], "vif1", ipv4Endpoint("vif1", "10.0.1.5", "255.255.255.0"),
                     ipv4Endpoint("vif1", "10.0.1.6", "255.255.255.0"), from, to);
    EXPECT_EQ(delivered[0].properties[0], delivered[1].properties[0]);
    EXPECT_EQ(delivered[0].properties[0].text, "Orvane:vif0");
    EXPECT_EQ(delivered[2].properties[0].text, "Orvane:vif1");
}

TEST_F(IpChangedIndicationTest, RefusedDeliveryIsLoggedWithItsCodeAndTheNextIndicationIsStillSent) {
    SyslogCapture syslog;
    RefusingBroker refusing(core().broker(), {true, false, true}, CMPI_RC_ERR_FAILED);
    CmpiBroker broker(refusing.broker());
    serve({Vnic{"vif0", std::nullopt, {{"fd00::5", 64}, {"fd00::6", 64}}},
           Vnic{"vif1", {{"10.0.1.5", "255.255.255.0"}}, {}}});
    detector().enableIndication();
    serve({Vnic{"vif0", std::nullopt, {{"fd00::7", 64}}}, Vnic{"vif1", {{"10.0.1.6", "255.255.255.0"}}, {}}});
    const std::time_t from = std::time(nullptr);
    detector().testAndSend(context(), &broker);
    const std::time_t to = std::time(nullptr);
    EXPECT_EQ(refusing.attempts(), 3U);
    const std::vector<Delivered> delivered = recorder().delivered();
    ASSERT_EQ(delivered.size(), 1U);
    expectIndication(delivered[0], "vif0", ipv6Endpoint("vif0", "fd00::6", 64), ipv6Endpoint("vif0", "fd00::7", 64),
                     from, to);
    EXPECT_EQ(syslog.lines(), (std::vector<SyslogLine>{{LOG_ERR, "Failed to deliver indication 1\n"},
                                                       {LOG_ERR, "Failed to deliver indication 1\n"}}));
}

TEST_F(IpChangedIndicationTest, RefusalCodeIsLoggedAsItIs) {
    SyslogCapture syslog;
    RefusingBroker refusing(core().broker(), {true}, CMPI_RC_ERR_NOT_SUPPORTED);
    CmpiBroker broker(refusing.broker());
    serve({Vnic{"vif0", {{"10.0.0.5", "255.255.255.0"}}, {}}});
    detector().enableIndication();
    serve({Vnic{"vif0", {{"10.0.0.6", "255.255.255.0"}}, {}}});
    detector().testAndSend(context(), &broker);
    EXPECT_EQ(recorder().count(), 0U);
    EXPECT_EQ(syslog.lines(), (std::vector<SyslogLine>{{LOG_ERR, "Failed to deliver indication 7\n"}}));
}

}  // namespace
}  // namespace ipindication
