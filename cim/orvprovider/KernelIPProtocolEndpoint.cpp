// Kernel IP endpoints: one CIM instance per IP address configured on a virtual
// network interface of the hypervisor kernel's default TCP/IP stack.
//
// The addresses are read afresh from the kernel's system-information tree on
// every request and nothing is kept between requests. A failed kernel read is
// never reported to the client: the request then answers OK with nothing.
#include <arpa/inet.h>
#include <netinet/in.h>

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <memory>
#include <vector>

#include <cmpi/CmpiInstanceMI.h>
#include <cmpi/CmpiResultInstanceToPathFilter.h>
#include <ksi/Ksi.h>
#include <omc/ComputerSystem.h>

namespace {

// ---------------------------------------------------------------------------
// The records read from the kernel

// Longest interface name kept; longer names are cut.
constexpr std::size_t kIfNameLength = 150;
// Characters of the IPv6 summary's address text that are kept.
constexpr std::size_t kIPv6TextLength = 48;

// Address family of a record, as the CIM ProtocolIFType code. BOTH only
// selects all families in a request; records are IPV4 or IPV6.
enum IFTYPE : CMPIUint16 { OTHER = 1, IPV4 = 4096, IPV6 = 4097, BOTH = 4098 };

// One (interface, address) pair.
struct endpointDetails {
    char ifname[kIfNameLength + 1];
    uint32_t ipv4addr;  // network byte order
    uint32_t netmask;   // network byte order
    char ipv6addr[kIPv6TextLength + 1];
    uint32_t prefixlength;
    IFTYPE iftype;
};

static_assert(offsetof(TcpipKsi_VnicIPv6AddrSummary, prefixLength) == kIPv6TextLength,
              "the prefix length follows the address text");

// The TCP/IP stack instance whose interfaces are published.
constexpr const char* kTcpipStack = "defaultTcpipStack";

struct ParamListDestroyer {
    void operator()(KSI_ParamList* list) const { KSI_ParamListDestroy(list); }
};
using ParamList = std::unique_ptr<KSI_ParamList, ParamListDestroyer>;

// The instances of `node` under `params`; null when the call failed. A
// successful call may also answer no list at all, which reads as empty.
ParamList instanceList(KSI_NodeId node, const KSI_ParamList* params, bool& ok) {
    KSI_ParamList* raw = nullptr;
    ok = KSI_GetInstanceListAlloc(node, params, &raw) == KSI_OK;
    return ParamList(raw);
}

uint32_t listSize(const KSI_ParamList* list) {
    return list == nullptr ? 0 : KSI_ParamListUsedCount(list);
}

// The text in slot `index` of an instance list, or null for a slot without one.
const char* listedName(const KSI_ParamList* list, uint32_t index) {
    const KSI_Param* param = KSI_ParamListGetParam(list, index);
    return param == nullptr ? nullptr : KSI_ParamGetString(param);
}

endpointDetails newRecord(const char* ifname, IFTYPE iftype) {
    endpointDetails record{};
    std::strncpy(record.ifname, ifname, kIfNameLength);
    record.iftype = iftype;
    return record;
}

// Reads the vNIC's IPv4 address and netmask. Answers false only when the
// address reads but the netmask does not; a NIC whose address cannot be read
// has no IPv4 record.
bool readIPv4(KSI_ParamList* params, const char* ifname, std::vector<endpointDetails>& records) {
    uint32_t address = 0;
    if (KSI_Get(KSI_NODE_net_tcpip_instances_vNics_v4_ipaddr, params, &address, sizeof address) != KSI_OK) {
        return true;
    }
    uint32_t netmask = 0;
    if (KSI_Get(KSI_NODE_net_tcpip_instances_vNics_v4_netmask, params, &netmask, sizeof netmask) != KSI_OK) {
        return false;
    }
    endpointDetails record = newRecord(ifname, IPV4);
    record.ipv4addr = address;
    record.netmask = netmask;
    records.push_back(record);
    return true;
}

// Reads the summary of the IPv6 address whose name ends `params`.
bool readIPv6Summary(KSI_ParamList* params, const char* ifname, std::vector<endpointDetails>& records) {
    TcpipKsi_VnicIPv6AddrSummary summary{};
    if (KSI_Get(KSI_NODE_net_tcpip_instances_vNics_v6_addresses_summary, params, &summary,
                sizeof summary) != KSI_OK) {
        return false;
    }
    endpointDetails record = newRecord(ifname, IPV6);
    std::memcpy(record.ipv6addr, summary.address, kIPv6TextLength);
    record.prefixlength = summary.prefixLength;
    records.push_back(record);
    return true;
}

// Reads every IPv6 address of the vNIC. A NIC whose address list cannot be
// read has no IPv6 records; a summary that cannot be read fails the walk.
bool readIPv6(KSI_ParamList* params, const char* ifname, std::vector<endpointDetails>& records) {
    bool listed = false;
    const ParamList addresses =
        instanceList(KSI_NODE_net_tcpip_instances_vNics_v6_addresses, params, listed);
    if (!listed) {
        return true;
    }
    for (uint32_t i = 0; i < listSize(addresses.get()); ++i) {
        const char* address = listedName(addresses.get(), i);
        if (address == nullptr || KSI_ParamListAddString(params, address) != KSI_OK) {
            continue;
        }
        const bool read = readIPv6Summary(params, ifname, records);
        KSI_ParamListRemoveLastParam(params);
        if (!read) {
            return false;
        }
    }
    return true;
}

// The IPv4 record, then the IPv6 records, of the vNIC named last in `params`.
bool readVnic(KSI_ParamList* params, const char* ifname, std::vector<endpointDetails>& records) {
    return readIPv4(params, ifname, records) && readIPv6(params, ifname, records);
}

// Walks the stack's vNICs in the kernel's order. A NIC whose name cannot be
// added to the parameter list is skipped, except that when this happens to the
// last listed NIC the whole walk reports failure.
int readVnics(KSI_ParamList* params, const KSI_ParamList* vnics, std::vector<endpointDetails>& records) {
    const uint32_t count = listSize(vnics);
    for (uint32_t i = 0; i < count; ++i) {
        const char* ifname = listedName(vnics, i);
        if (ifname == nullptr) {
            continue;
        }
        if (KSI_ParamListAddString(params, ifname) != KSI_OK) {
            if (i + 1 == count) {
                return 1;
            }
            continue;
        }
        const bool read = readVnic(params, ifname, records);
        KSI_ParamListRemoveLastParam(params);
        if (!read) {
            return 1;
        }
    }
    return 0;
}

// Appends one record per (vNIC, address) of the default TCP/IP stack: per NIC
// its IPv4 record first, then its IPv6 records. Answers 0 on success and
// nonzero on failure; records appended before a failure stay.
int getendpointDetails(std::vector<endpointDetails>& records) {
    uint32_t interfaceVersion = 0;
    if (KSI_CheckSig(KSI_SIGNATURE, KSI_SIGNATURE_LENGTH, &interfaceVersion) != KSI_OK) {
        return 1;
    }
    const ParamList params(KSI_ParamListCreate(4, 4));
    if (!params || KSI_ParamListAddString(params.get(), kTcpipStack) != KSI_OK) {
        return 1;
    }
    bool listed = false;
    const ParamList vnics = instanceList(KSI_NODE_net_tcpip_instances_vNics, params.get(), listed);
    if (!listed) {
        return 1;
    }
    return readVnics(params.get(), vnics.get(), records);
}

// ---------------------------------------------------------------------------
// The CIM side

constexpr const char* kIPv4Class = "Orvane_KernelIPv4ProtocolEndpoint";
constexpr const char* kIPv6Class = "Orvane_KernelIPv6ProtocolEndpoint";
constexpr const char* kKernelParentClass = "Orvane_KernelIPProtocolEndpoint";
constexpr const char* kCimParentClass = "CIM_IPProtocolEndpoint";
constexpr CMPIUint16 kEnabledButOffline = 6;

// Keys stay in an instance whatever the property list asks, so that its path
// can still be built.
const char* kKeyNames[] = {"SystemCreationClassName", "SystemName", "CreationClassName", "Name",
                           nullptr};

// The families an enumeration of `className` returns; OTHER for none.
IFTYPE enumeratedFamilies(const CmpiString& className) {
    if (className.equalsIgnoreCase(kIPv4Class)) {
        return IPV4;
    }
    if (className.equalsIgnoreCase(kIPv6Class)) {
        return IPV6;
    }
    if (className.equalsIgnoreCase(kKernelParentClass) || className.equalsIgnoreCase(kCimParentClass)) {
        return BOTH;
    }
    return OTHER;
}

bool carriesIPv4(IFTYPE type) { return type == IPV4 || type == BOTH; }
bool carriesIPv6(IFTYPE type) { return type == IPV6 || type == BOTH; }

bool isReturned(IFTYPE recordType, IFTYPE wanted) {
    return (recordType == IPV4 && carriesIPv4(wanted)) || (recordType == IPV6 && carriesIPv6(wanted));
}

const char* familyClass(IFTYPE recordType) { return recordType == IPV4 ? kIPv4Class : kIPv6Class; }

// The class a getInstance of `className` answers with, or null when the
// class is not looked up by key.
const char* lookedUpClass(const CmpiString& className) {
    if (className.equalsIgnoreCase(kIPv4Class)) {
        return kIPv4Class;
    }
    if (className.equalsIgnoreCase(kIPv6Class)) {
        return kIPv6Class;
    }
    return nullptr;
}

// inet_ntoa's rendering of an address held in network byte order.
const char* dottedQuad(uint32_t address) {
    in_addr inAddress{};
    inAddress.s_addr = address;
    return inet_ntoa(inAddress);
}

void setIPv4Properties(CmpiInstance& instance, const endpointDetails& record) {
    instance.setProperty("IPv4Address", CmpiData(dottedQuad(record.ipv4addr)));
    instance.setProperty("SubnetMask", CmpiData(dottedQuad(record.netmask)));
    if (record.ipv4addr == 0) {
        instance.setProperty("EnabledState", CmpiData(kEnabledButOffline));
    }
}

void setIPv6Properties(CmpiInstance& instance, const endpointDetails& record) {
    instance.setProperty("IPv6Address", CmpiData(record.ipv6addr));
    instance.setProperty("PrefixLength", CmpiData(static_cast<CMPIUint8>(record.prefixlength)));
}

class KernelIPProtocolEndpointProvider : public CmpiInstanceMI {
public:
    KernelIPProtocolEndpointProvider(const CmpiBroker& mbp, const CmpiContext& ctx)
        : CmpiBaseMI(mbp, ctx), CmpiInstanceMI(mbp, ctx) {}

