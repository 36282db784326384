// ExecQuery of a provider that refuses execQuery, answered by the broker core from
// the provider's enumeration (Raw_Element and Raw_SubElement, two instances each),
// beside the plain enumeration it is built on: the difference is the query's
// parsing, evaluation and cutting to the SELECT list.
//
//   query_bench        Google Benchmark, ns per request
#include <benchmark/benchmark.h>

#include <string>

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

struct Setup {
    BrokerCore core{benchConfig()};
    ObjectScope scope;
    CallOptions opts;
    Setup() { opts.principal = "noquery"; }  // the raw provider refuses execQuery for it
    CMPIObjectPath* path(const char* className) {
        return core.broker()->eft->newObjectPath(core.broker(), "root/cimv2", className, nullptr);
    }
};

void BM_EnumerateInstances(benchmark::State& state) {
    Setup setup;
    CMPIObjectPath* path = setup.path("Raw_Element");
    for (auto _ : state) {
        Reply reply = setup.core.enumerateInstances(path, setup.opts);
        benchmark::DoNotOptimize(reply.instances().size());
    }
}
BENCHMARK(BM_EnumerateInstances);

void BM_ExecQueryByEnumeration(benchmark::State& state) {
    Setup setup;
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

BENCHMARK_MAIN();
