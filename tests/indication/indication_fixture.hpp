// A broker core over the raw C test provider (and the interop classes), a state
// folder of the test's own, and a sink that records what would be exported.
#pragma once

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <memory>
#include <mutex>
#include <sstream>
#include <string>
#include <vector>

#include "orv/host/broker_core.hpp"
#include "orv/indication/subscription_manager.hpp"

namespace orv::indication::test {

namespace fs = std::filesystem;

struct Exported {
    std::string subscriptionId;
    std::string url;
    std::string xml;
    exporter::DeliveryPolicy policy;
};

class RecordingSink {
public:
    DeliverySink sink() {
        return [this](const std::string& id, const std::string& url, std::string xml,
                      const exporter::DeliveryPolicy& policy) {
            std::lock_guard lock(mutex_);
            items_.push_back(Exported{id, url, std::move(xml), policy});
        };
    }
    std::vector<Exported> items() const {
        std::lock_guard lock(mutex_);
        return items_;
    }

private:
    mutable std::mutex mutex_;
    std::vector<Exported> items_;
};

class IndicationTest : public ::testing::Test {
protected:
    void SetUp() override {
        const std::string name = ::testing::UnitTest::GetInstance()->current_test_info()->name();
        const fs::path base = fs::temp_directory_path() / ("i13a-indication-" + std::to_string(::getpid()) + "-" + name);
        fs::remove_all(base);
        stateDir_ = base / "state";
        logPath_ = base.string() + ".log";
        fs::remove(logPath_);
        ::setenv("RAW_PROVIDER_LOG", logPath_.c_str(), 1);
        startCore();
        scope_ = std::make_unique<host::ObjectScope>();
    }

    void TearDown() override {
        scope_.reset();
        manager_.reset();
        core_.reset();
        ::unsetenv("RAW_PROVIDER_LOG");
        fs::remove_all(stateDir_.parent_path());
        fs::remove(logPath_);
    }

    void startCore() {
        const fs::path build = std::getenv("ORV_BUILD_DIR");
        const fs::path source = std::getenv("ORV_SOURCE_DIR");
        host::CoreConfig config;
        config.providerDirs = {build / "lib"};
        config.registrationFiles = {source / "tests/rawprovider/rawprovider.reg"};
        config.mofPaths = {source / "tests/rawprovider/rawprovider.mof", source / "cim/mof/interop/interop.mof"};
        core_ = std::make_unique<host::BrokerCore>(config);
    }

    SubscriptionManager& startManager() {
        ManagerOptions options;
        options.stateDir = stateDir_;
        options.systemName = "testhost";
        options.log = [this](Severity, std::string_view line) {
            std::lock_guard lock(logMutex_);
            logLines_.emplace_back(line);
        };
        manager_ = std::make_unique<SubscriptionManager>(*core_, options, sink_.sink());
        return *manager_;
    }

    // Ends the manager and the core as a host stop would, and starts both again.
    void restart() {
        scope_.reset();
        manager_.reset();
        core_.reset();
        startCore();
        scope_ = std::make_unique<host::ObjectScope>();
    }

    static FilterRecord filter(const std::string& name, const std::string& query) {
        FilterRecord f;
        f.name = name;
        f.query = query;
        return f;
    }
    static DestinationRecord destination(const std::string& name, const std::string& url = "http://127.0.0.1:5990") {
        DestinationRecord d;
        d.name = name;
        d.destination = url;
        return d;
    }
    static SubscriptionRecord subscription(const std::string& filterName, const std::string& handlerName) {
        SubscriptionRecord s;
        s.filterName = filterName;
        s.handlerName = handlerName;
        return s;
    }

    // Delivers an indication as a provider would.
    CMPIStatus raise(const char* className, CMPIUint32 sequence, const char* message = "m",
                     const char* ns = "root/cimv2") {
        const CMPIBroker* mb = core_->broker();
        CMPIObjectPath* op = mb->eft->newObjectPath(mb, ns, className, nullptr);
        CMPIInstance* ind = mb->eft->newInstance(mb, op, nullptr);
        ind->ft->setProperty(ind, "Message", reinterpret_cast<const CMPIValue*>(message), CMPI_chars);
        ind->ft->setProperty(ind, "Sequence", reinterpret_cast<const CMPIValue*>(&sequence), CMPI_uint32);
        return mb->bft->deliverIndication(mb, nullptr, ns, ind);
    }

    // The raw provider's indication calls since the last look.
    std::vector<std::string> providerCalls() {
        std::ifstream in(logPath_);
        std::vector<std::string> lines;
        std::string line;
        std::size_t index = 0;
        while (std::getline(in, line)) {
            if (index++ >= seen_ && (line.find("Filter") != std::string::npos ||
                                     line.find("Indications") != std::string::npos)) {
                lines.push_back(line);
            }
        }
        seen_ = index;
        return lines;
    }

    std::vector<std::string> logLines() {
        std::lock_guard lock(logMutex_);
        return logLines_;
    }

    fs::path stateDir_;
    std::string logPath_;
    std::size_t seen_ = 0;
    RecordingSink sink_;
    std::mutex logMutex_;
    std::vector<std::string> logLines_;
    std::unique_ptr<host::BrokerCore> core_;
    std::unique_ptr<SubscriptionManager> manager_;
    std::unique_ptr<host::ObjectScope> scope_;
};

}  // namespace orv::indication::test
