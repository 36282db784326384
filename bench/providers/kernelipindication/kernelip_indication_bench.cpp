// Time of one testAndSend of the IP change detector through the broker core,
// on simulated hosts of 1, 100 and 1,000 interfaces, each with one IPv4 and
// one IPv6 address:
//   BM_TestAndSendUnchanged      nothing changed (the usual 30-second check):
//                                two reads of the interface list and the comparison
//   BM_TestAndSendAllReplaced    both addresses of every interface replaced: also
//                                two indications per interface built and delivered
// The simulated host's fixture is read again outside the timed part, so the
// figures are the detector's, the list the platform builds, and the broker's.
//
//   kernelip_indication_bench --benchmark_filter=TestAndSend
#include <benchmark/benchmark.h>

#include <cmpi/CmpiBaseMI.h>
#include <orv/platform/InterfaceAddresses.h>
#include <orv/platform/backend/Selector.h>

#include <cstdlib>
#include <string>

#include "KernelIpIndication.h"
#include "orv/providertest/ProviderCore.h"
#include "orv/providertest/SimHost.h"

namespace {

using Json = nlohmann::ordered_json;

// A host of `interfaces` vNICs; `variant` picks the last part of every address.
Json hostOf(unsigned interfaces, unsigned variant) {
    Json vnics = Json::array();
    for (unsigned i = 0; i < interfaces; ++i) {
        const std::string tail = std::to_string(5 + variant);
        vnics.push_back({{"name", "vif" + std::to_string(i)},
                         {"ipv4",
                          {{"address", "10." + std::to_string(i / 256) + "." + std::to_string(i % 256) + "." + tail},
                           {"netmask", "255.255.255.0"}}},
                         {"ipv6", Json::array({{{"address", "fd00::" + std::to_string(i) + ":" + tail},
                                                {"prefixLength", 64}}})}});
    }
    return orv::providertest::SimHost::withHost({{"tcpipStacks", {{"defaultTcpipStack", {{"vnics", vnics}}}}}});
}

// Rewrites the host and has the platform read it now, outside the timing.
void serve(const orv::providertest::SimHost& host, const Json& fixture) {
    host.write(fixture);
    ifaddrs* list = nullptr;
    if (OrvHost_GetIfAddrs(&list) == 0) {
        OrvHost_FreeIfAddrs(list);
    }
}

// The broker core, the binding's broker and a switched-on detector.
struct Bench {
    Bench() : holder(CmpiBroker(provider.broker()), CmpiContext(nullptr)), broker(provider.broker()), context(nullptr) {
        orv::platform::reselectBackend();
        holder.setProviderBase(nullptr);
        delivered = provider.core().addIndicationSubscriber([this](std::string_view, const CMPIInstance*) { ++count; });
    }
    ~Bench() { provider.core().removeIndicationSubscriber(delivered); }

    orv::providertest::ProviderCore provider;
    CmpiBaseMI holder;
    CmpiBroker broker;
    CmpiContext context;
    ORV::KernelIpIndication detector;
    std::uint64_t delivered = 0;
    std::uint64_t count = 0;
};

void BM_TestAndSendUnchanged(benchmark::State& state) {
    const unsigned interfaces = static_cast<unsigned>(state.range(0));
    orv::providertest::SimHost host;
    serve(host, hostOf(interfaces, 0));
    Bench bench;
    bench.detector.enableIndication();
    for (auto _ : state) {
        orv::host::ObjectScope scope;
        bench.detector.testAndSend(bench.context, &bench.broker);
    }
    if (bench.count != 0) {
        state.SkipWithError("an unchanged host gave indications");
    }
    state.counters["interfaces"] = interfaces;
}
BENCHMARK(BM_TestAndSendUnchanged)->Arg(1)->Arg(100)->Arg(1000)->Unit(benchmark::kMicrosecond);

void BM_TestAndSendAllReplaced(benchmark::State& state) {
    const unsigned interfaces = static_cast<unsigned>(state.range(0));
    const Json hosts[2] = {hostOf(interfaces, 0), hostOf(interfaces, 1)};
    orv::providertest::SimHost host;
    serve(host, hosts[0]);
    Bench bench;
    bench.detector.enableIndication();
    unsigned next = 1;
    for (auto _ : state) {
        state.PauseTiming();
        serve(host, hosts[next]);
        next ^= 1;
        state.ResumeTiming();
        orv::host::ObjectScope scope;
        bench.detector.testAndSend(bench.context, &bench.broker);
    }
    if (bench.count != static_cast<std::uint64_t>(state.iterations()) * interfaces * 2) {
        state.SkipWithError("not every replacement was delivered");
    }
    state.counters["interfaces"] = interfaces;
    state.counters["indications_per_call"] = interfaces * 2;
}
BENCHMARK(BM_TestAndSendAllReplaced)->Arg(1)->Arg(100)->Arg(1000)->Unit(benchmark::kMicrosecond);

}  // namespace

int main(int argc, char** argv) {
    ::setenv("ORV_BUILD_DIR", ORV_BENCH_BUILD_DIR, 0);
    ::setenv("ORV_SOURCE_DIR", ORV_BENCH_SOURCE_DIR, 0);
    benchmark::Initialize(&argc, argv);
    benchmark::RunSpecifiedBenchmarks();
    benchmark::Shutdown();
    return 0;
}
