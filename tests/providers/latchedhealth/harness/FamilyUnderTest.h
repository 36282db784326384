// The latched health family's test build in a broker core, for tests and
// benchmarks: the project's registrations of the family pointed at the test
// build, the companion library (liborvhwhealth.so) for the twelve watched classes, and
// the test build's entry points (one pass or one IP check on a thread of the
// caller's, the passes completed, the monitor threads running).
#pragma once

#include <cmpift.h>

#include <filesystem>
#include <memory>

#include "orv/providertest/ProviderCore.h"

namespace latched {

inline constexpr const char* kUnderTestLocation = "latchedhealthundertest";

class FamilyUnderTest {
public:
    // Loads the test build from libraryDir when given (a folder holding a copy
    // of it), else from the build's library folder.
    explicit FamilyUnderTest(const std::filesystem::path& libraryDir = {});
    ~FamilyUnderTest();
    FamilyUnderTest(const FamilyUnderTest&) = delete;
    FamilyUnderTest& operator=(const FamilyUnderTest&) = delete;

    orv::providertest::ProviderCore& provider() { return *provider_; }

    // Loads the family (its first request starts the monitor threads); false
    // when the first request failed.
    bool load();
    // Waits up to 30 s for the monitor thread's first pass.
    bool waitForFirstPass();

    // On a thread of its own, with the lock held as the monitor threads hold
    // it, and a context of the broker (or `context`).
    void runPass(CMPIContext* context = nullptr);
    void runIpCheck(CMPIContext* context = nullptr);
    unsigned long long completedPasses();
    unsigned threadsRunning();

    // Drops the core: the providers' terminating cleanup runs.
    void stop() { provider_.reset(); }

private:
    void resolveHooks();

    std::filesystem::path libraryDir_;
    std::filesystem::path registrations_;
    std::unique_ptr<orv::providertest::ProviderCore> provider_;
    void (*runPass_)(const CMPIBroker*, const CMPIContext*) = nullptr;
    void (*runIpCheck_)(const CMPIBroker*, const CMPIContext*) = nullptr;
    unsigned long long (*completedPasses_)() = nullptr;
    unsigned (*threadsRunning_)() = nullptr;
};

}  // namespace latched
