// libFuzzer target for the IP change detector: the input scripts the
// interface-address lists the platform answers, one after the other (entries
// of any family, with or without address and netmask, any mask bytes and any
// names, or a failing call). The detector is switched on and runs a few
// testAndSend rounds over them through the broker core; every indication it
// delivers must describe one replacement on one interface.
//
// Input: one byte of rounds, one byte of list count, then per list a count
// byte (0xFF: the call fails) and per entry: a kind byte (bit 0 address,
// bit 1 netmask, bits 2-3 family: IPv4, IPv6, link layer, or two more bytes),
// a name length byte and the name, then 26 address and 26 netmask bytes that
// follow the family field of the socket addresses.
#include <netinet/in.h>
#include <sys/socket.h>
#include <unistd.h>

#include <cerrno>
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <memory>
#include <string>
#include <vector>

#include <cmpi/CmpiBaseMI.h>
#include <cmpift.h>
#include <orv/host/broker_core.hpp>
#include <orv/platform/backend/Selector.h>

#include "KernelIpIndication.h"

namespace {

constexpr std::size_t kMaxLists = 4;
constexpr std::size_t kMaxEntries = 48;
constexpr std::size_t kMaxName = 40;
constexpr std::size_t kAddressBytes = 26;  // a socket address after its family field

void check(bool condition) {
    if (!condition) {
        __builtin_trap();
    }
}

class Reader {
public:
    Reader(const std::uint8_t* data, std::size_t size) : data_(data), size_(size) {}
    std::uint8_t byte() { return pos_ < size_ ? data_[pos_++] : 0; }
    void bytes(void* out, std::size_t count) {
        auto* target = static_cast<std::uint8_t*>(out);
        for (std::size_t i = 0; i < count; ++i) {
            target[i] = byte();
        }
    }
    bool empty() const { return pos_ >= size_; }

private:
    const std::uint8_t* data_;
    std::size_t size_;
    std::size_t pos_ = 0;
};

struct Node {
    ifaddrs entry{};
    sockaddr_storage address{};
    sockaddr_storage netmask{};
    std::string name;
    bool hasAddress = false;
    bool hasNetmask = false;
};

// One scripted answer of the interface-address list; the detector only reads it.
struct ScriptedList {
    bool fails = false;
    std::vector<Node> nodes;

    ifaddrs* link() {
        for (std::size_t i = 0; i < nodes.size(); ++i) {
            Node& node = nodes[i];
            node.entry.ifa_name = node.name.data();
            node.entry.ifa_addr = node.hasAddress ? reinterpret_cast<sockaddr*>(&node.address) : nullptr;
            node.entry.ifa_netmask = node.hasNetmask ? reinterpret_cast<sockaddr*>(&node.netmask) : nullptr;
            node.entry.ifa_next = i + 1 < nodes.size() ? &nodes[i + 1].entry : nullptr;
        }
        return nodes.empty() ? nullptr : &nodes.front().entry;
    }
};

std::uint16_t readFamily(Reader& in, std::uint8_t kind) {
    switch ((kind >> 2) & 3) {
    case 0: return AF_INET;
    case 1: return AF_INET6;
    case 2: return AF_PACKET;
    default: return static_cast<std::uint16_t>(in.byte() | in.byte() << 8);
    }
}

void readSocketAddress(Reader& in, sockaddr_storage& storage, std::uint16_t family) {
    storage.ss_family = family;
    in.bytes(reinterpret_cast<std::uint8_t*>(&storage) + sizeof storage.ss_family, kAddressBytes);
}

Node readNode(Reader& in) {
    Node node;
    const std::uint8_t kind = in.byte();
    const std::uint16_t family = readFamily(in, kind);
    const std::size_t nameLength = in.byte() % (kMaxName + 1);
    for (std::size_t i = 0; i < nameLength; ++i) {
        node.name.push_back(static_cast<char>(in.byte()));
    }
    node.name = node.name.c_str();  // a C name ends at its first NUL
    readSocketAddress(in, node.address, family);
    readSocketAddress(in, node.netmask, family);
    node.hasAddress = (kind & 1) != 0;
    node.hasNetmask = (kind & 2) != 0;
    return node;
}

std::vector<ScriptedList> readLists(Reader& in) {
    std::vector<ScriptedList> lists(1 + in.byte() % kMaxLists);
    for (ScriptedList& list : lists) {
        const std::uint8_t count = in.byte();
        list.fails = count == 0xFF;
        for (std::size_t i = 0; !list.fails && i < count % (kMaxEntries + 1) && !in.empty(); ++i) {
            list.nodes.push_back(readNode(in));
        }
    }
    return lists;
}

// Host calls of an inner substitute, except the interface list, which the script answers.
class ScriptedHost final : public orv::platform::HostBackend {
public:
    explicit ScriptedHost(orv::platform::HostBackend& inner) : inner_(inner) {}

    void play(std::vector<ScriptedList>* lists) {
        lists_ = lists;
        next_ = 0;
    }

    bool fqdn(std::string& out) override { return inner_.fqdn(out); }
    bool hostName(std::string& out) override { return inner_.hostName(out); }
    int sysInfo(struct sysinfo& out) override { return inner_.sysInfo(out); }
    orv::platform::SystemIdentity systemIdentity() override { return inner_.systemIdentity(); }

