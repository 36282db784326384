// The broker core as seen from this process: tests, benchmarks and the CIM-XML
// front end send requests through BrokerCore and read what the providers
// returned through the ordinary CMPI function tables.
//
// A BrokerCore reads the class repository (MOF) and the provider registrations
// when it is constructed, loads provider libraries on first use, routes each
// request to the providers registered for the class (and, for enumerations,
// its subclasses), and collects what they return, in order, in a Reply.
//
// Lifetimes:
//  - Every object a request returns (instances, object paths, strings, out
//    arguments, the status message) belongs to the Reply and is freed with it.
//    Read them through their function tables; clone() one to keep it longer.
//  - Objects the caller builds with the broker's factory table (broker()->eft)
//    belong to the calling thread's current ObjectScope (see below); with no
//    scope open they belong to the thread and are freed when it ends.
//  - Replies and scopes must be destroyed before the BrokerCore.
//
// Threads: requests may be sent from several threads at once. Providers are
// loaded under a lock; their MI functions are called concurrently as sfcb does
// in one provider process.
#pragma once

#include <cmpidt.h>
#include <cmpift.h>

#include <cstdint>
#include <filesystem>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "orv/repository/class_repository.hpp"
#include "orv/repository/registration.hpp"

namespace orv::host {

// What the core is built from. Bad MOF or registration input makes the
// constructor throw std::runtime_error whose what() is "file:line: message".
struct CoreConfig {
    // Directories searched, in order, for lib<location>.so; the first directory
    // where the file exists is used even when loading it then fails.
    std::vector<std::filesystem::path> providerDirs;
    // Provider registration files (providerRegister format), read in order.
    std::vector<std::filesystem::path> registrationFiles;
    // MOF files, or directories whose *.mof files are read in name order.
    std::vector<std::filesystem::path> mofPaths;
    // Namespace the MOF files are read into (until a "#pragma namespace").
    std::string mofNamespace = "root/cimv2";
    // Receives the core's warnings, one line each without line end (such as the
    // one logged once per provider that hands object paths to instance
    // requests, and the class repository's warnings about the MOF at start). Unset: they go to standard error.
    std::function<void(const std::string&)> warningSink;
};

struct ReturnedItem;
// Receives returned objects one at a time (see CallOptions::onItem).
using ItemConsumer = std::function<bool(const ReturnedItem&)>;

// Per-request settings that reach the provider through its context.
struct CallOptions {
    std::string principal;            // CMPIPrincipal
    std::string role;                 // CMPIRole; omitted when empty
    CMPIFlags flags = 0;              // CMPIInvocationFlags (CMPI_FLAG_*)
    std::uint32_t sessionId = 0;      // "CMPISessionId"
    // Property list handed to the provider; std::nullopt means "all properties"
    // (a NULL list), an empty vector means "no properties".
    std::optional<std::vector<std::string>> properties;
    // Streaming: when set, every instance and object path a provider returns is
    // handed to it at once, on the provider's thread, instead of being kept in the
    // Reply, so that a front end can send each one on while the provider builds the
    // next and a request costs the memory of one object whatever the provider
    // returns. The object is valid only during the call (an instance the provider
    // returned is its own, handed on without a copy; clone to keep). Answering false
    // refuses the object: the provider's return call gets CMPI_RC_ERR_FAILED, which
    // tells it to stop. Must not throw: it runs inside the provider's call.
    ItemConsumer onItem;
};

// One thing a provider returned, in the order it arrived.
struct ReturnedItem {
    enum class Kind : std::uint8_t { Instance, ObjectPath, Data, Error };
    Kind kind = Kind::Data;
    // Instance: data.value.inst (type CMPI_instance); ObjectPath: data.value.ref
    // (CMPI_ref); Data: whatever returnData gave (chars come back as CMPI_string);
    // Error: data.value.dataPtr.ptr is the CMPIError*.
    CMPIData data{};
};

// The outcome of one request. Owns everything it refers to.
class Reply {
public:
    Reply();
    ~Reply();
    Reply(Reply&&) noexcept;
    Reply& operator=(Reply&&) noexcept;
    Reply(const Reply&) = delete;
    Reply& operator=(const Reply&) = delete;

    // The final status: the first failing provider's status, else OK.
    CMPIrc rc() const noexcept;
    // The status message text ("" when the status has none).
    const std::string& message() const noexcept;
    // The status as a CMPIStatus whose msg (possibly NULL) belongs to the Reply.
    CMPIStatus status() const noexcept;

    // Everything returned, across all providers that were called, in order.
    const std::vector<ReturnedItem>& items() const noexcept;
    // The instances / object paths among items(), in order.
    std::vector<const CMPIInstance*> instances() const;
    std::vector<const CMPIObjectPath*> objectPaths() const;
    // How many times the providers called returnDone, summed.
    unsigned doneCount() const noexcept;
    // How many providers (MI calls) the request reached.
    unsigned providerCalls() const noexcept;
    // invokeMethod only: the output arguments (never NULL after invokeMethod).
    const CMPIArgs* outArgs() const noexcept;

    struct State;
    explicit Reply(std::unique_ptr<State> state);
    State& state() noexcept { return *state_; }

private:
    std::unique_ptr<State> state_;
};

// Makes a fresh object scope the calling thread's current one while it lives:
// objects the broker creates in this thread (broker()->eft->newInstance, ...)
// belong to it and are freed when it is destroyed. Scopes nest.
class ObjectScope {
public:
    ObjectScope();
    ~ObjectScope();
    ObjectScope(const ObjectScope&) = delete;
    ObjectScope& operator=(const ObjectScope&) = delete;

