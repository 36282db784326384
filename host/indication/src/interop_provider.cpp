#include "orv/indication/interop_provider.hpp"

#include <functional>
#include <optional>

#include "names.hpp"
#include "orv/repository/class_repository.hpp"

namespace orv::indication {

namespace {

constexpr auto same = detail::equalsNoCase;

std::string text(const CMPIString* s) { return s != nullptr && s->hdl != nullptr ? static_cast<const char*>(s->hdl) : ""; }

CMPIStatus status(CMPIrc rc, const CMPIBroker* mb, const std::string& message) {
    return CMPIStatus{rc, message.empty() ? nullptr : mb->eft->newString(mb, message.c_str(), nullptr)};
}

std::string classOf(const CMPIObjectPath* op) { return text(op->ft->getClassName(op, nullptr)); }

std::optional<std::string> stringOf(const CMPIData& data) {
    if ((data.state & (CMPI_nullValue | CMPI_notFound)) != 0 || data.type != CMPI_string) {
        return std::nullopt;
    }
    return text(data.value.string);
}

std::optional<std::uint64_t> numberOf(const CMPIData& data) {
    if ((data.state & (CMPI_nullValue | CMPI_notFound)) != 0) {
        return std::nullopt;
    }
    switch (data.type) {
    case CMPI_uint8: return data.value.uint8;
    case CMPI_uint16: return data.value.uint16;
    case CMPI_uint32: return data.value.uint32;
    case CMPI_uint64: return data.value.uint64;
    case CMPI_sint8: return data.value.sint8 < 0 ? std::nullopt : std::optional<std::uint64_t>(data.value.sint8);
    case CMPI_sint16: return data.value.sint16 < 0 ? std::nullopt : std::optional<std::uint64_t>(data.value.sint16);
    case CMPI_sint32: return data.value.sint32 < 0 ? std::nullopt : std::optional<std::uint64_t>(data.value.sint32);
    case CMPI_sint64: return data.value.sint64 < 0 ? std::nullopt : std::optional<std::uint64_t>(data.value.sint64);
    case CMPI_string: {
        std::string t = text(data.value.string);
        char* end = nullptr;
        unsigned long long value = std::strtoull(t.c_str(), &end, 10);
        return !t.empty() && *end == '\0' ? std::optional<std::uint64_t>(value) : std::nullopt;
    }
    default: return std::nullopt;
    }
}

// The Name key of a path, or of the path a reference property holds.
std::string nameKey(const CMPIObjectPath* op) {
    return op != nullptr ? stringOf(op->ft->getKey(op, "Name", nullptr)).value_or("") : "";
}

std::string refName(const CMPIData& data) {
    return data.type == CMPI_ref && (data.state & CMPI_nullValue) == 0 ? nameKey(data.value.ref) : "";
}

// Builds one instance (or its path) of root/interop: keys go on the path, every
// property on the instance.
class Builder {
public:
    Builder(const CMPIBroker* mb, const char* className)
        : mb_(mb), path_(mb->eft->newObjectPath(mb, kInteropNamespace, className, nullptr)) {}

    Builder& key(const char* name, const std::string& value) {
        path_->ft->addKey(path_, name, reinterpret_cast<const CMPIValue*>(value.c_str()), CMPI_chars);
        return *this;
    }
    Builder& keyRef(const char* name, CMPIObjectPath* ref) {
        path_->ft->addKey(path_, name, reinterpret_cast<const CMPIValue*>(&ref), CMPI_ref);
        return *this;
    }
    Builder& str(const char* name, const std::string& value) {
        setters_.push_back([name, value](CMPIInstance* i) {
            i->ft->setProperty(i, name, reinterpret_cast<const CMPIValue*>(value.c_str()), CMPI_chars);
        });
        return *this;
    }
    Builder& u16(const char* name, CMPIUint16 value) {
        setters_.push_back([name, value](CMPIInstance* i) {
            i->ft->setProperty(i, name, reinterpret_cast<const CMPIValue*>(&value), CMPI_uint16);
        });
        return *this;
    }
    Builder& u32(const char* name, CMPIUint32 value) {
        setters_.push_back([name, value](CMPIInstance* i) {
            i->ft->setProperty(i, name, reinterpret_cast<const CMPIValue*>(&value), CMPI_uint32);
        });
        return *this;
    }
    Builder& flag(const char* name, bool value) {
        setters_.push_back([name, value](CMPIInstance* i) {
            CMPIBoolean b = value ? 1 : 0;
            i->ft->setProperty(i, name, reinterpret_cast<const CMPIValue*>(&b), CMPI_boolean);
        });
        return *this;
    }
    Builder& u16Array(const char* name, std::vector<CMPIUint16> values) {
        setters_.push_back([mb = mb_, name, values](CMPIInstance* i) {
            CMPIArray* array = mb->eft->newArray(mb, static_cast<CMPICount>(values.size()), CMPI_uint16, nullptr);
            for (CMPICount n = 0; n < values.size(); ++n) {
                array->ft->setElementAt(array, n, reinterpret_cast<const CMPIValue*>(&values[n]), CMPI_uint16);
            }
            i->ft->setProperty(i, name, reinterpret_cast<const CMPIValue*>(&array), CMPI_uint16A);
        });
        return *this;
    }
    Builder& date(const char* name, const std::string& value) {
        setters_.push_back([mb = mb_, name, value](CMPIInstance* i) {
            CMPIDateTime* dt = mb->eft->newDateTimeFromChars(mb, value.c_str(), nullptr);
            if (dt != nullptr) {
                i->ft->setProperty(i, name, reinterpret_cast<const CMPIValue*>(&dt), CMPI_dateTime);
            }
        });
        return *this;
    }

