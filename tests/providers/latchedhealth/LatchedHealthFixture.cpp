#include "LatchedHealthFixture.h"

#include <dlfcn.h>
#include <time.h>

#include <atomic>
#include <chrono>
#include <condition_variable>
#include <fstream>
#include <mutex>
#include <regex>
#include <sstream>
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

// Called by the health elements test provider at the start of every request.
extern "C" __attribute__((visibility("default"))) void HealthElementsTest_Gate() {
    std::unique_lock lock(g_gateMutex);
    g_gateEntered = true;
    g_gateChanged.notify_all();
    g_gateChanged.wait(lock, [] { return !g_gateClosed; });
}

namespace latched {
namespace {

constexpr const char* kUnderTestLocation = "latchedhealthundertest";
constexpr const char* kLatchedClasses[] = {kLatchedClass, kRollupClass, kAssociationClass,
                                           "Orvane_KernelIPChangedIndication"};

std::filesystem::path testDir() { return ORV_LATCHED_TEST_DIR; }

// The project's registration blocks of the family, pointed at the test build.
std::string familyRegistrations() {
    std::ifstream in(orv::providertest::ProviderCore::registrationFile());
    std::stringstream text;
    text << in.rdbuf();
    std::string out;
    for (const char* className : kLatchedClasses) {
        const std::string header = std::string("[") + className + "]";
        const std::size_t begin = text.str().find(header);
        if (begin == std::string::npos) {
            throw std::runtime_error(std::string("no registration of ") + className);
        }
        const std::size_t end = text.str().find("\n\n", begin);
        out += text.str().substr(begin, end == std::string::npos ? std::string::npos : end - begin) + "\n\n";
    }
    return std::regex_replace(out, std::regex("location: orvprovider"), std::string("location: ") + kUnderTestLocation);
}

template <class Function>
Function hook(void* library, const char* name) {
    void* symbol = dlsym(library, name);
    if (symbol == nullptr) {
        throw std::runtime_error(std::string("test build lacks ") + name);
    }
    return reinterpret_cast<Function>(symbol);
}

void onOwnThread(const std::function<void()>& run) {
    std::thread thread(run);
    thread.join();
}

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

std::filesystem::path LatchedHealthTest::registrationsFile() {
    return std::filesystem::temp_directory_path() / ("orv-latched-" + std::to_string(::getpid()) + ".reg");
}

LatchedHealthTest::LatchedHealthTest() { serve({}); }

LatchedHealthTest::~LatchedHealthTest() {
    stop();
    std::error_code ignored;
    std::filesystem::remove(registrationsFile(), ignored);
    if (!libraryDir_.empty()) {
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
    {
        std::ofstream out(registrationsFile(), std::ios::trunc);
        out << familyRegistrations();
    }
    orv::providertest::ProviderCoreOptions options;
    options.projectRegistrations = false;
    libraryDir_ = freshLibraryDir();
    options.providerDirs = {libraryDir_};
    options.registrations = {registrationsFile(), testDir() / "elements" / "healthelements.reg"};
    options.mofs = {testDir() / "elements" / "healthelements.mof"};
    provider_ = std::make_unique<orv::providertest::ProviderCore>(options);
    const orv::host::Reply first = provider_->enumerateInstanceNames(kRollupClass);
    ASSERT_EQ(first.rc(), CMPI_RC_OK) << first.message();
    resolveHooks();
    if (!waitForFirstPass) {
        return;
    }
    const auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(30);
    while (completedPasses() == 0) {
        ASSERT_LT(std::chrono::steady_clock::now(), deadline) << "the monitor thread's first pass did not end";
        std::this_thread::sleep_for(std::chrono::milliseconds(5));
    }
}

orv::host::Reply LatchedHealthTest::enableIpIndications() {
    return provider_->core().enableIndications(orv::providertest::kNamespace, "Orvane_KernelIPChangedIndication");
}

void LatchedHealthTest::resolveHooks() {
    const std::filesystem::path file = libraryDir_ / (std::string("lib") + kUnderTestLocation + ".so");
    void* library = dlopen(file.c_str(), RTLD_NOW | RTLD_NOLOAD);
    if (library == nullptr) {
        throw std::runtime_error("the family's test build is not loaded");
    }
    runPass_ = hook<decltype(runPass_)>(library, "VmLatchedHealthTest_RunPass");
    runIpCheck_ = hook<decltype(runIpCheck_)>(library, "VmLatchedHealthTest_RunIpCheck");
    completedPasses_ = hook<decltype(completedPasses_)>(library, "VmLatchedHealthTest_CompletedPasses");
    threadsRunning_ = hook<decltype(threadsRunning_)>(library, "VmLatchedHealthTest_ThreadsRunning");
    dlclose(library);  // the core keeps it loaded
}

void LatchedHealthTest::runPass() { runPassWith(nullptr); }

void LatchedHealthTest::runPassWith(CMPIContext* context) {
    onOwnThread([&] {
        CMPIContext* own = context != nullptr ? context : orv::host::detail::newContext(orv::host::detail::Owner::Caller);
        runPass_(broker(), own);
        if (context == nullptr) {
            own->ft->release(own);
        }
    });
}

void LatchedHealthTest::runIpCheck(CMPIContext* context) {
    onOwnThread([&] {
        CMPIContext* own = context != nullptr ? context : orv::host::detail::newContext(orv::host::detail::Owner::Caller);
        runIpCheck_(broker(), own);
        if (context == nullptr) {
            own->ft->release(own);
        }
    });
}

unsigned long long LatchedHealthTest::completedPasses() { return completedPasses_(); }
unsigned LatchedHealthTest::threadsRunning() { return threadsRunning_(); }

std::vector<Latched> LatchedHealthTest::latched() {
    const orv::host::Reply reply = provider_->enumerateInstances(kLatchedClass);
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
    const orv::host::Reply reply = provider_->enumerateInstances(kRollupClass);
    EXPECT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    if (reply.instances().size() != 1) {
        return "<" + std::to_string(reply.instances().size()) + " instances>";
    }
    return orv::providertest::propertyOf(reply.instances()[0], "HealthState").value_or(NamedValue{}).text;
}

CMPIObjectPath* LatchedHealthTest::latchedPath(const std::string& eventId) {
    return provider_->path(kLatchedClass, {{"EventId", eventId}});
}

orv::host::Reply LatchedHealthTest::references(const CMPIObjectPath* path) {
    return provider_->core().references(path, nullptr, nullptr);
}

void LatchedHealthTest::stop() { provider_.reset(); }

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