    // How many live broker objects the scope holds now.
    std::size_t objectCount() const noexcept;

    struct State;

private:
    std::unique_ptr<State> state_;
};

// A callback receiving every indication a provider delivers (deliverIndication).
// The instance is valid only during the call; clone it to keep it.
using IndicationSubscriber = std::function<void(std::string_view ns, const CMPIInstance* indication)>;

class BrokerCore {
public:
    // Reads MOF files and registrations; throws std::runtime_error
    // ("file:line: message") on bad input. Loads no provider yet.
    explicit BrokerCore(const CoreConfig& config);
    // Calls shutdown() if it was not called.
    ~BrokerCore();
    BrokerCore(const BrokerCore&) = delete;
    BrokerCore& operator=(const BrokerCore&) = delete;

    // The broker handed to providers (factory tables usable by clients too).
    const CMPIBroker* broker() const noexcept;
    // The classes read from the MOF files, shared read-only with front ends.
    const orv::repository::ClassRepository& classes() const noexcept;

    // Loads every library the registrations name (each once, as a request would)
    // so that a host can refuse to start on a broken one. Returns one line per
    // library that failed: "cannot load provider library <path>: <dlerror text>".
    std::vector<std::string> preloadProviders();
    // Creates the MI of every registration and kind now (factories and their
    // initialize, as a first request would), so that threads providers start there
    // run from the start. Returns the error of each MI that could not be created.
    std::vector<std::string> createAllProviders();

    // Instance operations. The namespace is the path's namespace.
    Reply enumerateInstances(const CMPIObjectPath* classPath, const CallOptions& opts = {});
    Reply enumerateInstanceNames(const CMPIObjectPath* classPath, const CallOptions& opts = {});
    Reply getInstance(const CMPIObjectPath* instancePath, const CallOptions& opts = {});
    Reply createInstance(const CMPIObjectPath* classPath, const CMPIInstance* instance,
                         const CallOptions& opts = {});
    Reply modifyInstance(const CMPIObjectPath* instancePath, const CMPIInstance* instance,
                         const CallOptions& opts = {});
    Reply deleteInstance(const CMPIObjectPath* instancePath, const CallOptions& opts = {});
    Reply execQuery(const CMPIObjectPath* nsPath, const char* query, const char* lang,
                    const CallOptions& opts = {});

    // Association operations; NULL filters mean "any".
    Reply associators(const CMPIObjectPath* objectPath, const char* assocClass,
                      const char* resultClass, const char* role, const char* resultRole,
                      const CallOptions& opts = {});
    Reply associatorNames(const CMPIObjectPath* objectPath, const char* assocClass,
                          const char* resultClass, const char* role, const char* resultRole,
                          const CallOptions& opts = {});
    Reply references(const CMPIObjectPath* objectPath, const char* resultClass, const char* role,
                     const CallOptions& opts = {});
    Reply referenceNames(const CMPIObjectPath* objectPath, const char* resultClass,
                         const char* role, const CallOptions& opts = {});

    // Extrinsic method call; the return value arrives as a Data item.
    Reply invokeMethod(const CMPIObjectPath* objectPath, const char* method, const CMPIArgs* in,
                       const CallOptions& opts = {});

    // Indication control for the indication providers registered for the FROM
    // class of `query` (and its subclasses), one filter per call, in sfcb's order:
    // activation calls authorizeFilter, mustPoll and activateFilter on each (with
    // firstActivation set when the provider had no active filter on that class),
    // then enableIndications on each provider that had no active filter; a refusal
    // deactivates what the call activated. Deactivation calls disableIndications on
    // a provider losing its last filter, then deActivateFilter (lastActivation set
    // when no filter on that class is left).
    Reply activateFilter(std::string_view ns, std::string_view query, std::string_view lang = "WQL",
                         const CallOptions& opts = {});
    Reply deactivateFilter(std::string_view ns, std::string_view query,
                           std::string_view lang = "WQL", const CallOptions& opts = {});
    // enableIndications / disableIndications on the indication providers of a
    // class (each provider once, as sfcb keeps one flag per provider).
    Reply enableIndications(std::string_view ns, std::string_view className);
    Reply disableIndications(std::string_view ns, std::string_view className);

    // Serves classes of `ns` through an MI of the host's own (no library): requests
    // for them reach `mi` (a CMPIInstanceMI*, ... of `kind`) as they would reach a
    // registered provider named `name`. Call before requests are sent; the MI must
    // stay valid until shutdown(), which calls its cleanup like any provider's.
    void addBuiltInProvider(const std::string& name, orv::repository::ProviderKind kind, void* mi,
                            std::string_view ns, const std::vector<std::string>& classNames);

    // Subscribers receive every delivered indication; ids are never reused.
    std::uint64_t addIndicationSubscriber(IndicationSubscriber subscriber);
    void removeIndicationSubscriber(std::uint64_t id);

    // Asks every loaded provider that may be unloaded (no "unload: never", not
    // refused before, no active filter) to clean up with terminating = false and
    // unloads the libraries whose MIs all answered OK. Returns how many libraries
    // were unloaded.
    unsigned unloadIdleProviders();

    // disableIndications on indication MIs, then cleanup(terminating = true)
    // on every MI of every provider, then unloads the libraries. Idempotent;
    // requests after shutdown answer CMPI_RC_ERR_FAILED.
    void shutdown();

    // Provider libraries currently loaded (location names, load order).
    std::vector<std::string> loadedLibraries() const;

    struct Impl;
    Impl& impl() noexcept { return *impl_; }

private:
    std::unique_ptr<Impl> impl_;
};

}  // namespace orv::host
