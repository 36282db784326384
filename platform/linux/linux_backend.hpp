// The Linux substitute: every platform area answered by the running machine.
#pragma once

#include "canonical_name.hpp"
#include "health/linux_health.hpp"
#include "ethtool_channel.hpp"
#include "ethtool_netlink_channel.hpp"
#include "kernel_release.hpp"
#include "linux_ksi.hpp"
#include "linux_pnic.hpp"
#include "os_version.hpp"

#include "orv/platform/backend/Backend.h"

#include <memory>

namespace orv::linuxhost {

// The physical NICs: the links of the backend's network namespace that sit on
// a bus device (recognizeNic), in interface-index order. A listing is one
// RTM_GETLINK dump whose answers the pnics keep; a pnic by name is one
// RTM_GETLINK for that name.
class LinuxNetwork final : public orv::platform::NetworkBackend {
public:
    // Without a netlink channel every ethtool query goes through the ioctls.
    // `kernelNamesParents` false: the kernel's link answers name no parent
    // device, so the bus device is asked of each link's driver.
    LinuxNetwork(std::string sysRoot, std::shared_ptr<EthtoolChannel> channel,
                 std::shared_ptr<EthtoolNetlinkChannel> netlink = nullptr,
                 bool kernelNamesParents = kernelNamesParentDevices());
    std::vector<NodeMgr::Network::Pnic*> getPnics() override;
    NodeMgr::Network::Pnic* getPnicByName(const std::string& name) override;

private:
    bool isNic(LinkRecord& link) const;

    NicKernel kernel_;
    bool kernelNamesParents_;
};

// Version record from os-release and uname; host type from configuration.
class LinuxVersion final : public orv::platform::VersionBackend {
public:
    LinuxVersion(std::string root, bool hypervisorKernel);
    TmkuserStatus_Code getSystemVersion(TmkuserVersion_SystemVersionInfo& info) override;
    int codeToErrno(TmkuserStatus_Code code) override;
    std::string codeToString(TmkuserStatus_Code code) override;
    bool osIsTmk() override;

private:
    std::string root_;
    bool hypervisorKernel_;
};

class LinuxHost final : public orv::platform::HostBackend {
public:
    explicit LinuxHost(CanonicalNameCache::Resolver resolver = resolveCanonicalName,
                       CanonicalNameCache::Timing timing = CanonicalNameCache::Timing{});
    bool fqdn(std::string& out) override;
    bool hostName(std::string& out) override;
    int sysInfo(struct sysinfo& out) override;
    int interfaceAddresses(ifaddrs*& list) override;
    void freeInterfaceAddresses(ifaddrs* list) override;

private:
    CanonicalNameCache canonical_;
};

void fillVersionRecord(const SystemVersion& version, TmkuserVersion_SystemVersionInfo& info);
// "1", "true", "yes" (any case) switch the hypervisor-kernel host type on; the
// same texts of ORV_LINUX_ETHTOOL_NETLINK send ethtool queries to netlink first.
bool parseHostTypeSetting(const char* value);

class LinuxBackend final : public orv::platform::Backend {
public:
    // `ethtoolNetlink`: ask ethtool netlink before the ioctls.
    LinuxBackend(LinuxRoots roots, std::string fileRoot, bool hypervisorKernel, bool ethtoolNetlink = false);
    const char* name() const override { return "linux"; }
    void beginBatch() override { ksi_.invalidate(); }
    orv::platform::NetworkBackend& network() override { return network_; }
    orv::platform::KsiBackend& ksi() override { return ksi_; }
    orv::platform::VersionBackend& version() override { return version_; }
    orv::platform::HostBackend& host() override { return host_; }
    orv::platform::HealthBackend* health() override { return &health_; }

private:
    LinuxNetwork network_;
    LinuxHealth health_;
    LinuxKsi ksi_;
    LinuxVersion version_;
    LinuxHost host_;
};

}  // namespace orv::linuxhost
