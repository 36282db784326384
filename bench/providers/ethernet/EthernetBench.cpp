// Cost of the Ethernet port provider through the broker core on simulated
// hosts of 1, 64 and 1024 NICs: enumeration of each of its fifteen classes,
// getInstance of one port (the first and the last NIC), and, for comparison,
// the NIC library's own GetPnicByName of the same NIC.
//
//   ethernet_provider_bench                    Google Benchmark runs; the
//                                              per_instance counter is the
//                                              time per delivered item
//   ethernet_provider_bench --callgrind WHAT NICS ITERATIONS
//                                              ITERATIONS warmed-up requests
//                                              on a host of NICS NICs, with
//                                              callgrind collecting only
//                                              around them. WHAT is a class
//                                              name (enumeration), get:NAME
//                                              (getInstance of port NAME) or
//                                              byname:NAME (GetPnicByName).
//     valgrind --tool=callgrind --collect-atstart=no
//         ethernet_provider_bench --callgrind Orvane_EthernetPort 64 10
#include <benchmark/benchmark.h>
#include <valgrind/callgrind.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <memory>
#include <string>

#include <tmkctl/network/NetworkInfoImpl.h>

#include "orv/platform/backend/Selector.h"

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
constexpr long kClassCount = sizeof kClasses / sizeof kClasses[0];

void pointAtTheBuild() {
    setenv("ORV_SOURCE_DIR", ORV_ETHERNET_SOURCE_DIR, 0);
    setenv("ORV_BUILD_DIR", ORV_ETHERNET_BUILD_DIR, 0);
}

// The platform library linked into this program picked its substitute when
// the program started, before the SimHost pointed it at the fixture; it is
// asked to pick again so that GetPnicByName below sees the simulated host.
void serveHost(const orv::providertest::SimHost& host, unsigned nics) {
    orv::platform::simgen::HostShape shape;
    shape.nics = nics;
    host.write(orv::platform::simgen::generateHost(shape));
    static const bool reselected = (orv::platform::reselectBackend(), true);
    (void)reselected;
}

std::string nicName(unsigned index) { return "vmnic" + std::to_string(index); }

// Items delivered by a successful request; a failed one is reported with its
// status and counted as none.
std::size_t itemsOf(const orv::host::Reply& reply, const std::string& what) {
    if (reply.rc() != CMPI_RC_OK) {
        std::fprintf(stderr, "%s: status %d \"%s\" after %zu items\n", what.c_str(), static_cast<int>(reply.rc()),
                     reply.message().c_str(), reply.items().size());
        return 0;
    }
    return reply.items().size();
}

std::size_t enumerate(orv::providertest::ProviderCore& provider, const char* cls) {
    return itemsOf(provider.enumerateInstances(cls), cls);
}

std::size_t getPort(orv::providertest::ProviderCore& provider, const std::string& name) {
    return itemsOf(provider.getInstance("Orvane_EthernetPort", {{"DeviceID", name}}), "getInstance " + name);
}

// The NIC library's lookup alone, as the provider makes it: one
// NetworkInfoImpl per request, the NIC deleted afterwards.
std::size_t pnicByName(const std::string& name) {
    TmkCtl::Network::NetworkInfoImpl network;
    const std::unique_ptr<NodeMgr::Network::Pnic> pnic(network.GetPnicByName(name));
    return pnic ? 1 : 0;
}

// One simulated host and broker core for the whole run; the fixture is
// rewritten when the NIC count changes.
struct Bench {
    void useNics(unsigned nics) {
        if (nics == current) {
            return;
        }
        serveHost(host, nics);
        current = nics;
        if (!provider) {
            provider = std::make_unique<orv::providertest::ProviderCore>();
        }
        // Both platform copies (the provider library's and this program's)
        // read the new fixture now, not inside the first timed request.
        getPort(*provider, nicName(0));
        pnicByName(nicName(0));
    }
    orv::providertest::SimHost host;
    std::unique_ptr<orv::providertest::ProviderCore> provider;
    unsigned current = 0;
};

Bench& bench() {
    static Bench instance;
    return instance;
}