    CMPIObjectPath* path() const { return path_; }
    CMPIInstance* instance() const {
        CMPIInstance* inst = mb_->eft->newInstance(mb_, path_, nullptr);
        for (const auto& setter : setters_) {
            setter(inst);
        }
        return inst;
    }

private:
    const CMPIBroker* mb_;
    CMPIObjectPath* path_;
    std::vector<std::function<void(CMPIInstance*)>> setters_;
};

const std::vector<std::string> kClasses = {
    "CIM_IndicationFilter", "CIM_ListenerDestinationCIMXML", "CIM_IndicationHandlerCIMXML",
    "CIM_IndicationSubscription", "CIM_IndicationService", "CIM_ObjectManager", "CIM_Namespace",
    "CIM_RegisteredProfile"};

struct Profile {
    const char* name;
    const char* version;
};
// DMTF profiles the host implements: indications (DSP1054) and profile registration (DSP1033).
constexpr Profile kProfiles[] = {{"Indications", "1.1.0"}, {"Profile Registration", "1.0.0"}};

}  // namespace

struct InteropProvider::Impl {
    host::BrokerCore& core;
    SubscriptionManager& manager;
    InteropDescription description;
    CMPIInstanceMIFT ft{};
    CMPIInstanceMI mi{};

    const CMPIBroker* mb() const { return core.broker(); }
    const ManagerOptions& options() const { return manager.options(); }

    // An object keyed like every system-scoped interop class: the scoping
    // system's class and name, its own class and its name.
    Builder systemScoped(const std::string& className, const std::string& systemClass, const std::string& systemName,
                         const std::string& name) const {
        Builder b(mb(), className.c_str());
        b.key("SystemCreationClassName", systemClass)
            .key("SystemName", systemName)
            .key("CreationClassName", className)
            .key("Name", name);
        return b;
    }

    Builder systemKeyed(const char* className, const std::string& name) const {
        return systemScoped(className, options().systemCreationClassName, options().systemName, name);
    }

    Builder filterObject(const FilterRecord& f) const {
        Builder b = systemScoped(f.creationClassName, f.systemCreationClassName, f.systemName, f.name);
        b.str("Query", f.query)
            .str("QueryLanguage", f.queryLanguage)
            .str("SourceNamespace", f.sourceNamespace)
            .flag("IndividualSubscriptionSupported", true);
        return b;
    }

    Builder destinationObject(const DestinationRecord& d) const {
        Builder b = systemScoped(d.creationClassName, d.systemCreationClassName, d.systemName, d.name);
        b.str("Destination", d.destination)
            .u16("PersistenceType", d.persistenceType)
            .u16("Protocol", d.protocol);
        return b;
    }

    Builder subscriptionObject(const SubscriptionRecord& s) const {
        Builder b(mb(), "CIM_IndicationSubscription");
        std::optional<FilterRecord> f = manager.filter(s.filterName);
        std::optional<DestinationRecord> d = manager.destination(s.handlerName);
        CMPIObjectPath* filterPath = f ? filterObject(*f).path() : Builder(mb(), "CIM_IndicationFilter").path();
        CMPIObjectPath* handlerPath = d ? destinationObject(*d).path() : Builder(mb(), s.handlerClass.c_str()).path();
        b.keyRef("Filter", filterPath)
            .keyRef("Handler", handlerPath)
            .u16("SubscriptionState", s.state)
            .u16("OnFatalErrorPolicy", s.onFatalErrorPolicy);
        if (!s.startTime.empty()) {
            b.date("SubscriptionStartTime", s.startTime);
        }
        return b;
    }

