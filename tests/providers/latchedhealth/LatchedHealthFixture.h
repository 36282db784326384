// The latched health family on a simulated host: the family's own test build
// (liblatchedhealthundertest.so, routed by the project's registrations of its
// classes) and the companion library (liborvhwhealth.so) serving the twelve watched
// classes from the fixture's "health" section.
//
// Starting the providers runs the monitor thread's first pass; later passes
// and IP checks are run on a thread of the test (runPass, runIpCheck) with the
// lock held as the monitor threads hold it. The periods stay 120 and 30 s, so
// the monitor threads wait out the test after their first round.
#pragma once

#include <gtest/gtest.h>

#include <cmpift.h>

#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "orv/providertest/ProviderCore.h"
#include "orv/providertest/ReturnedValues.h"
#include "orv/providertest/SimHost.h"
#include "harness/FamilyUnderTest.h"

namespace latched {

using Json = nlohmann::ordered_json;
using orv::providertest::NamedValue;

inline constexpr const char* kLatchedClass = "Orvane_LatchedHealthState";
inline constexpr const char* kRollupClass = "Orvane_RollupHealthState";
inline constexpr const char* kAssociationClass = "Orvane_LatchedHealthAssociation";

// One element of the "health" section: reported under watchedClass with the
// keys given, in order; healthState absent when nullopt (use nullState() for a
// null value).
Json element(const std::string& watchedClass, const Json& keys, std::optional<int> healthState);
Json nullState(Json element);
// An element of a watched class with the keys its class declares (the
// CIM_LogicalDevice keys, or those of a storage pool or a memory chip).
Json device(const std::string& watchedClass, const std::string& deviceId, std::optional<int> healthState);

// What a latched record shows through the provider.
struct Latched {
    std::string eventId;
    std::string className;
    std::string healthState;
    bool operator==(const Latched&) const = default;
};
std::ostream& operator<<(std::ostream& os, const Latched& latched);

// Replaces time() for the providers while alive: they read `seconds`.
class FixedTime {
public:
    explicit FixedTime(long seconds);
    ~FixedTime();
};

class LatchedHealthTest : public ::testing::Test {
protected:
    LatchedHealthTest();
    ~LatchedHealthTest() override;

    // Writes a host with these elements (and fault rules).
    void serve(const std::vector<Json>& elements, const Json& faults = Json::array());
    // Builds the broker core, loads the providers and waits for the monitor
    // thread's first pass.
    void start(bool waitForFirstPass = true);
    // enableIndications for the IP-changed indication (loads its provider).
    orv::host::Reply enableIpIndications();
    // One more health pass / IP check on a thread of the test, with a context
    // of the broker (or with `context` when given).
    void runPass();
    void runIpCheck(CMPIContext* context = nullptr);
    void runPassWith(CMPIContext* context);

    // Passes completed since the family's library was loaded; monitor threads running.
    unsigned long long completedPasses();
    unsigned threadsRunning();

public:
    unsigned threadsRunningNow() { return threadsRunning(); }

protected:

    orv::providertest::ProviderCore& provider() { return family_->provider(); }
    const CMPIBroker* broker() { return provider().broker(); }

    // The latched records in list order, from an enumeration of the latched class.
    std::vector<Latched> latched();
    // HealthState of the roll-up instance, as text.
    std::string rollup();
    CMPIObjectPath* latchedPath(const std::string& eventId);
    orv::host::Reply references(const CMPIObjectPath* path);

    // The copy of the family's test build that start() loaded.
    std::filesystem::path libraryFile() const;

    // Stops the core (terminating cleanup of the providers) and drops it.
    void stop();

    // A new folder holding a fresh copy of the family's test build.
    static std::filesystem::path freshLibraryDir();

private:

    orv::providertest::SimHost host_;  // before the core: it selects the platform
    std::filesystem::path libraryDir_;
    std::unique_ptr<FamilyUnderTest> family_;
};

// A context of the broker whose thread-memory release (the entry after
// addEntry) fails with CMPI_RC_ERR_FAILED.
class FailingReleaseContext {
public:
    FailingReleaseContext();
    ~FailingReleaseContext();
    FailingReleaseContext(const FailingReleaseContext&) = delete;
    FailingReleaseContext& operator=(const FailingReleaseContext&) = delete;
    CMPIContext* get() { return &view_; }

private:
    CMPIContext* original_;
    CMPIContext view_;
};

// The companion library's hardware enumerations wait at this gate while it is closed.
class EnumerationGate {
public:
    EnumerationGate();  // closed
    ~EnumerationGate(); // opens
    void waitUntilEntered();
    void open();
};

}  // namespace latched
