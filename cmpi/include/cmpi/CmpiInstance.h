// CmpiInstance: a broker instance with its properties.
#ifndef ORV_CMPI_CMPIINSTANCE_H
#define ORV_CMPI_CMPIINSTANCE_H

#include <cmpi/CmpiData.h>
#include <cmpi/CmpiObject.h>
#include <cmpi/CmpiObjectPath.h>

class CmpiInstance : public CmpiObject {
public:
    CmpiInstance() = default;
    // A new instance of the path's class in the path's namespace; the broker
    // copies the path's keys into properties.
    CmpiInstance(const CmpiObjectPath& op);
    explicit CmpiInstance(const CMPIInstance* inst) : CmpiObject(inst) {}

    // Whether the instance's class is className or one of its subclasses.
    CmpiBoolean instanceIsA(const char* className) const;

    unsigned int getPropertyCount() const;
    // The property's value; a missing property is returned with isNotFound()
    // set instead of throwing. Other failures throw with the property name as
    // message when the broker gave none.
    CmpiData getProperty(const char* name) const;
    CmpiData getProperty(const int index, CmpiString* name = nullptr) const;
    void setProperty(const char* name, const CmpiData data);

    // Restricts the instance to the named properties: later setProperty calls
    // of other names are dropped and properties already set are filtered. The
    // names in keys stay available for the object path. A null properties
    // list removes no property.
    void setPropertyFilter(const char** properties, const char** keys);

    CmpiObjectPath getObjectPath() const;

    CMPIInstance* getEnc() const { return static_cast<CMPIInstance*>(enc); }
};

#endif
