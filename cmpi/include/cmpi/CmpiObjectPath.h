// CmpiObjectPath: a broker object path (host name, namespace, class name and
// key bindings).
#ifndef ORV_CMPI_CMPIOBJECTPATH_H
#define ORV_CMPI_CMPIOBJECTPATH_H

#include <cmpi/CmpiData.h>
#include <cmpi/CmpiObject.h>
#include <cmpi/CmpiString.h>

class CmpiObjectPath : public CmpiObject {
public:
    CmpiObjectPath() = default;
    // A new path in namespace ns for class cls (either may be null).
    CmpiObjectPath(const char* ns, const char* cls);
    CmpiObjectPath(const CmpiString& ns, const char* cls);
    explicit CmpiObjectPath(const CMPIObjectPath* op) : CmpiObject(op) {}

    // Whether the class of this path is className or one of its subclasses,
    // as the broker's class repository says.
    CmpiBoolean classPathIsA(const char* className) const;

    CmpiString getHostname() const;
    void setHostname(const char* hn);
    void setHostname(const CmpiString& hn) { setHostname(hn.charPtr()); }
    CmpiString getNameSpace() const;
    void setNameSpace(const char* ns);
    void setNameSpace(const CmpiString& ns) { setNameSpace(ns.charPtr()); }
    CmpiString getClassName() const;
    void setClassName(const char* cn);
    void setClassName(const CmpiString& cn) { setClassName(cn.charPtr()); }

    unsigned int getKeyCount() const;
    // The key's value; a missing key throws CmpiStatus(CMPI_RC_ERR_NOT_FOUND).
    CmpiData getKey(const char* name) const;
    // The key at index; its name is stored in *name when given.
    CmpiData getKey(const int index, CmpiString* name = nullptr) const;
    // Adds the key, or replaces its value.
    void setKey(const char* name, const CmpiData data);

    // Equal paths name the same object: the same namespace and host name, the
    // class name ignoring case, and the same key bindings, key names compared
    // ignoring case and in any order. A null path equals only a null path.
    bool operator==(const CmpiObjectPath& other) const;
    bool operator!=(const CmpiObjectPath& other) const { return !(*this == other); }

    CMPIObjectPath* getEnc() const { return static_cast<CMPIObjectPath*>(enc); }
};

#endif
