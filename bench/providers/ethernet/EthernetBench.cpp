// Per-class enumeration with 1, 64 and 1024 simulated NICs, and getInstance of
// one port on the 1024-NIC host. Counters report the time per instance.
#include <benchmark/benchmark.h>

#include <cstdlib>
#include <map>
#include <memory>
#include <string>

#include "orv/platform/simgen/HostGenerator.h"
#include "orv/providertest/ProviderCore.h"
#include "orv/providertest/SimHost.h"

namespace {

const char* const kClasses[] = {
    "Orvane_EthernetPort", "Orvane_EPDriverSoftwareIdentity", "Orvane_EPFirmwareSoftwareIdentity",
    "Orvane_EPStatisticalInformation", "Orvane_EPCoalesceSettingData", "Orvane_EPPauseParamsSettingData",
    "Orvane_EPRingCurrentSettingData", "Orvane_EPRingPresetSettingData", "Orvane_EPDriverElementSoftwareIdentity",
    "Orvane_EPFirmwareElementSoftwareIdentity", "Orvane_EPStatistics", "Orvane_EPCoalesceElementSettingData",
    "Orvane_EPPauseParamsElementSettingData", "Orvane_EPRingCurrentElementSettingData",
    "Orvane_EPRingPresetElementSettingData"};

// One simulated host and broker core for the whole run; the fixture is
// rewritten when the NIC count changes.
struct Bench {
    Bench() {
        setenv("ORV_SOURCE_DIR", ORV_ETHERNET_SOURCE_DIR, 0);
        setenv("ORV_BUILD_DIR", ORV_ETHERNET_BUILD_DIR, 0);
    }
    void useNics(unsigned nics) {
        if (nics == current) return;
        orv::platform::simgen::HostShape shape;
        shape.nics = nics;
        host.write(orv::platform::simgen::generateHost(shape));
        current = nics;
        if (!provider) provider = std::make_unique<orv::providertest::ProviderCore>();
    }
    orv::providertest::SimHost host;
    std::unique_ptr<orv::providertest::ProviderCore> provider;
    unsigned current = 0;
};

Bench& bench() {
    static Bench instance;
    return instance;
}

void BM_Enumerate(benchmark::State& state) {
    const char* cls = kClasses[state.range(0)];
    const auto nics = static_cast<unsigned>(state.range(1));
    bench().useNics(nics);
    state.SetLabel(cls);
    for (auto _ : state) {
        orv::host::Reply reply = bench().provider->enumerateInstances(cls);
        if (reply.rc() != CMPI_RC_OK || reply.items().size() != nics) {
            state.SkipWithError("unexpected reply");
            break;
        }
    }
    state.counters["per_instance"] =
        benchmark::Counter(static_cast<double>(state.iterations()) * nics,
                           benchmark::Counter::kIsRate | benchmark::Counter::kInvert);
}

void BM_GetOnePort(benchmark::State& state) {
    bench().useNics(static_cast<unsigned>(state.range(0)));
    for (auto _ : state) {
        orv::host::Reply reply = bench().provider->getInstance("Orvane_EthernetPort", {{"DeviceID", "vmnic0"}});
        if (reply.rc() != CMPI_RC_OK || reply.instances().size() != 1) {
            state.SkipWithError("unexpected reply");
            break;
        }
    }
}

void classesByNics(benchmark::internal::Benchmark* b) {
    for (long nics : {1, 64, 1024}) {
        for (long cls = 0; cls < 15; ++cls) b->Args({cls, nics});
    }
}

BENCHMARK(BM_Enumerate)->Apply(classesByNics)->Unit(benchmark::kMicrosecond);
BENCHMARK(BM_GetOnePort)->Arg(1)->Arg(64)->Arg(1024)->Unit(benchmark::kMicrosecond);

}  // namespace

BENCHMARK_MAIN();
