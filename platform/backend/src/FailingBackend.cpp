#include "FailingBackend.h"

#include <cerrno>
#include <stdexcept>

#include "nodemgr/lib/NodeMgrException.h"

namespace orv::platform {
namespace {

// Status code the version service answers while no substitute is available.
constexpr TmkuserStatus_Code kUnavailableCode = 0xBAD00001u;

class FailingBackend final : public Backend,
                             private NetworkBackend,
                             private KsiBackend,
                             private VersionBackend,
                             private HostBackend {
public:
    explicit FailingBackend(std::string reason) : reason_(std::move(reason)) {}

    const char* name() const override { return "none"; }
    NetworkBackend& network() override { return *this; }
    KsiBackend& ksi() override { return *this; }
    VersionBackend& version() override { return *this; }
    HostBackend& host() override { return *this; }

private:
    std::vector<NodeMgr::Network::Pnic*> getPnics() override { throw NodeMgr::Lib::NodeMgrException(reason_); }
    NodeMgr::Network::Pnic* getPnicByName(const std::string&) override { throw NodeMgr::Lib::NodeMgrException(reason_); }

    KSI_Status checkSig(const void*, uint32_t, uint32_t*) override { return KSI_ERR_FAILURE; }
    KSI_Status get(KSI_NodeId, const KsiParams&, void*, uint32_t) override { return KSI_ERR_FAILURE; }
    KSI_Status getInstanceList(KSI_NodeId, const KsiParams&, std::optional<KsiParams>&) override { return KSI_ERR_FAILURE; }

    TmkuserStatus_Code getSystemVersion(TmkuserVersion_SystemVersionInfo&) override { return kUnavailableCode; }
    int codeToErrno(TmkuserStatus_Code) override { return ENOSYS; }
    std::string codeToString(TmkuserStatus_Code) override { return reason_; }
    bool osIsTmk() override { return false; }

    bool fqdn(std::string&) override { return false; }
    bool hostName(std::string&) override { return false; }
    int sysInfo(struct sysinfo&) override { return ENOSYS; }
    int interfaceAddresses(ifaddrs*& list) override
    {
        list = nullptr;
        errno = ENOSYS;
        return -1;
    }
    void freeInterfaceAddresses(ifaddrs*) override {}
    SystemIdentity systemIdentity() override { throw std::runtime_error(reason_); }

    std::string reason_;
};

} // namespace

std::unique_ptr<Backend> makeFailingBackend(std::string reason)
{
    return std::make_unique<FailingBackend>(std::move(reason));
}

} // namespace orv::platform
