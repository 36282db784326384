// CmpiObject: common base of the wrappers around broker-owned encapsulated
// objects. Wrappers copy shallowly and never release: the broker frees what it
// allocated when the invocation (or, for provider threads, the thread's unit
// of work) ends.
#ifndef ORV_CMPI_CMPIOBJECT_H
#define ORV_CMPI_CMPIOBJECT_H

#include <cmpi/CmpiDefs.h>
#include <cmpi/CmpiString.h>

class CmpiString;

class CmpiObject {
public:
    CmpiBoolean isNull() const { return enc == nullptr; }
    // The broker's text form of the object (for diagnostics).
    CmpiString toString() const;
    // Whether the broker reports the object to be of the named type, e.g. "CMPIInstance".
    CmpiBoolean isA(const char* typeName) const;

protected:
    CmpiObject() : enc(nullptr) {}
    explicit CmpiObject(const void* e) : enc(const_cast<void*>(e)) {}
    void* enc;
};

#endif
