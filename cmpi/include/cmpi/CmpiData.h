// CmpiData: one typed CIM value (type, state, value), as properties, keys,
// arguments, context entries and array elements carry it.
//
// Construction picks the CIM type from the C++ type. Booleans and char16 have
// their own subclasses (CmpiBooleanData, CmpiCharData) because CMPIBoolean and
// CMPIChar16 are the same C++ types as CMPIUint8 and CMPIUint16; a C++ bool
// also gives a boolean. Conversions check the type exactly, never the state
// (test isNullValue() / isNotFound() first), and throw
// CmpiStatus(CMPI_RC_ERR_TYPE_MISMATCH) on any other type.
#ifndef ORV_CMPI_CMPIDATA_H
#define ORV_CMPI_CMPIDATA_H

#include <cmpi/CmpiDefs.h>

class CmpiString;
class CmpiObjectPath;
class CmpiDateTime;
class CmpiArray;
class CmpiInstance;

class CmpiData {
public:
    // A null value of no type.
    CmpiData();
    // Wraps a value the broker handed out.
    explicit CmpiData(const CMPIData& data) : _data(data) {}

    CmpiData(bool v);
    CmpiData(CMPISint8 v);
    CmpiData(CMPISint16 v);
    CmpiData(CMPISint32 v);
    CmpiData(CMPISint64 v);
    CmpiData(long v);
    CmpiData(CMPIUint8 v);
    CmpiData(CMPIUint16 v);
    CmpiData(CMPIUint32 v);
    CmpiData(CMPIUint64 v);
    CmpiData(unsigned long v);
    CmpiData(CMPIReal32 v);
    CmpiData(CMPIReal64 v);
    // A string value holding the broker string.
    CmpiData(const CmpiString& v);
    // A chars value pointing at the caller's text (not copied).
    CmpiData(const char* v);
    // A reference; null when the path wrapper is null.
    CmpiData(const CmpiObjectPath& v);
    CmpiData(const CmpiDateTime& v);
    // An array value of the array's element type.
    CmpiData(const CmpiArray& v);
    // An embedded instance.
    CmpiData(const CmpiInstance& v);

    operator CmpiString() const;
    // Accepts string and chars values.
    operator const char*() const;
    operator CmpiDateTime() const;
    operator CmpiArray() const;
    operator CmpiInstance() const;
    operator CmpiObjectPath() const;
    operator CMPISint8() const;
    operator CMPISint16() const;
    operator CMPISint32() const;
    operator CMPISint64() const;
    operator long() const;
    // Accepts uint8 and boolean values.
    operator unsigned char() const;
    // Accepts uint16 and char16 values.
    operator unsigned short() const;
    operator CMPIUint32() const;
    operator CMPIUint64() const;
    operator unsigned long() const;
    operator CMPIReal32() const;
    operator CMPIReal64() const;

    int isNullValue() const { return (_data.state & CMPI_nullValue) != 0; }
    int isNotFound() const { return (_data.state & CMPI_notFound) != 0; }
    CMPIType getType() const { return _data.type; }
    // The raw value, for handing to the broker.
    const CMPIData& getEncData() const { return _data; }

protected:
    CmpiData(CMPIType type, const CMPIValue& value);
    void requireType(CMPIType type) const;
    void requireType(CMPIType type, CMPIType alternative) const;

    CMPIData _data;
};

// A boolean value.
class CmpiBooleanData : public CmpiData {
public:
    CmpiBooleanData(CMPIBoolean v);
};

// A char16 value.
class CmpiCharData : public CmpiData {
public:
    CmpiCharData(CMPIChar16 v);
};

extern const CmpiBooleanData CmpiTrue;
extern const CmpiBooleanData CmpiFalse;

#endif
