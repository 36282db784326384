// The interface every platform substitute implements. The platform library's
// C and C++ entry points (the declarations in platform/include) forward each
// call to the substitute selected at run time; a substitute answers through
// these classes and never sees the C-level handles except KSI parameters.
//
// Failure conventions mirror the real libraries: KSI calls answer a nonzero
// KSI_Status, NIC calls throw NodeMgr::Lib::NodeMgrException, the version
// service answers a nonzero TmkuserStatus_Code, host calls answer false/errno.
#pragma once

#include <ifaddrs.h>
#include <sys/sysinfo.h>

#include <optional>
#include <string>
#include <vector>

#include "ksi/Ksi.h"
#include "orv/platform/HealthElements.h"
#include "orv/platform/SystemIdentity.h"
#include "nodemgr/network/Pnic.h"
#include "orv/platform/backend/KsiParam.h"
#include "tmkuser/Version.h"

namespace orv::platform {

// Every KSI call, for substitutes that refuse individual calls (fault injection).
enum class KsiCall {
    CheckSig,
    Get,
    GetInstanceListAlloc,
    ParamListCreate,
    ParamListDestroy,
    ParamListUsedCount,
    ParamListAddString,
    ParamListAddInt,
    ParamListRemoveLastParam,
    ParamListGetParam,
    ParamListGetInt32,
    ParamGetString,
};

class NetworkBackend {
public:
    virtual ~NetworkBackend() = default;
    // Newly made pnics, owned by the caller. Throws NodeMgrException.
    virtual std::vector<NodeMgr::Network::Pnic*> getPnics() = 0;
    // A newly made pnic, or null when no NIC has that name. Throws NodeMgrException.
    virtual NodeMgr::Network::Pnic* getPnicByName(const std::string& name) = 0;
};

class KsiBackend {
public:
    virtual ~KsiBackend() = default;
    // signature/length as the caller passed them; *result set on success.
    virtual KSI_Status checkSig(const void* signature, uint32_t length, uint32_t* result) = 0;
    // params is empty when the caller passed no list.
    virtual KSI_Status get(KSI_NodeId node, const KsiParams& params, void* out, uint32_t outSize) = 0;
    // list left empty (std::nullopt) answers a null instance list.
    virtual KSI_Status getInstanceList(KSI_NodeId node, const KsiParams& params, std::optional<KsiParams>& list) = 0;
    // Asked before every parameter-list call the platform library performs
    // itself; nonzero makes that call fail as the real one fails (a null list
    // from create, a null parameter or string, or the status). param is the
    // parameter being added, read or removed, when there is one.
    virtual KSI_Status admit(KsiCall /*call*/, const KSI_Param* /*param*/) { return KSI_OK; }
};

class VersionBackend {
public:
    virtual ~VersionBackend() = default;
    virtual TmkuserStatus_Code getSystemVersion(TmkuserVersion_SystemVersionInfo& info) = 0;
    virtual int codeToErrno(TmkuserStatus_Code code) = 0;
    virtual std::string codeToString(TmkuserStatus_Code code) = 0;
    virtual bool osIsTmk() = 0;
};

class HostBackend {
public:
    virtual ~HostBackend() = default;
    // false when the platform cannot tell.
    virtual bool fqdn(std::string& out) = 0;
    virtual bool hostName(std::string& out) = 0;
    // 0 on success, else an errno value.
    virtual int sysInfo(struct sysinfo& out) = 0;
    // The interface-address list: 0 with `list` set (null when empty), else
    // the nonzero value getifaddrs would answer (errno set). The list is
    // released by freeInterfaceAddresses of the same substitute.
    virtual int interfaceAddresses(ifaddrs*& list) = 0;
    virtual void freeInterfaceAddresses(ifaddrs* list) = 0;
    // The firmware's identity of the machine; throws std::runtime_error when
    // the host cannot be asked.
    virtual SystemIdentity systemIdentity() = 0;
};

class HealthBackend {
public:
    virtual ~HealthBackend() = default;
    // Throws std::runtime_error when the elements cannot be read.
    virtual std::vector<HealthElement> elements(const std::string& watchedClass) = 0;
};

class Backend {
public:
    virtual ~Backend() = default;
    // "sim", "linux", ...
    virtual const char* name() const = 0;
    // Called when a top-level request starts (NetworkInfoImpl made, KSI_CheckSig,
    // version, host type and host calls): the moment a substitute may refresh
    // its data. Calls in between see one consistent state.
    virtual void beginBatch() {}
    virtual NetworkBackend& network() = 0;
    virtual KsiBackend& ksi() = 0;
    virtual VersionBackend& version() = 0;
    virtual HostBackend& host() = 0;
    // Null for a substitute that reports no hardware health: every watched
    // class then has no elements.
    virtual HealthBackend* health() { return nullptr; }
};

} // namespace orv::platform