void perItem(benchmark::State& state, double items) {
    state.counters["per_instance"] =
        benchmark::Counter(static_cast<double>(state.iterations()) * items,
                           benchmark::Counter::kIsRate | benchmark::Counter::kInvert);
}

void BM_Enumerate(benchmark::State& state) {
    const char* cls = kClasses[state.range(0)];
    const auto nics = static_cast<unsigned>(state.range(1));
    bench().useNics(nics);
    state.SetLabel(cls);
    for (auto _ : state) {
        if (enumerate(*bench().provider, cls) != nics) {
            state.SkipWithError("the reply is not OK with one item per NIC");
            break;
        }
    }
    perItem(state, nics);
}

// range(1): 0 for the first NIC, 1 for the last (the one a linear lookup
// reaches last).
std::string lookedUpNic(const benchmark::State& state) {
    return nicName(state.range(1) == 0 ? 0 : static_cast<unsigned>(state.range(0)) - 1);
}

void BM_GetOnePort(benchmark::State& state) {
    bench().useNics(static_cast<unsigned>(state.range(0)));
    const std::string name = lookedUpNic(state);
    state.SetLabel(name);
    for (auto _ : state) {
        if (getPort(*bench().provider, name) != 1) {
            state.SkipWithError("the reply is not OK with one instance");
            break;
        }
    }
}

void BM_GetPnicByName(benchmark::State& state) {
    bench().useNics(static_cast<unsigned>(state.range(0)));
    const std::string name = lookedUpNic(state);
    state.SetLabel(name);
    for (auto _ : state) {
        if (pnicByName(name) != 1) {
            state.SkipWithError("no such NIC");
            break;
        }
    }
}

void classesByNics(benchmark::internal::Benchmark* b) {
    for (long nics : {1, 64, 1024}) {
        for (long cls = 0; cls < kClassCount; ++cls) {
            b->Args({cls, nics});
        }
    }
}

void nicsByPosition(benchmark::internal::Benchmark* b) {
    for (long nics : {1, 64, 1024}) {
        for (long last : {0, 1}) {
            b->Args({nics, last});
        }
    }
}

BENCHMARK(BM_Enumerate)->Apply(classesByNics)->Unit(benchmark::kMicrosecond);
BENCHMARK(BM_GetOnePort)->Apply(nicsByPosition)->Unit(benchmark::kMicrosecond);
BENCHMARK(BM_GetPnicByName)->Apply(nicsByPosition)->Unit(benchmark::kMicrosecond);

// One request of the kind WHAT names; the items it delivered.
std::size_t request(orv::providertest::ProviderCore& provider, const std::string& what) {
    if (what.rfind("get:", 0) == 0) {
        return getPort(provider, what.substr(4));
    }
    if (what.rfind("byname:", 0) == 0) {
        return pnicByName(what.substr(7));
    }
    return enumerate(provider, what.c_str());
}

// Warmed-up requests under callgrind's collection; prints the items of one.
int callgrindRuns(const std::string& what, unsigned nics, unsigned iterations) {
    orv::providertest::SimHost host;
    serveHost(host, nics);
    orv::providertest::ProviderCore provider;
    const std::size_t items = request(provider, what);
    CALLGRIND_ZERO_STATS;
    CALLGRIND_TOGGLE_COLLECT;
    for (unsigned i = 0; i < iterations; ++i) {
        request(provider, what);
    }
    CALLGRIND_TOGGLE_COLLECT;
    std::printf("%s nics %u iterations %u items %zu\n", what.c_str(), nics, iterations, items);
    return items == 0 ? 1 : 0;
}

}  // namespace

int main(int argc, char** argv) {
    pointAtTheBuild();
    if (argc == 5 && std::strcmp(argv[1], "--callgrind") == 0) {
        return callgrindRuns(argv[2], static_cast<unsigned>(std::strtoul(argv[3], nullptr, 10)),
                             static_cast<unsigned>(std::strtoul(argv[4], nullptr, 10)));
    }
    benchmark::Initialize(&argc, argv);
    benchmark::RunSpecifiedBenchmarks();
    benchmark::Shutdown();
    return 0;
}