    int interfaceAddresses(ifaddrs*& list) override {
        ScriptedList& answer = (*lists_)[next_++ % lists_->size()];
        if (answer.fails) {
            list = nullptr;
            errno = EIO;
            return -1;
        }
        list = answer.link();
        return 0;
    }
    void freeInterfaceAddresses(ifaddrs*) override {}

private:
    orv::platform::HostBackend& inner_;
    std::vector<ScriptedList>* lists_ = nullptr;
    std::size_t next_ = 0;
};

class ScriptedBackend final : public orv::platform::Backend {
public:
    explicit ScriptedBackend(std::unique_ptr<orv::platform::Backend> inner)
        : inner_(std::move(inner)), host_(inner_->host()) {}

    const char* name() const override { return "scripted"; }
    void beginBatch() override { inner_->beginBatch(); }
    orv::platform::NetworkBackend& network() override { return inner_->network(); }
    orv::platform::KsiBackend& ksi() override { return inner_->ksi(); }
    orv::platform::VersionBackend& version() override { return inner_->version(); }
    orv::platform::HostBackend& host() override { return host_; }
    ScriptedHost& scripted() { return host_; }

private:
    std::unique_ptr<orv::platform::Backend> inner_;
    ScriptedHost host_;
};

std::string stringProperty(const CMPIInstance* instance, const char* name) {
    CMPIStatus st{CMPI_RC_OK, nullptr};
    const CMPIData data = instance->ft->getProperty(instance, name, &st);
    check(st.rc == CMPI_RC_OK && data.type == CMPI_string && data.value.string != nullptr);
    return data.value.string->ft->getCharPtr(data.value.string, nullptr);
}

const CMPIInstance* embedded(const CMPIInstance* indication, const char* name) {
    CMPIStatus st{CMPI_RC_OK, nullptr};
    const CMPIData data = indication->ft->getProperty(indication, name, &st);
    check(st.rc == CMPI_RC_OK && data.type == CMPI_instance && data.value.inst != nullptr);
    return data.value.inst;
}

std::string addressOf(const CMPIInstance* endpoint, bool ipv4) {
    return ipv4 ? stringProperty(endpoint, "IPv4Address") + "/" + stringProperty(endpoint, "SubnetMask")
                : stringProperty(endpoint, "IPv6ddress");
}

// One replacement on one interface, between two endpoints of one family.
void checkIndication(std::string_view ns, const CMPIInstance* indication) {
    check(ns == "root/cimv2");
    const CMPIInstance* source = embedded(indication, "SourceInstance");
    const CMPIInstance* previous = embedded(indication, "PreviousInstance");
    const std::string name = stringProperty(source, "Name");
    const std::string className = stringProperty(source, "CreationClassName");
    check(stringProperty(previous, "Name") == name);
    check(stringProperty(previous, "CreationClassName") == className);
    check(stringProperty(indication, "IndicationIdentifier") == "Orvane:" + name);
    const bool ipv4 = className == "Orvane_KernelIPv4ProtocolEndpoint";
    check(ipv4 || className == "Orvane_KernelIPv6ProtocolEndpoint");
    check(addressOf(source, ipv4) != addressOf(previous, ipv4));
    check(stringProperty(indication, "SourceInstanceHost") ==
          stringProperty(source, ipv4 ? "IPv4Address" : "IPv6ddress"));
}

std::string writeFixture() {
    const std::string path = "/tmp/orv-kernelip-fuzz-" + std::to_string(::getpid()) + ".json";
    std::ofstream(path) << R"({"host": {"name": "fuzzhost", "fqdn": "fuzzhost.example", "osIsTmk": true}})";
    return path;
}

orv::host::CoreConfig coreConfig() {
    orv::host::CoreConfig config;
    config.mofPaths = {std::string(ORV_KERNELIP_FUZZ_SOURCE_DIR) + "/cim/mof/orvprovider.mof"};
    return config;
}

// Everything one process keeps across inputs.
struct Harness {
    Harness() : core(coreConfig()), holder(CmpiBroker(core.broker()), CmpiContext(nullptr)), fixture(writeFixture()) {
        holder.setProviderBase(nullptr);
        std::string error;
        auto backend = std::make_unique<ScriptedBackend>(orv::platform::makeSimBackend(fixture, error));
        scripted = backend.get();
        orv::platform::installBackend(std::move(backend));
        core.addIndicationSubscriber(checkIndication);
    }

    ~Harness() { ::unlink(fixture.c_str()); }

    orv::host::BrokerCore core;
    CmpiBaseMI holder;
    const std::string fixture;  // the inner substitute's host name
    ScriptedBackend* scripted = nullptr;
};

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    static Harness harness;
    Reader in(data, size);
    const unsigned rounds = 1 + in.byte() % 4;
    std::vector<ScriptedList> lists = readLists(in);
    harness.scripted->scripted().play(&lists);
    {
        orv::host::ObjectScope scope;
        CmpiBroker broker(harness.core.broker());
        const CmpiContext context(nullptr);
        ORV::KernelIpIndication detector;
        detector.enableIndication();
        for (unsigned i = 0; i < rounds; ++i) {
            detector.testAndSend(context, &broker);
        }
        detector.disableIndication();
        detector.testAndSend(context, &broker);
    }
    harness.scripted->scripted().play(nullptr);
    return 0;
}
