// Cost of "Orvane_Processor" requests through the broker core on simulated
// hosts of 1, 8 and 64 packages of 16 cores (one physical CPU per core).
//
//   processor_bench                          Google Benchmark runs; the
//                                            per_instance counter is the time
//                                            per delivered instance
//   processor_bench --callgrind-once N       one enumeration of N packages,
//                                            with callgrind collecting only
//                                            around it:
//     valgrind --tool=callgrind --collect-atstart=no processor_bench --callgrind-once 8
#include <benchmark/benchmark.h>
#include "orv/bench/Callgrind.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <memory>
#include <string>

#include "orv/platform/simgen/HostGenerator.h"
#include "orv/providertest/ProviderCore.h"
#include "orv/providertest/SimHost.h"

namespace {

constexpr const char* kProcessorClass = "Orvane_Processor";
constexpr unsigned kCoresPerPackage = 16;

void pointAtTheBuild() {
    setenv("ORV_SOURCE_DIR", ORV_BENCH_SOURCE_DIR, 0);
    setenv("ORV_BUILD_DIR", ORV_BENCH_BUILD_DIR, 0);
}

void serveHost(const orv::providertest::SimHost& host, unsigned packages) {
    orv::platform::simgen::HostShape shape;
    shape.packages = packages;
    shape.coresPerPackage = kCoresPerPackage;
    host.write(orv::platform::simgen::generateHost(shape));
}

std::size_t enumerate(orv::providertest::ProviderCore& provider) {
    const orv::host::Reply reply = provider.enumerateInstances(kProcessorClass);
    return reply.rc() == CMPI_RC_OK ? reply.instances().size() : 0;
}

// One simulated host and broker core for the whole run; the fixture is
// rewritten when the package count changes.
struct Bench {
    void usePackages(unsigned packages) {
        if (packages == current) {
            return;
        }
        serveHost(host, packages);
        current = packages;
        if (!provider) {
            provider = std::make_unique<orv::providertest::ProviderCore>();
        }
    }
    orv::providertest::SimHost host;
    std::unique_ptr<orv::providertest::ProviderCore> provider;
    unsigned current = 0;
};

Bench& bench() {
    static Bench instance;
    return instance;
}

void BM_EnumeratePackages(benchmark::State& state) {
    const auto packages = static_cast<unsigned>(state.range(0));
    bench().usePackages(packages);
    for (auto _ : state) {
        if (enumerate(*bench().provider) != packages) {
            state.SkipWithError("unexpected reply");
            break;
        }
    }
    state.counters["per_instance"] =
        benchmark::Counter(static_cast<double>(state.iterations()) * packages,
                           benchmark::Counter::kIsRate | benchmark::Counter::kInvert);
}

void BM_GetLastPackage(benchmark::State& state) {
    const auto packages = static_cast<unsigned>(state.range(0));
    bench().usePackages(packages);
    const std::string deviceId = "cpu-" + std::to_string(packages - 1);
    for (auto _ : state) {
        const orv::host::Reply reply = bench().provider->getInstance(kProcessorClass, {{"DeviceID", deviceId}});
        if (reply.rc() != CMPI_RC_OK || reply.instances().size() != 1) {
            state.SkipWithError("unexpected reply");
            break;
        }
    }
}

BENCHMARK(BM_EnumeratePackages)->Arg(1)->Arg(8)->Arg(64)->Unit(benchmark::kMicrosecond);
BENCHMARK(BM_GetLastPackage)->Arg(1)->Arg(8)->Arg(64)->Unit(benchmark::kMicrosecond);

// One warmed-up enumeration under callgrind's collection; prints the count.
int callgrindOnce(unsigned packages) {
    orv::providertest::SimHost host;
    serveHost(host, packages);
    orv::providertest::ProviderCore provider;
    const std::size_t instances = orv::bench::collectSecondRun([&] { return enumerate(provider); });
    std::printf("instances %zu\n", instances);
    return instances == packages ? 0 : 1;
}

}  // namespace

int main(int argc, char** argv) {
    pointAtTheBuild();
    if (argc == 3 && std::strcmp(argv[1], "--callgrind-once") == 0) {
        return callgrindOnce(static_cast<unsigned>(std::strtoul(argv[2], nullptr, 10)));
    }
    benchmark::Initialize(&argc, argv);
    benchmark::RunSpecifiedBenchmarks();
    benchmark::Shutdown();
    return 0;
}
