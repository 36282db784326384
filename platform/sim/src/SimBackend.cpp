// The sim substitute: every platform area answered from one fixture file.
#include <cerrno>
#include <cstdio>
#include <stdexcept>

#include "FixtureSource.h"
#include "SimInterfaces.h"
#include "SimKsi.h"
#include "SimPnic.h"
#include "nodemgr/lib/NodeMgrException.h"
#include "orv/platform/backend/Selector.h"

namespace orv::platform::sim {
namespace {

using NodeMgr::Lib::NodeMgrException;

// Code the version service answers when the fixture has no usable record.
constexpr TmkuserStatus_Code kNoVersionCode = 0xBAD00010u;

const FaultRule* fireCall(const HostModel& host, std::string_view call, const std::string* param = nullptr)
{
    if (host.faults.empty()) {
        return nullptr;
    }
    std::vector<std::string> params;
    if (param != nullptr) {
        params.push_back(*param);
    }
    return host.faults.fire(CallSite{call, {}, &params, {}});
}

// The host model, or the NIC library's failure when the fixture was rejected.
std::shared_ptr<const HostModel> hostOrThrow(const FixtureSource& source)
{
    FixtureResult fixture = source.current();
    if (!fixture.host) {
        throw NodeMgrException(fixture.error);
    }
    return fixture.host;
}

void throwIfInjected(const HostModel& host, std::string_view call, const std::string* param = nullptr)
{
    if (const FaultRule* rule = fireCall(host, call, param)) {
        throw NodeMgrException(rule->message.empty() ? "injected failure of " + std::string(call) : rule->message);
    }
}

const std::vector<NicModel>& nicsOrThrow(const HostModel& host)
{
    if (!host.nics) {
        throw NodeMgrException("the host has no NIC information");
    }
    return *host.nics;
}

class SimNetwork final : public NetworkBackend {
public:
    explicit SimNetwork(FixtureSource& source) : source_(source) {}

    std::vector<NodeMgr::Network::Pnic*> getPnics() override
    {
        std::shared_ptr<const HostModel> host = hostOrThrow(source_);
        throwIfInjected(*host, "GetPnics");
        const std::vector<NicModel>& nics = nicsOrThrow(*host);
        std::vector<NodeMgr::Network::Pnic*> pnics;
        pnics.reserve(nics.size());
        try {
            for (const NicModel& nic : nics) {
                pnics.push_back(makeSimPnic(host, nic));
            }
        } catch (...) {
            for (NodeMgr::Network::Pnic* pnic : pnics) {
                delete pnic;
            }
            throw;
        }
        return pnics;
    }

    NodeMgr::Network::Pnic* getPnicByName(const std::string& name) override
    {
        std::shared_ptr<const HostModel> host = hostOrThrow(source_);
        throwIfInjected(*host, "GetPnicByName", &name);
        const std::vector<NicModel>& nics = nicsOrThrow(*host);
        const auto found = host->nicIndex.find(name);
        return found != host->nicIndex.end() ? makeSimPnic(host, nics[found->second]) : nullptr;
    }

private:
    FixtureSource& source_;
};

class SimVersion final : public VersionBackend {
public:
    explicit SimVersion(FixtureSource& source) : source_(source) {}

    TmkuserStatus_Code getSystemVersion(TmkuserVersion_SystemVersionInfo& info) override
    {
        FixtureResult fixture = source_.current();
        if (!fixture.host || !fixture.host->version) {
            return kNoVersionCode;
        }
        if (const FaultRule* rule = fireCall(*fixture.host, "TmkuserVersion_GetSystemVersion")) {
            return rule->status ? static_cast<TmkuserStatus_Code>(*rule->status) : kNoVersionCode;
        }
        const VersionModel& version = *fixture.host->version;
        if (!version.record) {
            return version.failureCode;
        }
        info = *version.record;
        return TMKUSER_STATUS_OK;
    }

    int codeToErrno(TmkuserStatus_Code code) override
    {
        std::optional<StatusText> text = find(code);
        return text ? text->errnoValue : code == TMKUSER_STATUS_OK ? 0 : EIO;
    }

    std::string codeToString(TmkuserStatus_Code code) override
    {
        if (std::optional<StatusText> text = find(code)) {
            return text->message;
        }
        if (code == TMKUSER_STATUS_OK) {
            return "Success";
        }
        char buffer[64];
        std::snprintf(buffer, sizeof buffer, "Unknown status code 0x%08x", code);
        return buffer;
    }