    Builder serviceObject() const {
        Builder b = systemKeyed("CIM_IndicationService", description.objectManagerName + ":IndicationService");
        b.str("ElementName", "Indication service")
            .flag("FilterCreationEnabled", true)
            .u16("DeliveryRetryAttempts", static_cast<CMPIUint16>(options().deliveryRetryAttempts))
            .u32("DeliveryRetryInterval", static_cast<CMPIUint32>(options().deliveryRetryInterval.count()))
            .u16("EnabledState", 2)
            .flag("Started", true);
        return b;
    }

    Builder objectManagerObject() const {
        Builder b = systemKeyed("CIM_ObjectManager", description.objectManagerName);
        b.str("ElementName", description.objectManagerName)
            .str("Description", description.objectManagerDescription)
            .flag("GatherStatisticalData", false)
            .u16("EnabledState", 2)
            .flag("Started", true);
        return b;
    }

    Builder namespaceObject(const std::string& ns) const {
        Builder b(mb(), "CIM_Namespace");
        b.key("SystemCreationClassName", options().systemCreationClassName)
            .key("SystemName", options().systemName)
            .key("ObjectManagerCreationClassName", "CIM_ObjectManager")
            .key("ObjectManagerName", description.objectManagerName)
            .key("CreationClassName", "CIM_Namespace")
            .key("Name", ns)
            .u16("ClassInfo", 1)
            .str("DescriptionOfClassInfo", "CIM 2.28")
            .u16("ClassType", 2)
            .str("ClassTypeVersion", "2.28.0");
        return b;
    }

    Builder profileObject(const Profile& p) const {
        Builder b(mb(), "CIM_RegisteredProfile");
        b.key("InstanceID", std::string("DMTF+") + p.name + "+" + p.version)
            .u16("RegisteredOrganization", 2)
            .str("RegisteredName", p.name)
            .str("RegisteredVersion", p.version)
            .u16Array("AdvertiseTypes", {2});
        return b;
    }

    // Every object of a class served here (exactly that class, as the core calls
    // each registered class on its own).
    std::vector<Builder> objectsOf(const std::string& className) const {
        std::vector<Builder> out;
        if (same(className, "CIM_IndicationFilter")) {
            for (const auto& f : manager.filters()) {
                out.push_back(filterObject(f));
            }
        } else if (same(className, "CIM_ListenerDestinationCIMXML") || same(className, "CIM_IndicationHandlerCIMXML")) {
            for (const auto& d : manager.destinations()) {
                if (same(d.creationClassName, className)) {
                    out.push_back(destinationObject(d));
                }
            }
        } else if (same(className, "CIM_IndicationSubscription")) {
            for (const auto& s : manager.subscriptions()) {
                out.push_back(subscriptionObject(s));
            }
        } else if (same(className, "CIM_IndicationService")) {
            out.push_back(serviceObject());
        } else if (same(className, "CIM_ObjectManager")) {
            out.push_back(objectManagerObject());
        } else if (same(className, "CIM_Namespace")) {
            for (const auto& ns : core.classes().namespaces()) {
                out.push_back(namespaceObject(ns));
            }
        } else if (same(className, "CIM_RegisteredProfile")) {
            for (const Profile& p : kProfiles) {
                out.push_back(profileObject(p));
            }
        }
        return out;
    }

    // The object a path names: the same class and the same key values.
    std::optional<Builder> find(const CMPIObjectPath* op) const {
        const std::string className = classOf(op);
        for (Builder& candidate : objectsOf(className)) {
            if (sameKeys(candidate.path(), op)) {
                return std::move(candidate);
            }
        }
        return std::nullopt;
    }

