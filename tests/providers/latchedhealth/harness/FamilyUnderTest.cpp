#include "FamilyUnderTest.h"

#include <dlfcn.h>
#include <unistd.h>

#include <chrono>
#include <fstream>
#include <functional>
#include <regex>
#include <sstream>
#include <stdexcept>
#include <thread>

#include "context.hpp"

namespace latched {
namespace {

constexpr const char* kFamilyClasses[] = {"Orvane_LatchedHealthState", "Orvane_RollupHealthState",
                                          "Orvane_LatchedHealthAssociation", "Orvane_KernelIPChangedIndication"};

std::filesystem::path harnessDir() { return ORV_LATCHED_TEST_DIR; }

// The project's registration blocks of the family, pointed at the test build.
std::string familyRegistrations() {
    std::ifstream in(orv::providertest::ProviderCore::registrationFile());
    std::stringstream read;
    read << in.rdbuf();
    const std::string text = read.str();
    std::string out;
    for (const char* className : kFamilyClasses) {
        const std::size_t begin = text.find(std::string("[") + className + "]");
        if (begin == std::string::npos) {
            throw std::runtime_error(std::string("no registration of ") + className);
        }
        const std::size_t end = text.find("\n\n", begin);
        out += text.substr(begin, end == std::string::npos ? std::string::npos : end - begin) + "\n\n";
    }
    return std::regex_replace(out, std::regex("location: orvprovider"), std::string("location: ") + kUnderTestLocation);
}

std::filesystem::path registrationsFile() {
    static int files = 0;
    return std::filesystem::temp_directory_path() /
           ("orv-latched-" + std::to_string(::getpid()) + "-" + std::to_string(++files) + ".reg");
}

template <class Function>
Function hook(void* library, const char* name) {
    void* symbol = dlsym(library, name);
    if (symbol == nullptr) {
        throw std::runtime_error(std::string("the family's test build lacks ") + name);
    }
    return reinterpret_cast<Function>(symbol);
}

// Runs call with context, or with a context of the broker made on the thread.
void onOwnThread(const std::function<void(const CMPIContext*)>& call, CMPIContext* context) {
    std::thread thread([&] {
        if (context != nullptr) {
            call(context);
            return;
        }
        CMPIContext* own = orv::host::detail::newContext(orv::host::detail::Owner::Caller);
        call(own);
        own->ft->release(own);
    });
    thread.join();
}

}  // namespace

FamilyUnderTest::FamilyUnderTest(const std::filesystem::path& libraryDir)
    : libraryDir_(libraryDir), registrations_(registrationsFile()) {
    {
        std::ofstream out(registrations_, std::ios::trunc);
        out << familyRegistrations();
    }
    orv::providertest::ProviderCoreOptions options;
    options.projectRegistrations = false;
    if (!libraryDir_.empty()) {
        options.providerDirs = {libraryDir_};
    }
    const std::filesystem::path companion = ORV_COMPANION_DIR;
    options.registrations = {registrations_, companion / "mof" / "orvhwhealth.reg"};
    options.mofs = {companion / "mof" / "orvhwhealth.mof", harnessDir() / "data" / "numberedsensor.mof"};
    provider_ = std::make_unique<orv::providertest::ProviderCore>(options);
}

FamilyUnderTest::~FamilyUnderTest() {
    provider_.reset();
    std::error_code ignored;
    std::filesystem::remove(registrations_, ignored);
}

bool FamilyUnderTest::load() {
    const orv::host::Reply first = provider_->enumerateInstanceNames("Orvane_RollupHealthState");
    if (first.rc() != CMPI_RC_OK) {
        return false;
    }
    resolveHooks();
    return true;
}

bool FamilyUnderTest::waitForFirstPass() {
    const auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(30);
    while (completedPasses() == 0) {
        if (std::chrono::steady_clock::now() > deadline) {
            return false;
        }
        std::this_thread::sleep_for(std::chrono::milliseconds(5));
    }
    return true;
}

void FamilyUnderTest::resolveHooks() {
    const std::filesystem::path dir =
        libraryDir_.empty() ? orv::providertest::ProviderCore::providerDir() : libraryDir_;
    const std::filesystem::path file = dir / (std::string("lib") + kUnderTestLocation + ".so");
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

void FamilyUnderTest::runPass(CMPIContext* context) {
    onOwnThread([&](const CMPIContext* ctx) { runPass_(provider_->broker(), ctx); }, context);
}

void FamilyUnderTest::runIpCheck(CMPIContext* context) {
    onOwnThread([&](const CMPIContext* ctx) { runIpCheck_(provider_->broker(), ctx); }, context);
}

unsigned long long FamilyUnderTest::completedPasses() { return completedPasses_(); }
unsigned FamilyUnderTest::threadsRunning() { return threadsRunning_(); }

}  // namespace latched
