// Which links are NICs on a kernel that names no parent devices: the kernel
// release decides whether it does, and the driver info names the bus device.
#include "bus_device.hpp"
#include "kernel_release.hpp"
#include "linux_call_error.hpp"

#include <cerrno>
#include <cstring>
#include <gtest/gtest.h>
#include <linux/ethtool.h>
#include <linux/if.h>
#include <sys/utsname.h>

using namespace orv::linuxhost;

namespace {

// Answers ETHTOOL_GDRVINFO with a bus_info text, or refuses it with an errno.
class DriverInfoChannel final : public EthtoolChannel {
public:
    explicit DriverInfoChannel(std::string busInfo, int refusal = 0) : busInfo_(std::move(busInfo)), refusal_(refusal) {}

    int exchange(const std::string&, void* buffer, std::size_t size) override
    {
        ++exchanges;
        auto* info = static_cast<ethtool_drvinfo*>(buffer);
        if (size < sizeof *info || info->cmd != ETHTOOL_GDRVINFO) return EOPNOTSUPP;
        if (refusal_) return refusal_;
        std::strncpy(info->driver, "test", sizeof info->driver);
        std::strncpy(info->bus_info, busInfo_.c_str(), sizeof info->bus_info - 1);
        return 0;
    }

    int exchanges = 0;

private:
    std::string busInfo_;
    int refusal_;
};

LinkRecord linkNamed(const std::string& name, std::uint32_t flags = IFF_UP | IFF_BROADCAST)
{
    LinkRecord link;
    link.name = name;
    link.flags = flags;
    return link;
}

// A link whose answer names its bus device as a 5.16 kernel does for a virtio NIC.
LinkRecord virtioLink()
{
    auto link = linkNamed("eth0");
    link.parentDevice = "virtio2";
    link.parentBus = "virtio";
    return link;
}

void expectOnBusDevice(const LinkRecord& link, const char* device, const char* bus)
{
    EXPECT_TRUE(link.onBus());
    EXPECT_EQ(link.parentDevice, device);
    EXPECT_EQ(link.parentBus, bus);
}

}  // namespace

TEST(KernelRelease, KernelsFrom516OnNameParentDevices)
{
    EXPECT_TRUE(releaseNamesParentDevices("5.16"));
    EXPECT_TRUE(releaseNamesParentDevices("5.16.0-rc1"));
    EXPECT_TRUE(releaseNamesParentDevices("6.1.0-13-amd64"));
    EXPECT_TRUE(releaseNamesParentDevices("6.0"));
    EXPECT_TRUE(releaseNamesParentDevices("10.2.1"));
}

TEST(KernelRelease, KernelsBefore516NameNone)
{
    EXPECT_FALSE(releaseNamesParentDevices("5.15.0-91-generic"));
    EXPECT_FALSE(releaseNamesParentDevices("5.10.0-26-amd64"));
    EXPECT_FALSE(releaseNamesParentDevices("4.18.0-513.5.1.el8_9.x86_64"));
    EXPECT_FALSE(releaseNamesParentDevices("3.10.0"));
}

TEST(KernelRelease, MalformedReleaseIsTakenForAnOlderKernel)
{
    for (const char* release : {"", "linux", "6", "6.", "6-1", ".16", "-6.1", "v6.1", " 6.1", "6.x"}) {
        EXPECT_FALSE(releaseNamesParentDevices(release)) << '"' << release << '"';
    }
}

TEST(KernelRelease, RunningKernelIsDecidedFromUname)
{
    utsname name{};
    ASSERT_EQ(::uname(&name), 0);
    EXPECT_EQ(kernelNamesParentDevices(), releaseNamesParentDevices(name.release)) << name.release;
}

TEST(BusDeviceFromDriverInfo, PciAddressIsOnPciUsbPathOnUsbOtherFormsOnAnUnnamedBus)
{
    const std::pair<const char*, const char*> cases[] = {
        {"0000:00:03.0", "pci"}, {"usb-0000:00:14.0-1", "usb"}, {"vif-0", ""}, {"0000:00:03", ""}};
    for (const auto& [busInfo, bus] : cases) {
        auto device = busDeviceFromDriverInfo(busInfo);
        ASSERT_TRUE(device) << busInfo;
        EXPECT_EQ(device->device, busInfo);
        EXPECT_EQ(device->bus, bus) << busInfo;
    }
}