    CmpiStatus enumInstanceNames(const CmpiContext& ctx, CmpiResult& rslt,
                                 const CmpiObjectPath& cop) override {
        CmpiResultInstanceToPathFilter paths(rslt);
        return enumInstances(ctx, paths, cop, nullptr);
    }

    CmpiStatus enumInstances(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& cop,
                             const char** properties) override {
        const CmpiString className = cop.getClassName();
        const CmpiString nameSpace = cop.getNameSpace();
        std::vector<endpointDetails> records;
        if (getendpointDetails(records) != 0 || records.empty()) {
            return CmpiStatus(CMPI_RC_OK);
        }
        const IFTYPE wanted = enumeratedFamilies(className);
        if (wanted == OTHER) {
            return CmpiStatus(CMPI_RC_OK);
        }
        for (const endpointDetails& record : records) {
            if (isReturned(record.iftype, wanted)) {
                rslt.returnData(buildInstance(ctx, nameSpace, familyClass(record.iftype), record, properties));
            }
        }
        rslt.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    }

    // Looks the interface up by Name alone: the first record of that name
    // answers, whatever its family, under the requested family's class.
    CmpiStatus getInstance(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& cop,
                           const char** properties) override {
        const CmpiString className = cop.getClassName();
        const CmpiString nameSpace = cop.getNameSpace();
        const CmpiString name = cop.getKey("Name");
        std::vector<endpointDetails> records;
        if (getendpointDetails(records) != 0 || records.empty()) {
            return CmpiStatus(CMPI_RC_OK);
        }
        const char* instanceClass = lookedUpClass(className);
        if (instanceClass == nullptr) {
            return CmpiStatus(CMPI_RC_OK);
        }
        const char* wantedName = name.charPtr() == nullptr ? "" : name.charPtr();
        const auto match = std::find_if(records.begin(), records.end(), [wantedName](const endpointDetails& r) {
            return std::strncmp(r.ifname, wantedName, kIfNameLength) == 0;
        });
        if (match == records.end()) {
            return CmpiStatus(CMPI_RC_ERR_NOT_FOUND);
        }
        rslt.returnData(buildInstance(ctx, nameSpace, instanceClass, *match, properties));
        rslt.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    }

private:
    // The instance of `record` as class `className`, with only the requested
    // properties (all when `properties` is null).
    CmpiInstance buildInstance(const CmpiContext& ctx, const CmpiString& nameSpace, const char* className,
                               const endpointDetails& record, const char** properties) const {
        CmpiInstance instance(CmpiObjectPath(nameSpace, className));
        instance.setPropertyFilter(properties, kKeyNames);
        instance.setProperty("SystemCreationClassName", CmpiData(OMC::getComputerSystemClassName()));
        instance.setProperty("SystemName", CmpiData(OMC::getComputerSystemName(ctx, *broker)));
        instance.setProperty("CreationClassName", CmpiData(className));
        instance.setProperty("Name", CmpiData(record.ifname));
        instance.setProperty("ElementName", CmpiData(record.ifname));
        instance.setProperty("NameFormat", CmpiData("Talmek Interface Name"));
        instance.setProperty("ProtocolIFType", CmpiData(static_cast<CMPIUint16>(record.iftype)));
        if (carriesIPv4(record.iftype)) {
            setIPv4Properties(instance, record);
        }
        if (carriesIPv6(record.iftype)) {
            setIPv6Properties(instance, record);
        }
        return instance;
    }
};

}  // namespace

CMProviderBase(KernelIPProtocolEndpointProvider);

CMInstanceMIFactory(KernelIPProtocolEndpointProvider, KernelIPProtocolEndpointProvider)
