// The CIM-XML writer alone on an Orvane_EthernetPort instance as the provider fills it for
// one NIC of the simulated host (the same properties, types, order and values): its
// VALUE.NAMEDINSTANCE (INSTANCENAME + INSTANCE) written into a writer that is drained after
// each instance, as a streamed answer is. The instance is made once; what is measured is
// the writer with the broker core's accessors it calls (property and key reads, the object
// path), as orv-cimhost runs them per delivered instance.
//
//   cimxml_writer_bench                      Google Benchmark, reports ns per instance
//   cimxml_writer_bench --fixed=N [--class-origin]
//                                            N instances and nothing else, counted under
//                                            valgrind --tool=callgrind --collect-atstart=no
//                                            (one instance is written first to warm up)
#include <benchmark/benchmark.h>

#include <cstdlib>
#include <cstring>
#include <initializer_list>
#include <string>

#include "orv/bench/Callgrind.h"
#include "orv/cimxml/object_encoder.hpp"
#include "orv/host/broker_core.hpp"

namespace {

using orv::cimxml::ClassDeclarations;
using orv::cimxml::InstanceEncoding;
using orv::cimxml::XmlWriter;

constexpr const char* kClass = "Orvane_EthernetPort";
constexpr const char* kNamespace = "root/cimv2";

orv::host::CoreConfig benchConfig() {
    orv::host::CoreConfig config;
    config.mofPaths = {ORV_BENCH_MOF};
    return config;
}

class PortInstance {
public:
    PortInstance() {
        CMPIObjectPath* path = broker()->eft->newObjectPath(broker(), kNamespace, kClass, nullptr);
        addKey(path, "SystemCreationClassName", "OMC_UnitaryComputerSystem");
        addKey(path, "SystemName", "orvhost01.lab.example.com");
        addKey(path, "CreationClassName", kClass);
        addKey(path, "DeviceID", "vmnic0");
        instance_ = broker()->eft->newInstance(broker(), path, nullptr);
        text("DeviceID", "vmnic0");
        text("SystemCreationClassName", "OMC_UnitaryComputerSystem");
        text("SystemName", "orvhost01.lab.example.com");
        text("CreationClassName", kClass);
        text("Name", "vmnic0");
        text("ElementName", "vmnic0");
        uint16("PortType", 105);
        uint16("AutoSense", 1);
        text("Caption", "vmnic0");
        uint64("Speed", 10000000000ULL);
        uint16("LinkTechnology", 2);
        text("PermanentAddress", "005056000000");
        texts("NetworkAddresses", {"005056000000"});
        uint16("RequestedState", 5);
        uint16("EnabledState", 2);
        uint16s("OperationalStatus", {2});
        uint16s("Capabilities", {0});
        uint16s("EnabledCapabilities", {0});
        boolean("FullDuplex", true);
        uint64("ActiveMaximumTransmissionUnit", 9000);
        texts("OtherIdentifyingInfo", {"0x03", "0x00", "0x00", "0x8086", "0x10fb", "0x0000"});
        texts("IdentifyingDescriptions",
              {"PCI Bus", "PCI Slot", "PCI Function", "PCI Vendor", "PCI DeviceID", "PCI Segment"});
        uint16s("SupportedPorts", {5});
        texts("SupportedLinkModes", {"1000_FULL", "10000_FULL"});
        texts("AdvertisedLinkModes", {"1000_FULL", "10000_FULL"});
        boolean("AdvertisedAutoNegotiation", true);
        uint32("PhysicalAddress", 0);
        uint16("Transceiver", 2);
        uint16s("WOLSupported", {});
        uint16s("WOLOptions", {0});
    }

