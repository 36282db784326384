// EnumerateInstances of Bench_Port (64 instances of an Ethernet port's shape,
// built by a provider on the C++ binding) through the broker core, streamed to
// one of two consumers:
// - one that reads each instance the way the CIM-XML writer does: the object
//   path (class name, keys with their names), the class name again, and every
//   property with its name, array elements included. What is measured is the
//   binding and the core per delivered instance, without platform or XML;
// - the CIM-XML writer itself, each instance written as the VALUE.NAMEDINSTANCE
//   of a streamed EnumerateInstances answer (the text handed over in 16 KiB
//   pieces as orv-cimhost sends its chunks): the binding, the core and the writer
//   together per delivered instance, still without platform or HTTP.
//
//   binding_bench                 Google Benchmark, reports ns per instance
//   binding_bench --fixed=N [--xml]
//                                 N requests and nothing else, for
//                                 valgrind --tool=callgrind instruction counts
//   valgrind --tool=callgrind --collect-atstart=no binding_bench --callgrind [--xml]
//                                 the count of one steady-state request (64 instances)
#include <benchmark/benchmark.h>

#include <cstring>
#include <string>

#include "orv/bench/Callgrind.h"
#include "orv/bench/FixedRuns.h"
#include "orv/cimxml/object_encoder.hpp"
#include "orv/cimxml/xml_writer.hpp"
#include "orv/host/broker_core.hpp"

namespace {

using orv::host::BrokerCore;
using orv::host::CallOptions;
using orv::host::CoreConfig;
using orv::host::ObjectScope;
using orv::host::Reply;
using orv::host::ReturnedItem;

constexpr int kInstancesPerRequest = 64;
// orv-cimhost sends a streamed answer in chunks of about this size.
constexpr std::size_t kChunkBytes = 16 * 1024;

enum class Consumer { Read, Xml };

CoreConfig benchConfig() {
    CoreConfig config;
    config.providerDirs = {ORV_BENCH_PROVIDER_DIR};
    config.registrationFiles = {std::string(ORV_BENCH_SOURCE_DIR) + "/bench_port.reg"};
    config.mofPaths = {std::string(ORV_BENCH_SOURCE_DIR) + "/bench_port.mof"};
    return config;
}

std::size_t textLength(const CMPIString* text) {
    const char* chars = text != nullptr ? text->ft->getCharPtr(text, nullptr) : nullptr;
    return chars != nullptr ? std::strlen(chars) : 0;
}

std::size_t readValue(const CMPIData& data) {
    if (data.state != CMPI_goodValue) {
        return 1;
    }
    if (data.type == CMPI_string) {
        return textLength(data.value.string);
    }
    if ((data.type & CMPI_ARRAY) != 0) {
        const CMPIArray* array = data.value.array;
        std::size_t seen = 0;
        CMPICount size = array->ft->getSize(array, nullptr);
        for (CMPICount i = 0; i < size; ++i) {
            seen += readValue(array->ft->getElementAt(array, i, nullptr));
        }
        return seen;
    }
    return data.type;
}

std::size_t readPath(const CMPIObjectPath* path) {
    std::size_t seen = textLength(path->ft->getClassName(path, nullptr));
    CMPICount keys = path->ft->getKeyCount(path, nullptr);
    for (CMPICount i = 0; i < keys; ++i) {
        CMPIString* name = nullptr;
        seen += readValue(path->ft->getKeyAt(path, i, &name, nullptr)) + textLength(name);
    }
    return seen;
}

// What the writer reads of one instance.
std::size_t readInstance(const CMPIInstance* inst) {
    std::size_t seen = readPath(inst->ft->getObjectPath(inst, nullptr));
    const CMPIObjectPath* again = inst->ft->getObjectPath(inst, nullptr);
    seen += textLength(again->ft->getClassName(again, nullptr));
    CMPICount count = inst->ft->getPropertyCount(inst, nullptr);
    for (CMPICount i = 0; i < count; ++i) {
        CMPIString* name = nullptr;
        seen += readValue(inst->ft->getPropertyAt(inst, i, &name, nullptr)) + textLength(name);
    }
    return seen;
}

struct Setup {
    BrokerCore core{benchConfig()};
    ObjectScope scope;
    CMPIObjectPath* path = core.broker()->eft->newObjectPath(core.broker(), "root/cimv2", "Bench_Port", nullptr);
    std::size_t seen = 0;
    int instances = 0;
    CallOptions opts;
    orv::cimxml::XmlWriter out;
    orv::cimxml::InstanceEncoding encoding;
    explicit Setup(Consumer consumer = Consumer::Read) {
        opts.principal = "bench";
        encoding.declarations = orv::cimxml::ClassDeclarations(core.classes(), "root/cimv2", "Bench_Port");
        if (consumer == Consumer::Xml) {
            opts.onItem = [this](const ReturnedItem& item) {
                orv::cimxml::writeNamedInstance(out, item.data.value.inst, encoding);
                if (out.size() >= kChunkBytes) {
                    seen += out.drain().size();
                }
                ++instances;
                return true;
            };
            return;
        }
        opts.onItem = [this](const ReturnedItem& item) {
            seen += readInstance(item.data.value.inst);
            ++instances;
            return true;
        };
    }
    // One request; false when it did not deliver every instance.
    bool request() {
        instances = 0;
        Reply reply = core.enumerateInstances(path, opts);
        return reply.rc() == CMPI_RC_OK && instances == kInstancesPerRequest;
    }
};

void BM_PortShapedInstances(benchmark::State& state) {
    Setup setup(static_cast<Consumer>(state.range(0)));
    for (auto _ : state) {
        if (!setup.request()) {
            state.SkipWithError("the request failed");
            break;
        }
    }
    benchmark::DoNotOptimize(setup.seen);
    state.SetItemsProcessed(state.iterations() * kInstancesPerRequest);
    state.counters["ns/instance"] = benchmark::Counter(static_cast<double>(state.iterations() * kInstancesPerRequest),
                                                       benchmark::Counter::kIsRate | benchmark::Counter::kInvert);
}
// 0: read as the writer reads; 1: written as CIM-XML.
BENCHMARK(BM_PortShapedInstances)->ArgName("xml")->Arg(0)->Arg(1);

bool hasArgument(int argc, char** argv, const char* wanted) {
    for (int i = 1; i < argc; ++i) {
        if (std::strcmp(argv[i], wanted) == 0) {
            return true;
        }
    }
    return false;
}

}  // namespace

int main(int argc, char** argv) {
    const Consumer consumer = hasArgument(argc, argv, "--xml") ? Consumer::Xml : Consumer::Read;
    if (hasArgument(argc, argv, "--callgrind")) {
        Setup setup(consumer);
        return orv::bench::collectSecondRun([&] { return setup.request() ? std::size_t{1} : 0; }) == 1 ? 0 : 1;
    }
    if (const long count = orv::bench::fixedRuns(argc, argv); count >= 0) {
        Setup setup(consumer);
        for (long n = 0; n < count; ++n) {
            if (!setup.request()) {
                return 1;
            }
        }
        return setup.seen == 0 ? 1 : 0;
    }
    benchmark::Initialize(&argc, argv);
    benchmark::RunSpecifiedBenchmarks();
    benchmark::Shutdown();
    return 0;
}
