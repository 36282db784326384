#include "instance.hpp"

#include "name_table.hpp"
#include "names.hpp"
#include "object_path.hpp"
#include "string.hpp"
#include "value_text.hpp"

namespace orv::host::detail {

namespace {

constexpr CMPIStatus kInvalid{CMPI_RC_ERR_INVALID_HANDLE, nullptr};

InstanceImpl* impl(const CMPIInstance* instance) { return instanceImpl(instance); }

const std::vector<std::string>& keyNamesOf(const InstanceImpl& inst) {
    return inst.classNames != nullptr ? inst.classNames->keyNames() : inst.pathKeys;
}

// The key properties of the instance, in the order of its key names.
template <class Visit>
void forEachKey(const InstanceImpl& inst, Visit visit) {
    if (inst.classNames != nullptr && inst.properties.nameTable() == inst.classNames &&
        inst.classNames->keySlots().size() == inst.classNames->keyNames().size()) {
        for (std::uint32_t slot : inst.classNames->keySlots()) {
            visit(inst.properties.atSlot(slot));
        }
        return;
    }
    for (const std::string& key : keyNamesOf(inst)) {
        visit(inst.properties.find(key));
    }
}

bool contains(const std::vector<std::string>& names, std::string_view name) {
    for (const std::string& item : names) {
        if (equalsNoCase(item, name)) {
            return true;
        }
    }
    return false;
}

// Whether the property filter lets `name` in.
bool passesFilter(const InstanceImpl& inst, std::string_view name) {
    return !inst.filter || contains(*inst.filter, name) || contains(keyNamesOf(inst), name);
}

CMPIStatus release(CMPIInstance* instance) { return releaseAny(instance, &kInstanceFT); }

CMPIInstance* clone(const CMPIInstance* instance, CMPIStatus* rc) {
    CMPIInstance* copy = cloneInstance(instance, Owner::Caller);
    setRc(rc, copy != nullptr ? CMPI_RC_OK : CMPI_RC_ERR_INVALID_HANDLE);
    return copy;
}

CMPIData getProperty(const CMPIInstance* instance, const char* name, CMPIStatus* rc) {
    InstanceImpl* inst = impl(instance);
    if (inst == nullptr || name == nullptr) {
        setRc(rc, inst == nullptr ? CMPI_RC_ERR_INVALID_HANDLE : CMPI_RC_ERR_INVALID_PARAMETER);
        return nullData();
    }
    return inst->properties.get(name, rc, CMPI_notFound);
}

CMPIData getPropertyAt(const CMPIInstance* instance, CMPICount index, CMPIString** name, CMPIStatus* rc) {
    InstanceImpl* inst = impl(instance);
    if (inst == nullptr) {
        setRc(rc, CMPI_RC_ERR_INVALID_HANDLE);
        return nullData();
    }
    return inst->properties.at(index, name, rc, CMPI_notFound);
}

CMPICount getPropertyCount(const CMPIInstance* instance, CMPIStatus* rc) {
    InstanceImpl* inst = impl(instance);
    setRc(rc, inst != nullptr ? CMPI_RC_OK : CMPI_RC_ERR_INVALID_HANDLE);
    return inst != nullptr ? static_cast<CMPICount>(inst->properties.size()) : 0;
}

CMPIStatus setProperty(const CMPIInstance* instance, const char* name, const CMPIValue* value, CMPIType type) {
    InstanceImpl* inst = impl(instance);
    if (inst == nullptr) {
        return kInvalid;
    }
    if (name == nullptr) {
        return CMPIStatus{CMPI_RC_ERR_INVALID_PARAMETER, nullptr};
    }
    const std::string_view property(name);  // measured once for the filter and the list
    if (!passesFilter(*inst, property)) {
        return okStatus();  // filtered out: accepted and dropped
    }
    ++inst->changes;
    return CMPIStatus{inst->properties.set(property, value, type), nullptr};
}

CMPIStatus setPropertyWithOrigin(const CMPIInstance* instance, const char* name, const CMPIValue* value,
                                 CMPIType type, const char* /*origin: class origins are not kept*/) {
    return setProperty(instance, name, value, type);
}

// Whether a key value cannot change behind the instance's back: a scalar or a
// string (an embedded object read from the instance could be changed in place).
bool isFixedKey(const CMPIData& data) noexcept { return data.type == CMPI_string || !ownsMember(data.type); }

// The instance's path, made under `owner` (Parent: carved from `home`); false in
// `cacheable` when a key could change without the instance knowing.
CMPIObjectPath* makePath(const InstanceImpl& inst, Owner owner, Arena* home, bool& cacheable) {
    MemberHome parent(home);
    CMPIObjectPath* path = newObjectPath(inst.nameSpace, inst.className, inst.classes, owner);
    ObjectPathImpl* p = objectPathImpl(path);
    p->host = inst.host;
    MemberHome members(p->keys.home());
    cacheable = true;
    forEachKey(inst, [p, &cacheable](const NamedValue* property) {
        if (property != nullptr && property->data.state == CMPI_goodValue) {
            CMPIData copy{};
            copyValue(copy, property->data);
            p->keys.appendDistinct(*property, copy);
            cacheable = cacheable && isFixedKey(property->data);
        }
    });
    return path;
}

CMPIObjectPath* getObjectPath(const CMPIInstance* instance, CMPIStatus* rc) {
    InstanceImpl* inst = impl(instance);
    if (inst == nullptr) {
        setRc(rc, CMPI_RC_ERR_INVALID_HANDLE);
        return nullptr;
    }
    setRc(rc, CMPI_RC_OK);
    // Only the thread that made the instance's arena (the one building or serving
    // it) uses the cache, so that other threads may read the instance at the same
    // time as before.
    Arena* home = baseOf(instance)->home;
    bool cacheable = home != nullptr && home->madeOnThisThread();
    if (!cacheable) {
        return makePath(*inst, Owner::Arena, nullptr, cacheable);
    }
    PathCache& cache = inst->pathCache;
    if (cache.path != nullptr && cache.instanceChanges == inst->changes &&
        objectPathImpl(cache.path)->changes == cache.pathChanges) {
        return cache.path;
    }
    cache.forget();
    CMPIObjectPath* path = makePath(*inst, Owner::Parent, home, cacheable);
    if (!cacheable) {
        handOverObject(path);
        return path;
    }
    cache.path = path;
    cache.instanceChanges = inst->changes;
    cache.pathChanges = objectPathImpl(path)->changes;
    return path;
}

std::vector<std::string> nameList(const char** names) {
    std::vector<std::string> list;
    for (; names != nullptr && *names != nullptr; ++names) {
        list.emplace_back(*names);
    }
    return list;
}

CMPIStatus setPropertyFilter(CMPIInstance* instance, const char** propertyList, const char** keys) {
    InstanceImpl* inst = impl(instance);
    if (inst == nullptr) {
        return kInvalid;
    }
    if (propertyList == nullptr) {
        return okStatus();  // NULL list: every property
    }
    std::vector<std::string> allowed = nameList(propertyList);
    for (std::string& key : nameList(keys)) {
        allowed.push_back(std::move(key));
    }
    inst->filter = std::move(allowed);
    ++inst->changes;
    inst->properties.keepIf([inst](std::string_view name) { return passesFilter(*inst, name); });
    return okStatus();
}

CMPIStatus setObjectPath(CMPIInstance* instance, const CMPIObjectPath* op) {
    InstanceImpl* inst = impl(instance);
    ObjectPathImpl* path = objectPathImpl(op);
    if (inst == nullptr || path == nullptr) {
        return kInvalid;
    }
    ++inst->changes;
    inst->nameSpace = path->nameSpace;
    inst->host = path->host;
    inst->className = path->className;
    inst->classNames = inst->classes != nullptr ? inst->classes->nameTable(inst->nameSpace, inst->className) : nullptr;
    inst->pathKeys.clear();
    MemberHome members(inst->properties.home());
    for (std::size_t i = 0; i < path->keys.size(); ++i) {
        const NamedValue& key = path->keys[i];
        CMPIData copy{};
        copyValue(copy, key.data);
        inst->properties.setStored(key, copy);
        if (inst->classNames == nullptr) {  // the class's own keys serve otherwise
            inst->pathKeys.emplace_back(key.name());
        }
    }
    return okStatus();
}

}  // namespace

const CMPIInstanceFT kInstanceFT = {
    1,
    release,
    clone,
    getProperty,
    getPropertyAt,
    getPropertyCount,
    setProperty,
    getObjectPath,
    setPropertyFilter,
    setObjectPath,
    setPropertyWithOrigin,
};

CMPIInstance* newInstance(const CMPIObjectPath* path, Owner owner) {
    ObjectPathImpl* p = objectPathImpl(path);
    if (p == nullptr) {
        return nullptr;
    }
    CMPIInstance* instance = makeObject<CMPIInstance, InstanceImpl>(&kInstanceFT, owner);
    InstanceImpl* inst = instanceImpl(instance);
    inst->classes = p->classes;
    if (p->classes != nullptr) {
        inst->properties.useNameTable(p->classes->nameTable(p->nameSpace, p->className));
    }
    setObjectPath(instance, path);
    return instance;
}

void PathCache::forget() noexcept {
    if (path != nullptr) {
        handOverObject(path);
        path = nullptr;
    }
}

InstanceImpl* instanceImpl(const CMPIInstance* instance) noexcept {
    return implOf<InstanceImpl>(instance, &kInstanceFT);
}

CMPIInstance* cloneInstance(const CMPIInstance* instance, Owner owner) {
    InstanceImpl* inst = instanceImpl(instance);
    return inst != nullptr ? makeObject<CMPIInstance, InstanceImpl>(&kInstanceFT, owner, *inst) : nullptr;
}

std::string instanceText(const InstanceImpl& instance) {
    std::string text = "instance of " + instance.className + " {\n";
    for (std::size_t i = 0; i < instance.properties.size(); ++i) {
        const NamedValue& property = instance.properties[i];
        text += " ";
        text += property.name();
        text += " = " + keyText(property.data) + ";\n";
    }
    return text + "};\n";
}

}  // namespace orv::host::detail