    // Keys compare without regard to case, references by their Name keys. The keys
    // naming the scoping system and object manager are not compared: the host is the
    // only system, and it writes its own name into what clients create.
    static bool sameKeys(const CMPIObjectPath* ours, const CMPIObjectPath* asked) {
        CMPICount count = ours->ft->getKeyCount(ours, nullptr);
        for (CMPICount i = 0; i < count; ++i) {
            CMPIString* nameString = nullptr;
            CMPIData mine = ours->ft->getKeyAt(ours, i, &nameString, nullptr);
            const std::string name = text(nameString);
            if (same(name, "SystemName") || same(name, "SystemCreationClassName") || same(name, "ObjectManagerName") ||
                same(name, "ObjectManagerCreationClassName")) {
                continue;
            }
            CMPIData theirs = asked->ft->getKey(asked, name.c_str(), nullptr);
            if ((theirs.state & CMPI_notFound) != 0 && same(name, "CreationClassName")) {
                continue;  // the class of the path says it already
            }
            if ((theirs.state & CMPI_notFound) != 0) {
                return false;
            }
            if (mine.type == CMPI_ref) {
                if (!same(refName(mine), refName(theirs))) {
                    return false;
                }
            } else if (!same(stringOf(mine).value_or(""), stringOf(theirs).value_or(""))) {
                return false;
            }
        }
        return true;
    }

    CMPIStatus create(const CMPIContext* ctx, const CMPIResult* rslt, const CMPIObjectPath* op,
                      const CMPIInstance* inst) {
        const std::string className = classOf(op);
        auto get = [inst](const char* name) { return inst->ft->getProperty(inst, name, nullptr); };
        std::string principal;
        if (ctx != nullptr) {
            principal = stringOf(ctx->ft->getEntry(ctx, CMPIPrincipal, nullptr)).value_or("");
        }
        Status result;
        std::optional<Builder> created;
        if (same(className, "CIM_IndicationFilter")) {
            FilterRecord f;
            f.name = stringOf(get("Name")).value_or("");
            f.query = stringOf(get("Query")).value_or("");
            f.queryLanguage = stringOf(get("QueryLanguage")).value_or("WQL");
            f.sourceNamespace = stringOf(get("SourceNamespace")).value_or("root/cimv2");
            result = manager.createFilter(f, principal);
            if (result.ok()) {
                created = filterObject(*manager.filter(f.name));
            }
        } else if (same(className, "CIM_ListenerDestinationCIMXML") || same(className, "CIM_IndicationHandlerCIMXML")) {
            DestinationRecord d;
            d.creationClassName = same(className, "CIM_IndicationHandlerCIMXML") ? "CIM_IndicationHandlerCIMXML"
                                                                                   : "CIM_ListenerDestinationCIMXML";
            d.name = stringOf(get("Name")).value_or("");
            d.destination = stringOf(get("Destination")).value_or("");
            d.persistenceType = static_cast<std::uint16_t>(numberOf(get("PersistenceType")).value_or(2));
            d.protocol = static_cast<std::uint16_t>(numberOf(get("Protocol")).value_or(2));
            result = manager.createDestination(d);
            if (result.ok()) {
                created = destinationObject(*manager.destination(d.name));
            }
        } else if (same(className, "CIM_IndicationSubscription")) {
            SubscriptionRecord s;
            s.filterName = refName(get("Filter"));
            s.handlerName = refName(get("Handler"));
            s.state = static_cast<std::uint16_t>(numberOf(get("SubscriptionState")).value_or(2));
            s.onFatalErrorPolicy = static_cast<std::uint16_t>(numberOf(get("OnFatalErrorPolicy")).value_or(2));
            if (s.filterName.empty() || s.handlerName.empty()) {
                return status(CMPI_RC_ERR_INVALID_PARAMETER, mb(), "the subscription needs Filter and Handler references");
            }
            result = manager.createSubscription(s, principal);
            if (result.ok()) {
                created = subscriptionObject(*manager.subscription(s.filterName, s.handlerName));
            }
        } else {
            return status(CMPI_RC_ERR_NOT_SUPPORTED, mb(), "instances of " + className + " cannot be created");
        }
        if (!result.ok()) {
            return status(result.rc, mb(), result.message);
        }
        rslt->ft->returnObjectPath(rslt, created->path());
        rslt->ft->returnDone(rslt);
        return CMPIStatus{CMPI_RC_OK, nullptr};
    }

