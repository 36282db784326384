// A broker core over the raw C test provider, and small helpers to read CMPI objects.
#pragma once

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <memory>
#include <sstream>
#include <string>
#include <vector>

#include "orv/host/broker_core.hpp"

namespace orv::host::test {

inline std::filesystem::path buildDir() { return std::getenv("ORV_BUILD_DIR"); }
inline std::filesystem::path sourceDir() { return std::getenv("ORV_SOURCE_DIR"); }

inline CoreConfig rawConfig() {
    CoreConfig config;
    config.providerDirs = {buildDir() / "no-such-dir", buildDir() / "lib"};
    config.registrationFiles = {sourceDir() / "tests/rawprovider/rawprovider.reg"};
    config.mofPaths = {sourceDir() / "tests/rawprovider/rawprovider.mof"};
    return config;
}

inline std::string text(const CMPIString* s) { return s != nullptr ? static_cast<const char*>(s->hdl) : "<null>"; }

inline std::string stringProperty(const CMPIInstance* inst, const char* name) {
    CMPIData d = inst->ft->getProperty(inst, name, nullptr);
    return d.type == CMPI_string ? text(d.value.string) : "<not a string>";
}

// The names of an instance's properties, in order.
inline std::vector<std::string> propertyNames(const CMPIInstance* inst) {
    std::vector<std::string> out;
    const CMPICount count = inst->ft->getPropertyCount(inst, nullptr);
    for (CMPICount i = 0; i < count; ++i) {
        CMPIString* name = nullptr;
        inst->ft->getPropertyAt(inst, i, &name, nullptr);
        out.push_back(text(name));
    }
    return out;
}

inline std::string className(const CMPIObjectPath* op) { return text(op->ft->getClassName(op, nullptr)); }

class CoreTest : public ::testing::Test {
protected:
    void SetUp() override {
        logPath_ = std::filesystem::temp_directory_path() /
                   ("rawprovider-" + std::to_string(::getpid()) + "-" +
                    ::testing::UnitTest::GetInstance()->current_test_info()->name() + ".log");
        std::filesystem::remove(logPath_);
        ::setenv("RAW_PROVIDER_LOG", logPath_.c_str(), 1);
        ::unsetenv("RAW_PROVIDER_CLEANUP_RC");
        core_ = std::make_unique<BrokerCore>(rawConfig());
        scope_ = std::make_unique<ObjectScope>();
    }

    void TearDown() override {
        scope_.reset();
        core_.reset();
        ::unsetenv("RAW_PROVIDER_LOG");
        std::filesystem::remove(logPath_);
    }

    const CMPIBroker* mb() const { return core_->broker(); }

    CMPIObjectPath* path(const char* cls, const char* name = nullptr, const char* ns = "root/cimv2") {
        CMPIObjectPath* op = mb()->eft->newObjectPath(mb(), ns, cls, nullptr);
        if (name != nullptr) {
            op->ft->addKey(op, "Name", reinterpret_cast<const CMPIValue*>(name), CMPI_chars);
        }
        return op;
    }

    static CallOptions as(const char* principal) {
        CallOptions opts;
        opts.principal = principal;
        return opts;
    }

    std::string providerLog() const {
        std::ifstream in(logPath_);
        std::stringstream all;
        all << in.rdbuf();
        return all.str();
    }

    std::filesystem::path logPath_;
    std::unique_ptr<BrokerCore> core_;
    std::unique_ptr<ObjectScope> scope_;
};

}  // namespace orv::host::test
