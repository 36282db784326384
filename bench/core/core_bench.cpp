// One request through the broker core to the raw C test provider, which builds
// one instance with 30 properties of mixed types (strings, integers, booleans,
// reals) and returns it; the reply is read back property by property. And an
// ExecQuery the provider refuses, answered by the core from its enumeration
// (Raw_Element and Raw_SubElement, two instances each), beside that enumeration:
// the difference is the query's parsing, evaluation and cutting to the SELECT list.
//
//   brokercore_bench                 Google Benchmark, reports ns per instance
//   brokercore_bench --fixed=N       N requests and nothing else, for
//                                    valgrind --tool=callgrind instruction counts
#include <benchmark/benchmark.h>

#include <string>

#include "orv/bench/FixedRuns.h"
#include "orv/host/broker_core.hpp"

namespace {

using orv::host::BrokerCore;
using orv::host::CallOptions;
using orv::host::CoreConfig;
using orv::host::ObjectScope;
using orv::host::Reply;

CoreConfig benchConfig() {
    CoreConfig config;
    config.providerDirs = {ORV_BENCH_PROVIDER_DIR};
    config.registrationFiles = {std::string(ORV_BENCH_SOURCE_DIR) + "/tests/rawprovider/rawprovider.reg"};
    config.mofPaths = {std::string(ORV_BENCH_SOURCE_DIR) + "/tests/rawprovider/rawprovider.mof"};
    return config;
}

// Sends one request and reads every property of the returned instance.
std::size_t roundTrip(BrokerCore& core, const CMPIObjectPath* path, const CallOptions& opts) {
    Reply reply = core.enumerateInstances(path, opts);
    std::size_t seen = 0;
    for (const CMPIInstance* inst : reply.instances()) {
        CMPICount count = inst->ft->getPropertyCount(inst, nullptr);
        for (CMPICount i = 0; i < count; ++i) {
            CMPIData data = inst->ft->getPropertyAt(inst, i, nullptr, nullptr);
            seen += data.type;
        }
    }
    return seen;
}

struct Setup {
    BrokerCore core{benchConfig()};
    ObjectScope scope;
    CMPIObjectPath* path = core.broker()->eft->newObjectPath(core.broker(), "root/cimv2", "Raw_SubElement", nullptr);
    CallOptions opts;
    Setup() { opts.principal = "bench"; }
};

void BM_InstanceWith30Properties(benchmark::State& state) {
    Setup setup;
    for (auto _ : state) {
        benchmark::DoNotOptimize(roundTrip(setup.core, setup.path, setup.opts));
    }
    state.SetItemsProcessed(state.iterations());
    state.counters["ns/instance"] =
        benchmark::Counter(static_cast<double>(state.iterations()), benchmark::Counter::kIsRate | benchmark::Counter::kInvert);
}
BENCHMARK(BM_InstanceWith30Properties);

// The raw provider refuses execQuery for the principal "noquery".
struct QuerySetup {
    BrokerCore core{benchConfig()};
    ObjectScope scope;
    CallOptions opts;
    QuerySetup() { opts.principal = "noquery"; }
    CMPIObjectPath* path(const char* className) {
        return core.broker()->eft->newObjectPath(core.broker(), "root/cimv2", className, nullptr);
    }
};

void BM_EnumerateInstances(benchmark::State& state) {
    QuerySetup setup;
    CMPIObjectPath* path = setup.path("Raw_Element");
    for (auto _ : state) {
        Reply reply = setup.core.enumerateInstances(path, setup.opts);
        benchmark::DoNotOptimize(reply.instances().size());
    }
}
BENCHMARK(BM_EnumerateInstances);

void BM_ExecQueryByEnumeration(benchmark::State& state) {
    QuerySetup setup;
    CMPIObjectPath* path = setup.path("");
    const char* query = "SELECT Counter, Text FROM Raw_Element WHERE Counter = 1 AND NOT Text IS NULL";
    for (auto _ : state) {
        Reply reply = setup.core.execQuery(path, query, "WQL", setup.opts);
        if (reply.instances().size() != 2) {
            state.SkipWithError("the query selected the wrong instances");
            break;
        }
    }
}
BENCHMARK(BM_ExecQueryByEnumeration);

}  // namespace

int main(int argc, char** argv) {
    if (const long count = orv::bench::fixedRuns(argc, argv); count >= 0) {
        Setup setup;
        std::size_t sum = 0;
        for (long n = 0; n < count; ++n) {
            sum += roundTrip(setup.core, setup.path, setup.opts);
        }
        return sum == 0 ? 1 : 0;
    }
    benchmark::Initialize(&argc, argv);
    benchmark::RunSpecifiedBenchmarks();
    benchmark::Shutdown();
    return 0;
}
