// Time per returned instance of an enumeration of Orvane_KernelIPProtocolEndpoint
// through the broker core, for 1, 16 and 256 virtual NICs with one IPv4 and
// three IPv6 addresses each (4, 64 and 1024 instances).
//
//   kernelip_bench                      Google Benchmark run
//   kernelip_bench --callgrind-once N   one enumeration of N vNICs, with
//                                       callgrind collecting only around it:
//     valgrind --tool=callgrind --collect-atstart=no kernelip_bench --callgrind-once 16
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

constexpr const char* kClass = "Orvane_KernelIPProtocolEndpoint";

void pointAtTheBuild() {
    ::setenv("ORV_BUILD_DIR", ORV_BENCH_BUILD_DIR, 0);
    ::setenv("ORV_SOURCE_DIR", ORV_BENCH_SOURCE_DIR, 0);
}

// A simulated host with `vnics` virtual NICs and nothing else of interest.
void serveHost(const orv::providertest::SimHost& host, unsigned vnics) {
    orv::platform::simgen::HostShape shape;
    shape.nics = 0;
    shape.nicsWithoutPci = 0;
    shape.vnics = vnics;
    shape.ipv6PerVnic = 3;
    shape.ipv4 = true;
    host.write(orv::platform::simgen::generateHost(shape));
}

std::size_t enumerate(orv::providertest::ProviderCore& provider) {
    const orv::host::Reply reply = provider.enumerateInstances(kClass);
    return reply.instances().size();
}

void BM_EnumerateKernelEndpoints(benchmark::State& state) {
    orv::providertest::SimHost host;
    serveHost(host, static_cast<unsigned>(state.range(0)));
    orv::providertest::ProviderCore provider;
    const std::size_t expected = static_cast<std::size_t>(state.range(0)) * 4;
    if (enumerate(provider) != expected) {
        state.SkipWithError("unexpected instance count");
        return;
    }
    std::size_t instances = 0;
    for (auto _ : state) {
        instances += enumerate(provider);
    }
    state.SetItemsProcessed(static_cast<int64_t>(instances));
    state.counters["time_per_instance"] = benchmark::Counter(
        static_cast<double>(instances), benchmark::Counter::kIsRate | benchmark::Counter::kInvert);
}
BENCHMARK(BM_EnumerateKernelEndpoints)->Arg(1)->Arg(16)->Arg(256)->Unit(benchmark::kMicrosecond);

// One warmed-up enumeration under callgrind's collection; prints the count.
int callgrindOnce(unsigned vnics) {
    orv::providertest::SimHost host;
    serveHost(host, vnics);
    orv::providertest::ProviderCore provider;
    const std::size_t instances = orv::bench::collectSecondRun([&] { return enumerate(provider); });
    std::printf("instances %zu\n", instances);
    return instances == vnics * 4U ? 0 : 1;
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
