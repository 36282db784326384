// The provider side of an indication: deliverIndication through the broker core,
// matched against N enabled subscriptions (each filter "SELECT * FROM Raw_Indication
// WHERE Sequence >= 0", so every one matches) and handed to the sink.
//
//   deliver_bench    Google Benchmark, ns per deliverIndication call
//
// BM_DeliverNoMatch: N subscriptions whose WHERE clause is false (matching only).
// BM_DeliverEncoded: N matching subscriptions, the sink drops (matching + encoding).
// BM_DeliverListenerDown: N matching subscriptions whose destination refuses
//   connections, through the real export client (its queue overflows and drops).
#include <benchmark/benchmark.h>
#include <unistd.h>

#include <filesystem>
#include <string>

#include "orv/exporter/exporter.hpp"
#include "orv/host/broker_core.hpp"
#include "orv/indication/subscription_manager.hpp"

namespace {

namespace fs = std::filesystem;
using namespace orv;

host::CoreConfig benchConfig() {
    host::CoreConfig config;
    config.providerDirs = {ORV_BENCH_PROVIDER_DIR};
    config.registrationFiles = {std::string(ORV_BENCH_SOURCE_DIR) + "/tests/rawprovider/rawprovider.reg"};
    config.mofPaths = {std::string(ORV_BENCH_SOURCE_DIR) + "/tests/rawprovider/rawprovider.mof"};
    return config;
}

struct Setup {
    explicit Setup(int subscriptions, const char* where, bool realExporter)
        : dir(fs::temp_directory_path() / ("deliver-bench-" + std::to_string(::getpid()))), core(benchConfig()) {
        fs::remove_all(dir);
        indication::ManagerOptions options;
        options.stateDir = dir;
        indication::DeliverySink sink = [](const std::string&, const std::string&, std::string,
                                           const exporter::DeliveryPolicy&) {};
        if (realExporter) {
            exporter::ExporterConfig config;
            config.queueLimit = 1000;
            config.connectTimeout = std::chrono::milliseconds(100);
            sender = std::make_unique<exporter::Exporter>(config);
            sink = [this](const std::string& id, const std::string& url, std::string xml,
                          const exporter::DeliveryPolicy& policy) { sender->submit(id, url, std::move(xml), policy); };
        }
        manager = std::make_unique<indication::SubscriptionManager>(core, options, sink);
        for (int i = 0; i < subscriptions; ++i) {
            const std::string name = "s" + std::to_string(i);
            indication::FilterRecord f;
            f.name = name;
            f.query = std::string("SELECT * FROM Raw_Indication WHERE ") + where;
            manager->createFilter(f);
            indication::DestinationRecord d;
            d.name = name;
            d.destination = "http://127.0.0.1:9";  // discard port: nothing listens
            manager->createDestination(d);
            indication::SubscriptionRecord s;
            s.filterName = name;
            s.handlerName = name;
            manager->createSubscription(s);
        }
    }
    ~Setup() {
        if (sender) {
            sender->shutdown(std::chrono::milliseconds(0));
        }
        manager.reset();
        core.shutdown();
        fs::remove_all(dir);
    }

    fs::path dir;
    host::BrokerCore core;
    std::unique_ptr<exporter::Exporter> sender;
    std::unique_ptr<indication::SubscriptionManager> manager;
};

void deliverLoop(benchmark::State& state, const char* where, bool realExporter) {
    Setup setup(static_cast<int>(state.range(0)), where, realExporter);
    const CMPIBroker* mb = setup.core.broker();
    host::ObjectScope scope;
    CMPIObjectPath* op = mb->eft->newObjectPath(mb, "root/cimv2", "Raw_Indication", nullptr);
    CMPIInstance* ind = mb->eft->newInstance(mb, op, nullptr);
    ind->ft->setProperty(ind, "Message", reinterpret_cast<const CMPIValue*>("heartbeat from the benchmark"), CMPI_chars);
    CMPIUint32 sequence = 0;
    for (auto _ : state) {
        ind->ft->setProperty(ind, "Sequence", reinterpret_cast<const CMPIValue*>(&sequence), CMPI_uint32);
        ++sequence;
        CMPIStatus st = mb->bft->deliverIndication(mb, nullptr, "root/cimv2", ind);
        benchmark::DoNotOptimize(st);
    }
}

void BM_DeliverNoMatch(benchmark::State& state) { deliverLoop(state, "Sequence < 0", false); }
void BM_DeliverEncoded(benchmark::State& state) { deliverLoop(state, "Sequence >= 0", false); }
void BM_DeliverListenerDown(benchmark::State& state) { deliverLoop(state, "Sequence >= 0", true); }

BENCHMARK(BM_DeliverNoMatch)->Arg(1)->Arg(10);
BENCHMARK(BM_DeliverEncoded)->Arg(1)->Arg(10);
BENCHMARK(BM_DeliverListenerDown)->Arg(1)->Arg(10);

}  // namespace

BENCHMARK_MAIN();