TEST(BusDeviceFromDriverInfo, EmptyOrVirtualPlaceholderIsNoDevice)
{
    for (const char* busInfo : {"", "N/A", "tun", "tap"}) {
        EXPECT_FALSE(busDeviceFromDriverInfo(busInfo)) << '"' << busInfo << '"';
    }
}

TEST(RecognizeNic, OlderKernelTakesTheBusDeviceFromTheDriverInfo)
{
    DriverInfoChannel channel("0000:00:03.0");
    auto link = linkNamed("eth0");
    EXPECT_TRUE(recognizeNic(link, channel, false));
    expectOnBusDevice(link, "0000:00:03.0", "pci");
    EXPECT_EQ(channel.exchanges, 1);
}

TEST(RecognizeNic, OlderKernelLoopbackIsNoNicAndItsDriverIsNotAsked)
{
    DriverInfoChannel channel("0000:00:03.0");
    auto link = linkNamed("lo", IFF_UP | IFF_LOOPBACK);
    EXPECT_FALSE(recognizeNic(link, channel, false));
    EXPECT_EQ(channel.exchanges, 0);
}

TEST(RecognizeNic, OlderKernelVirtualDriverIsNoNic)
{
    for (const char* busInfo : {"", "N/A", "tap"}) {
        DriverInfoChannel channel(busInfo);
        auto link = linkNamed("virt0");
        EXPECT_FALSE(recognizeNic(link, channel, false)) << '"' << busInfo << '"';
        EXPECT_FALSE(link.onBus());
    }
}

TEST(RecognizeNic, OlderKernelDriverThatRefusesOrLinkThatVanishedIsNoNic)
{
    for (int refusal : {EOPNOTSUPP, ENODEV}) {
        DriverInfoChannel channel("0000:00:03.0", refusal);
        auto link = linkNamed("eth0");
        EXPECT_FALSE(recognizeNic(link, channel, false)) << std::strerror(refusal);
        EXPECT_FALSE(link.onBus());
    }
}

TEST(RecognizeNic, OlderKernelOtherRefusalFailsNamingTheQuery)
{
    DriverInfoChannel channel("0000:00:03.0", EBADF);
    auto link = linkNamed("eth0");
    try {
        recognizeNic(link, channel, false);
        ADD_FAILURE() << "a broken ethtool socket must not read as no NIC";
    } catch (const LinuxCallError& error) {
        EXPECT_EQ(error.call(), "ETHTOOL_GDRVINFO");
        EXPECT_EQ(error.error(), EBADF);
    }
}

TEST(RecognizeNic, NewerKernelLinkThatNamesItsParentIsANicWithoutAskingTheDriver)
{
    DriverInfoChannel channel("0000:00:03.0");
    auto link = virtioLink();
    EXPECT_TRUE(recognizeNic(link, channel, true));
    expectOnBusDevice(link, "virtio2", "virtio");
    EXPECT_EQ(channel.exchanges, 0);
}

TEST(RecognizeNic, OlderKernelJudgesALinkThatNamesAParentByItsDriverInfoToo)
{
    DriverInfoChannel channel("0000:00:03.0");
    auto link = virtioLink();
    EXPECT_TRUE(recognizeNic(link, channel, false));
    expectOnBusDevice(link, "0000:00:03.0", "pci");
    EXPECT_EQ(channel.exchanges, 1);
    DriverInfoChannel refusing("", EOPNOTSUPP);
    EXPECT_FALSE(recognizeNic(link, refusing, false));
    EXPECT_FALSE(link.onBus());
}

TEST(RecognizeNic, NewerKernelLinkWithoutParentIsNoNicAndCostsNoQuery)
{
    DriverInfoChannel channel("0000:00:03.0");
    auto link = linkNamed("veth0");
    EXPECT_FALSE(recognizeNic(link, channel, true));
    EXPECT_EQ(channel.exchanges, 0);
}
