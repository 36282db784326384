#include "core.hpp"

#include <algorithm>
#include <atomic>
#include <set>
#include <stdexcept>

#include "broker_tables.hpp"
#include "instance.hpp"
#include "names.hpp"
#include "qualifier_data.hpp"

namespace orv::host::detail {

namespace {

namespace fs = std::filesystem;

std::atomic<std::uint64_t> nextSerial{1};
namespace repo = orv::repository;

// MOF files of a path: the file itself, or a directory's *.mof in name order.
std::vector<fs::path> mofFiles(const fs::path& path) {
    if (!fs::is_directory(path)) {
        return {path};
    }
    std::vector<fs::path> files;
    for (const auto& item : fs::directory_iterator(path)) {
        if (item.path().extension() == ".mof") {
            files.push_back(item.path());
        }
    }
    std::sort(files.begin(), files.end());
    return files;
}

}  // namespace

CoreServices::CoreServices(const CoreConfig& config)
    : broker_(makeBroker(this)), serial_(nextSerial.fetch_add(1)), warningSink_(config.warningSink) {
    try {
        for (const fs::path& path : config.mofPaths) {
            for (const fs::path& file : mofFiles(path)) {
                repository_.loadFile(file, config.mofNamespace);
            }
        }
        for (const fs::path& file : config.registrationFiles) {
            registrationSets_.push_back(repo::RegistrationSet::parseFile(file));
        }
    } catch (const repo::ParseError& error) {
        throw std::runtime_error(error.what());
    }
    for (const std::string& line : repository_.warnings()) {
        warn(line);
    }
    for (const auto& set : registrationSets_) {
        for (const auto& reg : set.all()) {
            registrations_.push_back(&reg);
        }
    }
    loader_ = std::make_unique<ProviderLoader>(config.providerDirs, &broker_);
}

CoreServices::~CoreServices() { loader_->shutdown(); }

void CoreServices::addBuiltIn(const std::string& name, ProviderKind kind, void* mi, std::string_view ns,
                              const std::vector<std::string>& classNames) {
    for (const std::string& className : classNames) {
        ProviderRegistration reg;
        reg.className = className;
        reg.provider = name;
        reg.kinds = static_cast<std::uint8_t>(kind);
        reg.namespaces = {std::string(ns)};
        reg.unloadNever = true;
        reg.file = "(built in)";
        builtIns_.push_back(std::move(reg));
        registrations_.push_back(&builtIns_.back());
    }
    loader_->addBuiltIn(name, kind, mi);
}

std::vector<std::string> CoreServices::preloadProviders() {
    std::vector<std::string> failures;
    std::set<std::string> seen;
    for (const ProviderRegistration* reg : registrations_) {
        if (!reg->location.empty() && seen.insert(reg->location).second) {
            if (std::string error = loader_->preload(reg->location); !error.empty()) {
                failures.push_back(std::move(error));
            }
        }
    }
    return failures;
}

std::vector<std::string> CoreServices::createAllProviders() {
    constexpr ProviderKind kKinds[] = {ProviderKind::Instance, ProviderKind::Association, ProviderKind::Method,
                                       ProviderKind::Property, ProviderKind::Indication};
    std::vector<std::string> failures;
    std::set<std::string> seen;
    for (const ProviderRegistration* reg : registrations_) {
        for (ProviderKind kind : kKinds) {
            if (!reg->has(kind) || !seen.insert(reg->provider + "/" + kindName(kind)).second) {
                continue;
            }
            std::string error;
            if (loader_->mi(*reg, kind, &error) == nullptr) {
                failures.push_back(std::move(error));
            }
        }
    }
    return failures;
}

namespace {

// The table a thread looked up last, checked before the shared map: instances
// of one class are usually made one after another.
struct LastNameTable {
    std::uint64_t serial = 0;
    std::string nameSpace;
    std::string className;
    const NameTable* table = nullptr;
};

thread_local LastNameTable tlsLastNameTable;

}  // namespace

const NameTable* CoreServices::nameTable(std::string_view ns, std::string_view className) const {
    LastNameTable& last = tlsLastNameTable;
    if (last.serial == serial_ && last.className == className && last.nameSpace == ns) {
        return last.table;
    }
    std::string cacheKey = lowerCase(ns) + ":" + lowerCase(className);
    const NameTable* table = nullptr;
    {
        std::lock_guard lock(nameTableMutex_);
        auto found = nameTables_.find(cacheKey);
        if (found == nameTables_.end()) {
            std::unique_ptr<NameTable> made;
            if (const repo::ClassDecl* cls = repository_.getClass(ns, className); cls != nullptr) {
                std::vector<std::string> names;
                names.reserve(cls->properties.size());
                for (const auto& property : cls->properties) {
                    names.push_back(property.name);
                }
                made = std::make_unique<NameTable>(names, repository_.keyNames(ns, className));
            }
            found = nameTables_.emplace(std::move(cacheKey), std::move(made)).first;
        }
        table = found->second.get();
    }
    last.serial = serial_;
    last.nameSpace.assign(ns);
    last.className.assign(className);
    last.table = table;
    return table;
}

CMPIData CoreServices::qualifier(std::string_view ns, std::string_view className, char elementKind,
                                 std::string_view element, std::string_view qualifierName, CMPIrc* rc) const {
    const repo::ClassDecl* cls = repository_.getClass(ns, className);
    if (cls == nullptr) {
        *rc = CMPI_RC_ERR_INVALID_CLASS;
        return nullData();
    }
    const repo::QualifierList* list = qualifierList(*cls, elementKind, element);
    const repo::Qualifier* found = list != nullptr ? list->find(qualifierName) : nullptr;
    if (found == nullptr) {
        *rc = list == nullptr ? CMPI_RC_ERR_NO_SUCH_PROPERTY : CMPI_RC_ERR_NOT_FOUND;
        return nullData();
    }
    return qualifierData(*found, rc);
}

bool CoreServices::isA(std::string_view ns, std::string_view className, std::string_view ancestor) const {
    return equalsNoCase(className, ancestor) || repository_.isA(ns, className, ancestor);
}

std::uint64_t CoreServices::addSubscriber(IndicationSubscriber subscriber) {
    std::lock_guard lock(subscriberMutex_);
    std::uint64_t id = nextSubscriber_++;
    subscribers_.emplace(id, std::make_shared<IndicationSubscriber>(std::move(subscriber)));
    return id;
}

void CoreServices::removeSubscriber(std::uint64_t id) {
    std::lock_guard lock(subscriberMutex_);
    subscribers_.erase(id);
}

CMPIStatus CoreServices::deliver(const char* ns, const CMPIInstance* indication) {
    if (instanceImpl(indication) == nullptr) {
        return makeStatus(CMPI_RC_ERR_INVALID_PARAMETER, "deliverIndication needs a live instance");
    }
    std::vector<std::shared_ptr<IndicationSubscriber>> targets;
    {
        std::lock_guard lock(subscriberMutex_);
        for (const auto& [id, subscriber] : subscribers_) {
            targets.push_back(subscriber);
        }
    }
    for (const auto& subscriber : targets) {
        (*subscriber)(ns != nullptr ? ns : "", indication);
    }
    return okStatus();
}

}  // namespace orv::host::detail
