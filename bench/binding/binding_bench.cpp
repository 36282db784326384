// EnumerateInstances of Bench_Port (64 instances of an Ethernet port's shape,
// built by a provider on the C++ binding) through the broker core, streamed to
// a consumer that reads each instance the way the CIM-XML writer does: the
// object path (class name, keys with their names), the class name again, and
// every property with its name, array elements included. What is measured is
// the binding and the core per delivered instance, without platform or XML.
//
//   binding_bench                 Google Benchmark, reports ns per instance
//   binding_bench --fixed=N       N requests and nothing else, for
//                                 valgrind --tool=callgrind instruction counts
//   valgrind --tool=callgrind --collect-atstart=no binding_bench --callgrind
//                                 the count of one steady-state request (64 instances)
#include <benchmark/benchmark.h>

#include <cstring>
#include <string>

#include "orv/bench/Callgrind.h"
#include "orv/bench/FixedRuns.h"
#include "orv/host/broker_core.hpp"

namespace {

using orv::host::BrokerCore;
using orv::host::CallOptions;
using orv::host::CoreConfig;
using orv::host::ObjectScope;
using orv::host::Reply;
using orv::host::ReturnedItem;

constexpr int kInstancesPerRequest = 64;

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
    Setup() {
        opts.principal = "bench";
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
    Setup setup;
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
BENCHMARK(BM_PortShapedInstances);

}  // namespace

int main(int argc, char** argv) {
    if (std::strcmp(argc > 1 ? argv[1] : "", "--callgrind") == 0) {
        Setup setup;
        return orv::bench::collectSecondRun([&] { return setup.request() ? std::size_t{1} : 0; }) == 1 ? 0 : 1;
    }
    if (const long count = orv::bench::fixedRuns(argc, argv); count >= 0) {
        Setup setup;
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
