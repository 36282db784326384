#include "LatchedHealthFixture.h"

#include <time.h>

#include <atomic>
#include <chrono>
#include <condition_variable>
#include <mutex>
#include <thread>

#include "context.hpp"

namespace {

std::atomic<long> g_fixedTime{-1};

std::mutex g_gateMutex;
std::condition_variable g_gateChanged;
bool g_gateClosed = false;
bool g_gateEntered = false;

}  // namespace

// The providers' time(): the fixed time while a FixedTime lives.
extern "C" __attribute__((visibility("default"))) time_t time(time_t* out) {
    long seconds = g_fixedTime.load();
    if (seconds < 0) {
        timespec now{};
        clock_gettime(CLOCK_REALTIME, &now);
        seconds = now.tv_sec;
    }
    if (out != nullptr) {
        *out = seconds;
    }
    return seconds;
}

// Called by the companion library's hardware health provider at the start of every request.
extern "C" __attribute__((visibility("default"))) void HealthElementsTest_Gate() {
    std::unique_lock lock(g_gateMutex);
    g_gateEntered = true;
    g_gateChanged.notify_all();
    g_gateChanged.wait(lock, [] { return !g_gateClosed; });
}

namespace latched {
namespace {

// The failing context is a view of a context of the broker: every entry call
// goes to the broker's context, the release of thread memory fails.
const CMPIContext* viewed(const CMPIContext* view) { return static_cast<const CMPIContext*>(view->hdl); }

CMPIStatus failingRelease(const CMPIContext*) { return CMPIStatus{CMPI_RC_ERR_FAILED, nullptr}; }
CMPIStatus keepView(CMPIContext*) { return CMPIStatus{CMPI_RC_OK, nullptr}; }
CMPIContext* cloneViewed(const CMPIContext* view, CMPIStatus* rc) {
    return viewed(view)->ft->clone(viewed(view), rc);
}
CMPIData viewedEntry(const CMPIContext* view, const char* name, CMPIStatus* rc) {
    return viewed(view)->ft->getEntry(viewed(view), name, rc);
}
CMPIData viewedEntryAt(const CMPIContext* view, CMPICount index, CMPIString** name, CMPIStatus* rc) {
    return viewed(view)->ft->getEntryAt(viewed(view), index, name, rc);
}
CMPICount viewedEntryCount(const CMPIContext* view, CMPIStatus* rc) {
    return viewed(view)->ft->getEntryCount(viewed(view), rc);
}
CMPIStatus addViewedEntry(const CMPIContext* view, const char* name, const CMPIValue* value, CMPIType type) {
    return viewed(view)->ft->addEntry(viewed(view), name, value, type);
}

const CMPIContextFTExt kFailingReleaseTable = {
    {1, keepView, cloneViewed, viewedEntry, viewedEntryAt, viewedEntryCount, addViewedEntry},
    failingRelease,
};

}  // namespace

Json element(const std::string& watchedClass, const Json& keys, std::optional<int> healthState) {
    Json out = {{"watchedClass", watchedClass}, {"keys", keys}};
    if (healthState) {
        out["healthState"] = *healthState;
    }
    return out;
}

Json nullState(Json element) {
    element["healthState"] = nullptr;
    return element;
}

Json device(const std::string& watchedClass, const std::string& deviceId, std::optional<int> healthState) {
    if (watchedClass == "Orvane_StoragePool") {
        return element(watchedClass, {{"InstanceID", deviceId}}, healthState);
    }
    if (watchedClass == "CIM_PhysicalMemory") {
        return element(watchedClass, {{"CreationClassName", watchedClass}, {"Tag", deviceId}}, healthState);
    }
    return element(watchedClass,
                   {{"CreationClassName", watchedClass},
                    {"DeviceID", deviceId},
                    {"SystemCreationClassName", "OMC_UnitaryComputerSystem"},
                    {"SystemName", orv::providertest::SimHost::kFqdn}},
                   healthState);
}

std::ostream& operator<<(std::ostream& os, const Latched& latched) {
    return os << "{" << latched.eventId << ", " << latched.className << ", " << latched.healthState << "}";
}

FixedTime::FixedTime(long seconds) { g_fixedTime = seconds; }
FixedTime::~FixedTime() { g_fixedTime = -1; }

// A folder of the test's own holding a fresh copy of the family's test build:
// a library loaded from a new file starts with fresh process-wide state, as
// each broker process does, even where an earlier copy stays mapped.
std::filesystem::path LatchedHealthTest::freshLibraryDir() {
    static int copies = 0;
    const std::filesystem::path dir = std::filesystem::temp_directory_path() /
                                      ("orv-latched-" + std::to_string(::getpid()) + "-" + std::to_string(++copies));
    std::filesystem::create_directories(dir);
    const std::string file = std::string("lib") + kUnderTestLocation + ".so";
    std::filesystem::copy_file(orv::providertest::ProviderCore::providerDir() / file, dir / file,
                               std::filesystem::copy_options::overwrite_existing);
    return dir;
}

LatchedHealthTest::LatchedHealthTest() { serve({}); }

std::filesystem::path LatchedHealthTest::libraryFile() const {
    return libraryDir_ / (std::string("lib") + kUnderTestLocation + ".so");
}

LatchedHealthTest::~LatchedHealthTest() {
    stop();
    if (!libraryDir_.empty()) {
        std::error_code ignored;
        std::filesystem::remove_all(libraryDir_, ignored);
    }
}

void LatchedHealthTest::serve(const std::vector<Json>& elements, const Json& faults) {
    Json health = Json::array();
    for (const Json& item : elements) {
        health.push_back(item);
    }
    host_.write(orv::providertest::SimHost::withHost({{"health", health}, {"faults", faults}}));
}

void LatchedHealthTest::start(bool waitForFirstPass) {
    libraryDir_ = freshLibraryDir();
    family_ = std::make_unique<FamilyUnderTest>(libraryDir_);
    ASSERT_TRUE(family_->load()) << "the first request to the family failed";
    if (waitForFirstPass) {
        ASSERT_TRUE(family_->waitForFirstPass()) << "the monitor thread's first pass did not end";
    }
}

orv::host::Reply LatchedHealthTest::enableIpIndications() {
    return provider().core().enableIndications(orv::providertest::kNamespace, "Orvane_KernelIPChangedIndication");
}

void LatchedHealthTest::runPass() { family_->runPass(); }
void LatchedHealthTest::runPassWith(CMPIContext* context) { family_->runPass(context); }
void LatchedHealthTest::runIpCheck(CMPIContext* context) { family_->runIpCheck(context); }
unsigned long long LatchedHealthTest::completedPasses() { return family_->completedPasses(); }
unsigned LatchedHealthTest::threadsRunning() { return family_->threadsRunning(); }

std::vector<Latched> LatchedHealthTest::latched() {
    const orv::host::Reply reply = provider().enumerateInstances(kLatchedClass);
    EXPECT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    std::vector<Latched> out;
    for (const CMPIInstance* instance : reply.instances()) {
        out.push_back({orv::providertest::propertyOf(instance, "EventId").value_or(NamedValue{}).text,
                       orv::providertest::propertyOf(instance, "LatchedClassName").value_or(NamedValue{}).text,
                       orv::providertest::propertyOf(instance, "HealthState").value_or(NamedValue{}).text});
    }
    return out;
}

std::string LatchedHealthTest::rollup() {
    const orv::host::Reply reply = provider().enumerateInstances(kRollupClass);
    EXPECT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    if (reply.instances().size() != 1) {
        return "<" + std::to_string(reply.instances().size()) + " instances>";
    }
    return orv::providertest::propertyOf(reply.instances()[0], "HealthState").value_or(NamedValue{}).text;
}

CMPIObjectPath* LatchedHealthTest::latchedPath(const std::string& eventId) {
    return provider().path(kLatchedClass, {{"EventId", eventId}});
}

orv::host::Reply LatchedHealthTest::references(const CMPIObjectPath* path) {
    return provider().core().references(path, nullptr, nullptr);
}

void LatchedHealthTest::stop() { family_.reset(); }

FailingReleaseContext::FailingReleaseContext()
    : original_(orv::host::detail::newContext(orv::host::detail::Owner::Caller)),
      view_{original_, const_cast<CMPIContextFT*>(&kFailingReleaseTable.std)} {}

FailingReleaseContext::~FailingReleaseContext() { original_->ft->release(original_); }

EnumerationGate::EnumerationGate() {
    std::lock_guard lock(g_gateMutex);
    g_gateClosed = true;
    g_gateEntered = false;
}

EnumerationGate::~EnumerationGate() { open(); }

void EnumerationGate::waitUntilEntered() {
    std::unique_lock lock(g_gateMutex);
    g_gateChanged.wait(lock, [] { return g_gateEntered; });
}

void EnumerationGate::open() {
    std::lock_guard lock(g_gateMutex);
    g_gateClosed = false;
    g_gateChanged.notify_all();
}

}  // namespace latched
