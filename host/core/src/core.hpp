// The core's internal services: class repository, registrations, loader,
// routing and indication subscribers. BrokerCore (the client API) and the
// broker's up-calls both send requests through dispatch().
#pragma once

#include <cmpidt.h>
#include <cmpift.h>

#include <functional>
#include <deque>
#include <map>
#include <memory>
#include <mutex>
#include <set>
#include <string>
#include <vector>

#include "class_source.hpp"
#include "loader.hpp"
#include "name_table.hpp"
#include "orv/host/broker_core.hpp"
#include "orv/repository/class_repository.hpp"
#include "orv/repository/registration.hpp"
#include "query.hpp"
#include "result.hpp"

namespace orv::host::detail {

enum class Op : std::uint8_t {
    EnumerateInstances,
    EnumerateInstanceNames,
    GetInstance,
    CreateInstance,
    ModifyInstance,
    DeleteInstance,
    ExecQuery,
    Associators,
    AssociatorNames,
    References,
    ReferenceNames,
    InvokeMethod,
};

// Who asks, as carried by the MI call's context.
struct Caller {
    std::string principal;
    std::string role;
    CMPIFlags flags = 0;
    CMPIUint32 sessionId = 0;
};

struct Request {
    Op op = Op::EnumerateInstances;
    const CMPIObjectPath* path = nullptr;
    const CMPIInstance* instance = nullptr;
    const char** properties = nullptr;
    const char* assocClass = nullptr;   // associators/associatorNames
    const char* resultClass = nullptr;  // for references: the association class
    const char* role = nullptr;
    const char* resultRole = nullptr;
    const char* query = nullptr;
    const char* lang = nullptr;
    const char* method = nullptr;
    const CMPIArgs* in = nullptr;
    CMPIArgs* out = nullptr;
    Caller caller;
};

struct Outcome {
    CMPIrc rc = CMPI_RC_OK;
    std::string message;
    unsigned calls = 0;
};

// A provider registration chosen for a request, and the class name the MI is
// called with.
struct Target {
    const ProviderRegistration* reg = nullptr;
    std::string className;
};

class CoreServices final : public ClassSource {
public:
    explicit CoreServices(const CoreConfig& config);
    ~CoreServices() override;
    CoreServices(const CoreServices&) = delete;
    CoreServices& operator=(const CoreServices&) = delete;

    const CMPIBroker* broker() const noexcept { return &broker_; }
    const orv::repository::ClassRepository& classes() const noexcept { return repository_; }

    Outcome dispatch(const Request& request, ResultSink& sink);
    Outcome filterControl(std::string_view ns, std::string_view query, std::string_view lang, const Caller& caller,
                          bool activate);
    Outcome indicationSwitch(std::string_view ns, std::string_view className, bool enable);

    std::uint64_t addSubscriber(IndicationSubscriber subscriber);
    void removeSubscriber(std::uint64_t id);
    CMPIStatus deliver(const char* ns, const CMPIInstance* indication);

    ProviderLoader& loader() noexcept { return *loader_; }
    // Registers an MI of the host's own for classes of one namespace (see BrokerCore).
    void addBuiltIn(const std::string& name, ProviderKind kind, void* mi, std::string_view ns,
                    const std::vector<std::string>& classNames);
    // Loads each registered library once; the errors of those that failed.
    std::vector<std::string> preloadProviders();
    // Creates every registration's MIs; the errors of those that failed.
    std::vector<std::string> createAllProviders();

    // ClassSource
    const NameTable* nameTable(std::string_view ns, std::string_view className) const override;
    CMPIData qualifier(std::string_view ns, std::string_view className, char elementKind, std::string_view element,
                       std::string_view qualifierName, CMPIrc* rc) const override;
    bool isA(std::string_view ns, std::string_view className, std::string_view ancestor) const override;

private:
    std::vector<Target> targets(std::string_view ns, std::string_view className, ProviderKind kind,
                                bool withSubclasses) const;
    std::vector<Target> associationTargets(std::string_view ns, const char* filterClass) const;
    std::vector<const ProviderRegistration*> registrationsFor(std::string_view ns, std::string_view className,
                                                              ProviderKind kind) const;
    Outcome callTargets(const std::vector<Target>& targets, ProviderKind kind, const Request& request,
                        ResultSink& sink);
    Outcome noTarget(std::string_view ns, std::string_view className) const;
    // CMPI_RC_ERR_INVALID_QUERY unless the query's FROM class exists in `ns` and
    // declares every property of its SELECT list (query_fallback.cpp).
    Outcome checkQueryClass(std::string_view ns, const Query& query) const;
    // Logs, once per provider, that it handed object paths to an instance request.
    void warnPathsAsInstances(const Target& target, const Request& request);
    void warn(const std::string& line) const;
    // One filter off on one provider and class: disableIndications first when it
    // was the provider's last filter, then deActivateFilter.
    CMPIStatus filterOff(ProviderEntry& entry, void* mi, const CMPIContext* ctx, const CMPISelectExp* se,
                         std::string_view ns, const std::string& className);

    orv::repository::ClassRepository repository_;
    std::vector<orv::repository::RegistrationSet> registrationSets_;
    std::vector<const ProviderRegistration*> registrations_;
    std::deque<ProviderRegistration> builtIns_;  // registrations of the host's own MIs
    CMPIBroker broker_;
    std::unique_ptr<ProviderLoader> loader_;

    // Tells this core's tables from those of a core that lived at the same address.
    const std::uint64_t serial_;
    mutable std::mutex nameTableMutex_;
    mutable std::map<std::string, std::unique_ptr<NameTable>> nameTables_;

    std::function<void(const std::string&)> warningSink_;
    std::mutex warnedMutex_;
    std::set<std::string> warnedProviders_;
    std::mutex filterMutex_;  // filter activation and the enable switch, one at a time

    std::mutex subscriberMutex_;
    std::map<std::uint64_t, std::shared_ptr<IndicationSubscriber>> subscribers_;
    std::uint64_t nextSubscriber_ = 1;
};

}  // namespace orv::host::detail
