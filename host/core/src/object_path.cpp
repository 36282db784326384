#include "object_path.hpp"

#include "string.hpp"
#include "value_text.hpp"

namespace orv::host::detail {

namespace {

constexpr CMPIStatus kInvalid{CMPI_RC_ERR_INVALID_HANDLE, nullptr};

ObjectPathImpl* impl(const CMPIObjectPath* path) { return objectPathImpl(path); }

CMPIStatus release(CMPIObjectPath* path) { return releaseAny(path, &kObjectPathFT); }

CMPIObjectPath* clone(const CMPIObjectPath* path, CMPIStatus* rc) {
    CMPIObjectPath* copy = cloneObjectPath(path, Owner::Caller);
    setRc(rc, copy != nullptr ? CMPI_RC_OK : CMPI_RC_ERR_INVALID_HANDLE);
    return copy;
}

// Setter of one text member.
CMPIStatus setText(CMPIObjectPath* path, std::string ObjectPathImpl::*member, const char* text) {
    ObjectPathImpl* p = impl(path);
    if (p == nullptr) {
        return kInvalid;
    }
    p->*member = text != nullptr ? text : "";
    ++p->changes;
    return okStatus();
}

// Getter of one text member, as a new string of the current arena.
CMPIString* getText(const CMPIObjectPath* path, std::string ObjectPathImpl::*member, CMPIStatus* rc) {
    ObjectPathImpl* p = impl(path);
    if (p == nullptr) {
        setRc(rc, CMPI_RC_ERR_INVALID_HANDLE);
        return nullptr;
    }
    setRc(rc, CMPI_RC_OK);
    return newString(p->*member, Owner::Arena);
}

CMPIStatus setNameSpace(CMPIObjectPath* path, const char* ns) {
    return setText(path, &ObjectPathImpl::nameSpace, ns);
}
CMPIString* getNameSpace(const CMPIObjectPath* path, CMPIStatus* rc) {
    return getText(path, &ObjectPathImpl::nameSpace, rc);
}
CMPIStatus setHostname(CMPIObjectPath* path, const char* host) {
    return setText(path, &ObjectPathImpl::host, host);
}
CMPIString* getHostname(const CMPIObjectPath* path, CMPIStatus* rc) {
    return getText(path, &ObjectPathImpl::host, rc);
}
CMPIStatus setClassName(CMPIObjectPath* path, const char* className) {
    return setText(path, &ObjectPathImpl::className, className);
}
CMPIString* getClassName(const CMPIObjectPath* path, CMPIStatus* rc) {
    return getText(path, &ObjectPathImpl::className, rc);
}

CMPIStatus addKey(CMPIObjectPath* path, const char* name, const CMPIValue* value, CMPIType type) {
    ObjectPathImpl* p = impl(path);
    if (p == nullptr) {
        return kInvalid;
    }
    if (name == nullptr) {
        return CMPIStatus{CMPI_RC_ERR_INVALID_PARAMETER, nullptr};
    }
    ++p->changes;
    return CMPIStatus{p->keys.set(name, value, type), nullptr};
}

CMPIData asKey(CMPIData data) {
    if (data.state == CMPI_goodValue) {
        data.state = CMPI_keyValue;
    }
    return data;
}

CMPIData getKey(const CMPIObjectPath* path, const char* name, CMPIStatus* rc) {
    ObjectPathImpl* p = impl(path);
    if (p == nullptr || name == nullptr) {
        setRc(rc, p == nullptr ? CMPI_RC_ERR_INVALID_HANDLE : CMPI_RC_ERR_INVALID_PARAMETER);
        return nullData();
    }
    return asKey(p->keys.get(name, rc, CMPI_notFound));
}

CMPIData getKeyAt(const CMPIObjectPath* path, CMPICount index, CMPIString** name, CMPIStatus* rc) {
    ObjectPathImpl* p = impl(path);
    if (p == nullptr) {
        setRc(rc, CMPI_RC_ERR_INVALID_HANDLE);
        return nullData();
    }
    return asKey(p->keys.at(index, name, rc, CMPI_notFound));
}

CMPICount getKeyCount(const CMPIObjectPath* path, CMPIStatus* rc) {
    ObjectPathImpl* p = impl(path);
    setRc(rc, p != nullptr ? CMPI_RC_OK : CMPI_RC_ERR_INVALID_HANDLE);
    return p != nullptr ? static_cast<CMPICount>(p->keys.size()) : 0;
}

CMPIStatus copyFrom(CMPIObjectPath* path, const CMPIObjectPath* source, bool withHost) {
    ObjectPathImpl* p = impl(path);
    ObjectPathImpl* s = impl(source);
    if (p == nullptr || s == nullptr) {
        return kInvalid;
    }
    p->nameSpace = s->nameSpace;
    if (withHost) {
        p->host = s->host;
    }
    ++p->changes;
    return okStatus();
}

CMPIStatus setNameSpaceFromObjectPath(CMPIObjectPath* path, const CMPIObjectPath* source) {
    return copyFrom(path, source, false);
}

CMPIStatus setHostAndNameSpaceFromObjectPath(CMPIObjectPath* path, const CMPIObjectPath* source) {
    return copyFrom(path, source, true);
}

// Qualifier lookups go to the class source of the broker that made the path.
CMPIData lookupQualifier(const CMPIObjectPath* path, char kind, std::string element,
                         const char* qualifierName, CMPIStatus* rc) {
    ObjectPathImpl* p = impl(path);
    if (p == nullptr || qualifierName == nullptr) {
        setRc(rc, p == nullptr ? CMPI_RC_ERR_INVALID_HANDLE : CMPI_RC_ERR_INVALID_PARAMETER);
        return nullData();
    }
    if (p->classes == nullptr) {
        setRc(rc, CMPI_RC_ERR_INVALID_CLASS);
        return nullData();
    }
    CMPIrc code = CMPI_RC_OK;
    CMPIData data = p->classes->qualifier(p->nameSpace, p->className, kind, element, qualifierName, &code);
    setRc(rc, code);
    return data;
}

CMPIData getClassQualifier(const CMPIObjectPath* path, const char* qName, CMPIStatus* rc) {
    return lookupQualifier(path, 'c', "", qName, rc);
}

CMPIData getPropertyQualifier(const CMPIObjectPath* path, const char* pName, const char* qName,
                              CMPIStatus* rc) {
    return lookupQualifier(path, 'p', pName != nullptr ? pName : "", qName, rc);
}

CMPIData getMethodQualifier(const CMPIObjectPath* path, const char* mName, const char* qName,
                            CMPIStatus* rc) {
    return lookupQualifier(path, 'm', mName != nullptr ? mName : "", qName, rc);
}

CMPIData getParameterQualifier(const CMPIObjectPath* path, const char* mName, const char* pName,
                               const char* qName, CMPIStatus* rc) {
    std::string element = std::string(mName != nullptr ? mName : "") + "." + (pName != nullptr ? pName : "");
    return lookupQualifier(path, 'a', element, qName, rc);
}

CMPIString* toString(const CMPIObjectPath* path, CMPIStatus* rc) {
    ObjectPathImpl* p = impl(path);
    if (p == nullptr) {
        setRc(rc, CMPI_RC_ERR_INVALID_HANDLE);
        return nullptr;
    }
    setRc(rc, CMPI_RC_OK);
    return newString(objectPathText(*p), Owner::Arena);
}

}  // namespace

const CMPIObjectPathFT kObjectPathFT = {
    1,
    release,
    clone,
    setNameSpace,
    getNameSpace,
    setHostname,
    getHostname,
    setClassName,
    getClassName,
    addKey,
    getKey,
    getKeyAt,
    getKeyCount,
    setNameSpaceFromObjectPath,
    setHostAndNameSpaceFromObjectPath,
    getClassQualifier,
    getPropertyQualifier,
    getMethodQualifier,
    getParameterQualifier,
    toString,
};

CMPIObjectPath* newObjectPath(std::string_view ns, std::string_view className,
                              const ClassSource* classes, Owner owner) {
    CMPIObjectPath* path = makeObject<CMPIObjectPath, ObjectPathImpl>(&kObjectPathFT, owner);
    ObjectPathImpl* p = objectPathImpl(path);
    p->nameSpace = ns;
    p->className = className;
    p->classes = classes;
    return path;
}

ObjectPathImpl* objectPathImpl(const CMPIObjectPath* path) noexcept {
    return implOf<ObjectPathImpl>(path, &kObjectPathFT);
}

CMPIObjectPath* cloneObjectPath(const CMPIObjectPath* path, Owner owner) {
    ObjectPathImpl* p = objectPathImpl(path);
    return p != nullptr ? makeObject<CMPIObjectPath, ObjectPathImpl>(&kObjectPathFT, owner, *p) : nullptr;
}

std::string objectPathText(const ObjectPathImpl& path) {
    std::string text;
    if (!path.host.empty()) {
        text = "//" + path.host + "/";
    }
    if (!path.nameSpace.empty()) {
        text += path.nameSpace + ":";
    }
    text += path.className;
    for (std::size_t i = 0; i < path.keys.size(); ++i) {
        text += i == 0 ? "." : ",";
        text += path.keys[i].name();
        text += "=" + keyText(path.keys[i].data);
    }
    return text;
}

}  // namespace orv::host::detail
