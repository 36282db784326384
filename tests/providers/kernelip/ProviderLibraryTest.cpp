// The provider library as a broker sees it: what it exports, the class
// definitions and registration it ships, and the instance factory's trace line.
#include <dlfcn.h>

#include <algorithm>
#include <cctype>
#include <cstdio>
#include <memory>
#include <string>

#include "KernelIPFixture.h"
#include "orv/repository/class_repository.hpp"
#include "orv/repository/registration.hpp"
#include "orv/testsupport/StderrCapture.h"

namespace kernelip {
namespace {

using orv::providertest::ProviderCore;

std::filesystem::path libraryFile() { return ProviderCore::providerDir() / "liborvprovider.so"; }

// Names of the dynamic symbols the library defines.
std::vector<std::string> definedDynamicSymbols() {
    const std::string command = "nm -D --defined-only '" + libraryFile().string() + "'";
    std::unique_ptr<FILE, int (*)(FILE*)> pipe(::popen(command.c_str(), "r"), ::pclose);
    std::vector<std::string> names;
    char line[4096];
    while (pipe && std::fgets(line, sizeof line, pipe.get()) != nullptr) {
        std::string text(line);
        while (!text.empty() && (text.back() == '\n' || text.back() == ' ')) {
            text.pop_back();
        }
        names.push_back(text.substr(text.rfind(' ') + 1));
    }
    return names;
}

// "<Provider>_Create_<Kind>MI" with a provider name of letters, digits and '_'.
bool isFactoryName(const std::string& name) {
    for (const std::string kind : {"Instance", "Association", "Indication", "Method"}) {
        const std::string suffix = "_Create_" + kind + "MI";
        if (name.size() > suffix.size() && name.ends_with(suffix)) {
            const std::string provider = name.substr(0, name.size() - suffix.size());
            return std::all_of(provider.begin(), provider.end(),
                               [](char c) { return std::isalnum(static_cast<unsigned char>(c)) != 0 || c == '_'; });
        }
    }
    return false;
}

TEST(ProviderLibraryTest, ExportsTheProviderFactoriesAndNothingElse) {
    const std::vector<std::string> names = definedDynamicSymbols();
    for (const std::string& name : names) {
        EXPECT_TRUE(isFactoryName(name)) << name << " is exported";
    }
    EXPECT_NE(std::find(names.begin(), names.end(), "KernelIPProtocolEndpointProvider_Create_InstanceMI"),
              names.end());
}

TEST(ProviderLibraryTest, EveryRegisteredProviderHasItsFactory) {
    const auto registrations = orv::repository::RegistrationSet::parseFile(ProviderCore::registrationFile());
    ASSERT_FALSE(registrations.all().empty());
    std::unique_ptr<void, int (*)(void*)> library(::dlopen(libraryFile().c_str(), RTLD_NOW | RTLD_LOCAL), ::dlclose);
    ASSERT_NE(library, nullptr) << ::dlerror();
    const std::pair<orv::repository::ProviderKind, const char*> kinds[] = {
        {orv::repository::ProviderKind::Instance, "_Create_InstanceMI"},
        {orv::repository::ProviderKind::Association, "_Create_AssociationMI"},
        {orv::repository::ProviderKind::Indication, "_Create_IndicationMI"},
        {orv::repository::ProviderKind::Method, "_Create_MethodMI"},
    };
    for (const auto& registration : registrations.all()) {
        EXPECT_EQ(registration.location, "orvprovider") << registration.className;
        for (const auto& [kind, suffix] : kinds) {
            if (registration.has(kind)) {
                const std::string symbol = registration.provider + suffix;
                EXPECT_NE(::dlsym(library.get(), symbol.c_str()), nullptr) << symbol;
            }
        }
    }
}

TEST(ProviderLibraryTest, KernelEndpointClassesDeriveFromTheIPEndpointWithItsKeys) {
    orv::repository::ClassRepository repository;
    repository.loadFile(ProviderCore::mofFile());
    const std::string ns(orv::providertest::kNamespace);
    for (const char* family : {kIPv4Class, kIPv6Class}) {
        EXPECT_EQ(repository.superclassChain(ns, family).at(0), kKernelParent) << family;
        EXPECT_TRUE(repository.isA(ns, family, kCimParent)) << family;
        std::vector<std::string> keys = repository.keyNames(ns, family);
        std::sort(keys.begin(), keys.end());
        EXPECT_EQ(keys, (std::vector<std::string>{"CreationClassName", "Name", "SystemCreationClassName", "SystemName"}));
    }
    EXPECT_EQ(repository.superclassChain(ns, kKernelParent).at(0), kCimParent);
}

TEST(ProviderLibraryTest, KernelEndpointProviderIsRegisteredForInstancesInRootCimv2) {
    const auto registrations = orv::repository::RegistrationSet::parseFile(ProviderCore::registrationFile());
    const auto found = registrations.forClass(kKernelParent);
    ASSERT_EQ(found.size(), 1U);
    EXPECT_EQ(found[0]->provider, "KernelIPProtocolEndpointProvider");
    EXPECT_EQ(found[0]->location, "orvprovider");
    EXPECT_EQ(found[0]->kinds, static_cast<std::uint8_t>(orv::repository::ProviderKind::Instance));
    EXPECT_EQ(found[0]->namespaces, (std::vector<std::string>{"root/cimv2"}));
    EXPECT_EQ(registrations.all().front().className, kKernelParent);
}

TEST(ProviderLibraryTest, InstanceFactoryCalledTwiceSharesOneProviderObjectAndTracesBothCalls) {
    orv::providertest::ProviderCore provider;  // only for its broker
    std::unique_ptr<void, int (*)(void*)> library(::dlopen(libraryFile().c_str(), RTLD_NOW | RTLD_LOCAL), ::dlclose);
    ASSERT_NE(library, nullptr) << ::dlerror();
    using Factory = CMPIInstanceMI* (*)(const CMPIBroker*, const CMPIContext*, CMPIStatus*);
    const auto factory = reinterpret_cast<Factory>(::dlsym(library.get(), "KernelIPProtocolEndpointProvider_Create_InstanceMI"));
    ASSERT_NE(factory, nullptr);
    CMPIStatus st{CMPI_RC_OK, nullptr};
    orv::testsupport::StderrCapture capture;
    CMPIInstanceMI* first = factory(provider.broker(), nullptr, &st);
    CMPIInstanceMI* second = factory(provider.broker(), nullptr, &st);
    EXPECT_EQ(capture.finish(), "--- _Create_InstanceMI() P10CmpiBaseMI\n--- _Create_InstanceMI() P10CmpiBaseMI\n");
    ASSERT_NE(first, nullptr);
    EXPECT_EQ(first, second);
    EXPECT_NE(first->hdl, nullptr);
    EXPECT_EQ(st.rc, CMPI_RC_OK);
    EXPECT_EQ(first->ft->ftVersion, 200);
    EXPECT_EQ(first->ft->miVersion, 200);
    EXPECT_STREQ(first->ft->miName, "instanceKernelIPProtocolEndpointProvider");
    // Two uses: the first terminating cleanup only releases one, the second
    // cleans up and deletes the object.
    EXPECT_EQ(first->ft->cleanup(first, nullptr, 1).rc, CMPI_RC_OK);
    EXPECT_EQ(first->ft->cleanup(first, nullptr, 1).rc, CMPI_RC_OK);
}

class ProviderLoadTest : public KernelIPTest {};

TEST_F(ProviderLoadTest, MofAndRegistrationLoadIntoTheBrokerCoreWhichServesTheProvider) {
    serve(hostWith({Vnic{"vif0", {{"10.0.0.1", "255.0.0.0"}}, {}}}));
    const orv::host::Reply reply = provider().enumerateInstances(kIPv4Class);
    EXPECT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    EXPECT_EQ(reply.providerCalls(), 1U);
    EXPECT_EQ(reply.instances().size(), 1U);
    EXPECT_EQ(provider().core().loadedLibraries(), (std::vector<std::string>{"orvprovider"}));
}

TEST_F(ProviderLoadTest, InstanceFactoryWritesItsTraceLineToStandardError) {
    serve(hostWith({}));
    orv::testsupport::StderrCapture capture;
    const orv::host::Reply reply = provider().enumerateInstances(kIPv4Class);
    EXPECT_EQ(capture.finish(), "--- _Create_InstanceMI() P10CmpiBaseMI\n");
    EXPECT_EQ(reply.rc(), CMPI_RC_OK);
}

TEST_F(ProviderLoadTest, CreateInstanceIsNotSupported) {
    serve(hostWith(threeVnics()));
    const orv::host::Reply names = provider().enumerateInstanceNames(kIPv4Class);
    ASSERT_FALSE(names.objectPaths().empty());
    const CMPIObjectPath* path = names.objectPaths()[0];
    CMPIStatus st{CMPI_RC_OK, nullptr};
    CMPIInstance* instance = provider().broker()->eft->newInstance(provider().broker(), path, &st);
    ASSERT_EQ(st.rc, CMPI_RC_OK);
    const orv::host::Reply reply = provider().core().createInstance(provider().path(kIPv4Class), instance);
    EXPECT_EQ(reply.rc(), CMPI_RC_ERR_NOT_SUPPORTED);
    EXPECT_TRUE(reply.items().empty());
}

}  // namespace
}  // namespace kernelip
