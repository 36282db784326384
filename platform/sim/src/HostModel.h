// The simulated host as read from a fixture file: plain values, immutable once
// loaded. Absent sections (std::nullopt) make the calls that need them fail.
#pragma once

#include <array>
#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <unordered_map>
#include <vector>

#include "FaultTable.h"
#include "ksi/KsiRecords.h"
#include "orv/platform/HealthElements.h"
#include "orv/platform/SystemIdentity.h"
#include "nodemgr/network/PnicRecords.h"
#include "tmkuser/Version.h"

namespace orv::platform::sim {

using MacBytes = std::array<unsigned char, 6>;

// A kernel instance list: absent from the fixture (the node is missing), null
// (the kernel answers a null list) or present.
enum class ListState { Missing, Null, Present };

template <typename Item>
struct InstanceList {
    ListState state = ListState::Missing;
    std::vector<Item> items;
};

struct PciModel {
    uint16_t segment = 0;
    uint8_t bus = 0;
    uint8_t slot = 0;
    uint8_t function = 0;
    uint16_t vendorId = 0;
    uint16_t deviceId = 0;
};

struct RingsModel {
    NodeMgr::Network::PnicRingInfo current;
    NodeMgr::Network::PnicRingInfo preset;
};

struct NicModel {
    std::string name;
    std::optional<PciModel> pci;
    MacBytes mac{};
    bool enabled = false;
    bool linkUp = false;
    NodeMgr::Network::LinkSpeed speed = NodeMgr::Network::CONNECTION_AUTO;
    NodeMgr::Network::Duplex duplex = NodeMgr::Network::DUPLEX_MODE_AUTO;
    uint32_t mtu = 0;
    bool wolSupported = false;
    bool wolEnabled = false;
    std::optional<NodeMgr::Network::PnicInfo> info;
    std::optional<NodeMgr::Network::PnicDriverInfo> driver;
    std::optional<NodeMgr::Network::PnicStats> stats;
    std::optional<NodeMgr::Network::PnicCoalesceInfo> coalesce;
    std::optional<NodeMgr::Network::PnicPauseInfo> pause;
    std::optional<RingsModel> rings;
};

struct Ipv4Model {
    uint32_t address = 0;  // network byte order
    uint32_t netmask = 0;  // network byte order
};

struct Ipv6Model {
    std::string address;
    uint32_t prefixLength = 0;
};

// One slot of a stack's vNIC list; an empty slot holds no parameter.
struct VnicModel {
    bool emptySlot = false;
    std::string name;
    std::optional<Ipv4Model> ipv4;
    InstanceList<Ipv6Model> ipv6;
};

struct StackModel {
    InstanceList<VnicModel> vnics;
};

struct PackageModel {
    int32_t instance = 0;
    uint32_t cores = 0;
};

struct PcpuModel {
    int32_t instance = 0;
    uint8_t family = 0;
    uint8_t model = 0;
    uint8_t type = 0;
    uint8_t stepping = 0;
    Hardware_PCPUCPUIDSummaryStruct cpuid{};
    bool halted = false;
    uint32_t activeLoad = 0;
};

struct CpuModel {
    PowerKsi_Policy powerPolicy{};
    Hardware_HTStateEnum htState = HTNotPresent;
    std::array<char, 48> modelName{};
    InstanceList<PackageModel> packages;
    InstanceList<PcpuModel> cpus;
};

struct StatusText {
    int errnoValue = 0;
    std::string message;
};

struct VersionModel {
    std::optional<TmkuserVersion_SystemVersionInfo> record;  // nullopt: the service fails
    TmkuserStatus_Code failureCode = 0;
};

// A hardware element and the watched class it is reported under.
struct HealthElementModel {
    std::string watchedClass;
    HealthElement element;
};

struct HostModel {
    std::string hostName;
    std::optional<std::string> fqdn;
    bool osIsTmk = false;
    std::optional<long> uptimeSeconds;
    std::optional<std::vector<NicModel>> nics;
    std::unordered_map<std::string, size_t> nicIndex;  // name -> position in nics, made with them
    std::optional<std::map<std::string, StackModel>> tcpipStacks;
    std::optional<CpuModel> cpu;
    std::optional<VersionModel> version;
    std::vector<HealthElementModel> health;
    std::optional<SystemIdentity> system;  // nullopt: the host tells no identity
    std::map<TmkuserStatus_Code, StatusText> statusCodes;
    FaultTable faults;
};

} // namespace orv::platform::sim