    const CMPIInstance* instance() const { return instance_; }
    InstanceEncoding encoding(bool classOrigin) const {
        InstanceEncoding encoding;
        encoding.includeClassOrigin = classOrigin;
        encoding.declarations = ClassDeclarations(core_.classes(), kNamespace, kClass);
        return encoding;
    }

private:
    const CMPIBroker* broker() const { return core_.broker(); }
    CMPIString* string(const char* chars) { return broker()->eft->newString(broker(), chars, nullptr); }
    void addKey(CMPIObjectPath* path, const char* name, const char* chars) {
        CMPIValue value{};
        value.string = string(chars);
        path->ft->addKey(path, name, &value, CMPI_string);
    }
    void set(const char* name, CMPIValue value, CMPIType type) { instance_->ft->setProperty(instance_, name, &value, type); }
    void text(const char* name, const char* chars) {
        CMPIValue value{};
        value.string = string(chars);
        set(name, value, CMPI_string);
    }
    void boolean(const char* name, bool flag) {
        CMPIValue value{};
        value.boolean = flag ? 1 : 0;
        set(name, value, CMPI_boolean);
    }
    void uint16(const char* name, CMPIUint16 number) {
        CMPIValue value{};
        value.uint16 = number;
        set(name, value, CMPI_uint16);
    }
    void uint32(const char* name, CMPIUint32 number) {
        CMPIValue value{};
        value.uint32 = number;
        set(name, value, CMPI_uint32);
    }
    void uint64(const char* name, CMPIUint64 number) {
        CMPIValue value{};
        value.uint64 = number;
        set(name, value, CMPI_uint64);
    }
    void texts(const char* name, std::initializer_list<const char*> items) {
        CMPIArray* array = broker()->eft->newArray(broker(), static_cast<CMPICount>(items.size()), CMPI_string, nullptr);
        CMPICount i = 0;
        for (const char* item : items) {
            CMPIValue value{};
            value.string = string(item);
            array->ft->setElementAt(array, i++, &value, CMPI_string);
        }
        CMPIValue value{};
        value.array = array;
        set(name, value, CMPI_stringA);
    }
    void uint16s(const char* name, std::initializer_list<CMPIUint16> items) {
        CMPIArray* array = broker()->eft->newArray(broker(), static_cast<CMPICount>(items.size()), CMPI_uint16, nullptr);
        CMPICount i = 0;
        for (CMPIUint16 item : items) {
            CMPIValue value{};
            value.uint16 = item;
            array->ft->setElementAt(array, i++, &value, CMPI_uint16);
        }
        CMPIValue value{};
        value.array = array;
        set(name, value, CMPI_uint16A);
    }

    orv::host::BrokerCore core_{benchConfig()};
    orv::host::ObjectScope scope_;
    CMPIInstance* instance_ = nullptr;
};

// One instance as a streamed answer writes it: the objects the writer asks the core for
// (the object path, property names) live until the instance is written.
std::size_t writeOne(XmlWriter& out, const PortInstance& port, const InstanceEncoding& encoding) {
    orv::host::ObjectScope scope;
    orv::cimxml::writeNamedInstance(out, port.instance(), encoding);
    const std::size_t bytes = out.size();
    benchmark::DoNotOptimize(out.drain());
    return bytes;
}

void runWriter(benchmark::State& state, bool classOrigin) {
    PortInstance port;
    const InstanceEncoding encoding = port.encoding(classOrigin);
    XmlWriter out;
    std::size_t bytes = 0;
    for (auto _ : state) {
        bytes = writeOne(out, port, encoding);
    }
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * bytes));
    state.counters["ns/instance"] = benchmark::Counter(static_cast<double>(state.iterations()),
                                                       benchmark::Counter::kIsRate | benchmark::Counter::kInvert);
}

void BM_NamedPortInstance(benchmark::State& state) { runWriter(state, false); }
BENCHMARK(BM_NamedPortInstance);

void BM_NamedPortInstanceWithClassOrigin(benchmark::State& state) { runWriter(state, true); }
BENCHMARK(BM_NamedPortInstanceWithClassOrigin);

int fixedRun(long count, bool classOrigin) {
    PortInstance port;
    const InstanceEncoding encoding = port.encoding(classOrigin);
    XmlWriter out;
    const std::size_t bytes = orv::bench::collectSecondRun([&] {
        std::size_t written = 0;
        for (long n = 0; n < count; ++n) {
            written += writeOne(out, port, encoding);
        }
        return written;
    });
    return bytes == 0 ? 1 : 0;
}

}  // namespace

int main(int argc, char** argv) {
    long fixed = 0;
    bool classOrigin = false;
    for (int i = 1; i < argc; ++i) {
        if (std::strncmp(argv[i], "--fixed=", 8) == 0) {
            fixed = std::atol(argv[i] + 8);
        } else if (std::strcmp(argv[i], "--class-origin") == 0) {
            classOrigin = true;
        }
    }
    if (fixed > 0) {
        return fixedRun(fixed, classOrigin);
    }
    benchmark::Initialize(&argc, argv);
    benchmark::RunSpecifiedBenchmarks();
    benchmark::Shutdown();
    return 0;
}
