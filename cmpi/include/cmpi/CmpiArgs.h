// CmpiArgs: the named arguments of a method call.
#ifndef ORV_CMPI_CMPIARGS_H
#define ORV_CMPI_CMPIARGS_H

#include <cmpi/CmpiData.h>
#include <cmpi/CmpiObject.h>

class CmpiArgs : public CmpiObject {
public:
    // A new, empty argument list.
    CmpiArgs();
    explicit CmpiArgs(const CMPIArgs* a) : CmpiObject(a) {}

    unsigned int getArgCount() const;
    // A missing argument is returned with isNotFound() set.
    CmpiData getArg(const char* name) const;
    CmpiData getArg(const int index, CmpiString* name = nullptr) const;
    void setArg(const char* name, const CmpiData& data);

    CMPIArgs* getEnc() const { return static_cast<CMPIArgs*>(enc); }
};

#endif