    bool osIsTmk() override
    {
        FixtureResult fixture = source_.current();
        return fixture.host && fixture.host->osIsTmk && !fireCall(*fixture.host, "HostType_OSIsTMK");
    }

private:
    std::optional<StatusText> find(TmkuserStatus_Code code) const
    {
        std::shared_ptr<const HostModel> host = source_.current().host;
        if (!host) {
            return std::nullopt;
        }
        auto found = host->statusCodes.find(code);
        return found != host->statusCodes.end() ? std::optional(found->second) : std::nullopt;
    }

    FixtureSource& source_;
};

class SimHost final : public HostBackend {
public:
    explicit SimHost(FixtureSource& source) : source_(source) {}

    bool fqdn(std::string& out) override
    {
        return answer("OrvHost_GetFqdn", [](const HostModel& host) { return host.fqdn; }, out);
    }

    bool hostName(std::string& out) override
    {
        return answer("OrvHost_GetHostName", [](const HostModel& host) { return std::optional(host.hostName); }, out);
    }

    int sysInfo(struct sysinfo& out) override
    {
        FixtureResult fixture = source_.current();
        if (!fixture.host) {
            return EIO;
        }
        if (const FaultRule* rule = fireCall(*fixture.host, "OrvHost_Sysinfo")) {
            return rule->status ? static_cast<int>(*rule->status) : EIO;
        }
        if (!fixture.host->uptimeSeconds) {
            return ENOSYS;
        }
        out.uptime = *fixture.host->uptimeSeconds;
        out.procs = 1;
        out.mem_unit = 1;
        return 0;
    }

    int interfaceAddresses(ifaddrs*& list) override
    {
        list = nullptr;
        FixtureResult fixture = source_.current();
        if (!fixture.host) {
            errno = EIO;
            return -1;
        }
        return makeInterfaceList(*fixture.host, list);
    }

    void freeInterfaceAddresses(ifaddrs* list) override { freeInterfaceList(list); }

    // An absent "system" section tells no value.
    SystemIdentity systemIdentity() override
    {
        FixtureResult fixture = source_.current();
        if (!fixture.host) {
            throw std::runtime_error(fixture.error);
        }
        if (const FaultRule* rule = fireCall(*fixture.host, "OrvHost_GetSystemIdentity")) {
            throw std::runtime_error(rule->message.empty() ? "system identity unavailable" : rule->message);
        }
        return fixture.host->system.value_or(SystemIdentity{});
    }

private:
    template <typename Pick>
    bool answer(std::string_view call, Pick pick, std::string& out)
    {
        FixtureResult fixture = source_.current();
        if (!fixture.host || fireCall(*fixture.host, call)) {
            return false;
        }
        std::optional<std::string> value = pick(*fixture.host);
        if (value) {
            out = *value;
        }
        return value.has_value();
    }

    FixtureSource& source_;
};

class SimHealth final : public HealthBackend {
public:
    explicit SimHealth(FixtureSource& source) : source_(source) {}

    std::vector<HealthElement> elements(const std::string& watchedClass) override
    {
        FixtureResult fixture = source_.current();
        if (!fixture.host) {
            throw std::runtime_error(fixture.error);
        }
        if (const FaultRule* rule = fireCall(*fixture.host, "OrvHealth_Elements", &watchedClass)) {
            throw std::runtime_error(rule->message.empty() ? "health elements unavailable" : rule->message);
        }
        std::vector<HealthElement> found;
        for (const HealthElementModel& model : fixture.host->health) {
            if (model.watchedClass == watchedClass) {
                found.push_back(model.element);
            }
        }
        return found;
    }

private:
    FixtureSource& source_;
};

class SimBackend final : public Backend {
public:
    explicit SimBackend(const std::string& path)
        : source_(path), network_(source_), ksi_(source_), version_(source_), host_(source_), health_(source_)
    {
    }

    const char* name() const override { return "sim"; }
    void beginBatch() override { source_.refresh(); }
    NetworkBackend& network() override { return network_; }
    KsiBackend& ksi() override { return ksi_; }
    VersionBackend& version() override { return version_; }
    HostBackend& host() override { return host_; }
    HealthBackend* health() override { return &health_; }

private:
    FixtureSource source_;
    SimNetwork network_;
    SimKsi ksi_;
    SimVersion version_;
    SimHost host_;
    SimHealth health_;
};

} // namespace
} // namespace orv::platform::sim

namespace orv::platform {

std::unique_ptr<Backend> makeSimBackend(const std::string& fixturePath, std::string& /*error*/)
{
    // A missing or malformed file is not fatal: it is reported, calls fail,
    // and the host comes alive as soon as the file is fixed.
    return std::make_unique<sim::SimBackend>(fixturePath);
}

} // namespace orv::platform
