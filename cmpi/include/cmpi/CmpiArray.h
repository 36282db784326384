// CmpiArray: a broker array of one element type; CmpiArrayIdx is the proxy
// that reads or writes one element.
#ifndef ORV_CMPI_CMPIARRAY_H
#define ORV_CMPI_CMPIARRAY_H

#include <cmpi/CmpiData.h>
#include <cmpi/CmpiObject.h>

class CmpiArray;
class CmpiString;
class CmpiDateTime;
class CmpiInstance;
class CmpiObjectPath;

class CmpiArrayIdx {
public:
    // Stores v at this index; its type must be the array's element type.
    CmpiArrayIdx& operator=(const CmpiData& v);
    CmpiData getData() const;

    operator CmpiString() const;
    operator const char*() const;
    operator CmpiDateTime() const;
    operator CmpiInstance() const;
    operator CmpiObjectPath() const;
    operator CMPISint8() const;
    operator CMPISint16() const;
    operator CMPISint32() const;
    operator CMPISint64() const;
    operator unsigned char() const;
    operator unsigned short() const;
    operator CMPIUint32() const;
    operator CMPIUint64() const;
    operator CMPIReal32() const;
    operator CMPIReal64() const;

private:
    friend class CmpiArray;
    CmpiArrayIdx(const CmpiArray& array, CMPICount index) : array_(array), index_(index) {}
    const CmpiArray& array_;
    CMPICount index_;
};

class CmpiArray : public CmpiObject {
public:
    CmpiArray() = default;
    // A new array of max elements of the element type (without CMPI_ARRAY).
    CmpiArray(CMPICount max, CMPIType elementType);
    explicit CmpiArray(const CMPIArray* a) : CmpiObject(a) {}

    // 0 for a null wrapper.
    CMPICount size() const;
    // The element type (without the CMPI_ARRAY flag).
    CMPIType getSimpleType() const;
    CmpiArrayIdx operator[](int idx) const { return CmpiArrayIdx(*this, static_cast<CMPICount>(idx)); }

    CMPIArray* getEnc() const { return static_cast<CMPIArray*>(enc); }
};

#endif