    CMPIStatus remove(const CMPIObjectPath* op) {
        const std::string className = classOf(op);
        std::optional<Builder> target = find(op);
        if (!target) {
            return status(CMPI_RC_ERR_NOT_FOUND, mb(), "no such instance of " + className);
        }
        Status result;
        if (same(className, "CIM_IndicationFilter")) {
            result = manager.deleteFilter(nameKey(op));
        } else if (same(className, "CIM_ListenerDestinationCIMXML") || same(className, "CIM_IndicationHandlerCIMXML")) {
            result = manager.deleteDestination(nameKey(op));
        } else if (same(className, "CIM_IndicationSubscription")) {
            result = manager.deleteSubscription(refName(op->ft->getKey(op, "Filter", nullptr)),
                                                refName(op->ft->getKey(op, "Handler", nullptr)));
        } else {
            return status(CMPI_RC_ERR_NOT_SUPPORTED, mb(), "instances of " + className + " cannot be deleted");
        }
        return result.ok() ? CMPIStatus{CMPI_RC_OK, nullptr} : status(result.rc, mb(), result.message);
    }
};

namespace {

InteropProvider::Impl* implOf(CMPIInstanceMI* mi) { return static_cast<InteropProvider::Impl*>(mi->hdl); }

CMPIStatus miCleanup(CMPIInstanceMI*, const CMPIContext*, CMPIBoolean) { return CMPIStatus{CMPI_RC_OK, nullptr}; }

CMPIStatus miEnumNames(CMPIInstanceMI* mi, const CMPIContext*, const CMPIResult* rslt, const CMPIObjectPath* op) {
    for (const Builder& b : implOf(mi)->objectsOf(classOf(op))) {
        rslt->ft->returnObjectPath(rslt, b.path());
    }
    rslt->ft->returnDone(rslt);
    return CMPIStatus{CMPI_RC_OK, nullptr};
}

CMPIStatus miEnum(CMPIInstanceMI* mi, const CMPIContext*, const CMPIResult* rslt, const CMPIObjectPath* op,
                  const char**) {
    for (const Builder& b : implOf(mi)->objectsOf(classOf(op))) {
        rslt->ft->returnInstance(rslt, b.instance());
    }
    rslt->ft->returnDone(rslt);
    return CMPIStatus{CMPI_RC_OK, nullptr};
}

CMPIStatus miGet(CMPIInstanceMI* mi, const CMPIContext*, const CMPIResult* rslt, const CMPIObjectPath* op,
                 const char**) {
    std::optional<Builder> found = implOf(mi)->find(op);
    if (!found) {
        return status(CMPI_RC_ERR_NOT_FOUND, implOf(mi)->mb(), "no such instance of " + classOf(op));
    }
    rslt->ft->returnInstance(rslt, found->instance());
    rslt->ft->returnDone(rslt);
    return CMPIStatus{CMPI_RC_OK, nullptr};
}

CMPIStatus miCreate(CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* rslt, const CMPIObjectPath* op,
                    const CMPIInstance* inst) {
    return implOf(mi)->create(ctx, rslt, op, inst);
}

CMPIStatus miModify(CMPIInstanceMI* mi, const CMPIContext*, const CMPIResult*, const CMPIObjectPath* op,
                    const CMPIInstance*, const char**) {
    return status(CMPI_RC_ERR_NOT_SUPPORTED, implOf(mi)->mb(),
                  "instances of " + classOf(op) + " cannot be modified: delete and create them again");
}

CMPIStatus miDelete(CMPIInstanceMI* mi, const CMPIContext*, const CMPIResult*, const CMPIObjectPath* op) {
    return implOf(mi)->remove(op);
}

CMPIStatus miQuery(CMPIInstanceMI* mi, const CMPIContext*, const CMPIResult*, const CMPIObjectPath*, const char*,
                   const char*) {
    return status(CMPI_RC_ERR_NOT_SUPPORTED, implOf(mi)->mb(), "queries are not supported in root/interop");
}

}  // namespace

InteropProvider::InteropProvider(host::BrokerCore& core, SubscriptionManager& manager, InteropDescription description)
    : impl_(std::make_unique<Impl>(Impl{core, manager, std::move(description)})) {
    impl_->ft = CMPIInstanceMIFT{CMPICurrentVersion, CMPICurrentVersion, "InteropProvider", miCleanup, miEnumNames,
                                 miEnum, miGet, miCreate, miModify, miDelete, miQuery};
    impl_->mi = CMPIInstanceMI{impl_.get(), &impl_->ft};
}

InteropProvider::~InteropProvider() = default;

const std::vector<std::string>& InteropProvider::classNames() { return kClasses; }

void InteropProvider::registerWithCore() {
    impl_->core.addBuiltInProvider("InteropProvider", repository::ProviderKind::Instance, &impl_->mi,
                                   kInteropNamespace, kClasses);
}

}  // namespace orv::indication
