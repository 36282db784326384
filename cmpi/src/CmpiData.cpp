#include <cmpi/CmpiArray.h>
#include <cmpi/CmpiData.h>
#include <cmpi/CmpiDateTime.h>
#include <cmpi/CmpiInstance.h>
#include <cmpi/CmpiObjectPath.h>
#include <cmpi/CmpiStatus.h>
#include <cmpi/CmpiString.h>

#include <cstring>

const CmpiBooleanData CmpiTrue(1);
const CmpiBooleanData CmpiFalse(0);

namespace {

CMPIValue zeroValue() {
    CMPIValue v;
    std::memset(&v, 0, sizeof v);
    return v;
}

template <class T, class Member>
CMPIValue valueWith(Member CMPIValue::*member, T v) {
    CMPIValue value = zeroValue();
    value.*member = v;
    return value;
}

}  // namespace

CmpiData::CmpiData() : CmpiData(CMPI_null, zeroValue()) { _data.state = CMPI_nullValue; }

CmpiData::CmpiData(CMPIType type, const CMPIValue& value) {
    std::memset(&_data, 0, sizeof _data);
    _data.type = type;
    _data.state = CMPI_goodValue;
    _data.value = value;
}

CmpiData::CmpiData(bool v) : CmpiData(CMPI_boolean, valueWith(&CMPIValue::boolean, CMPIBoolean(v ? 1 : 0))) {}
CmpiData::CmpiData(CMPISint8 v) : CmpiData(CMPI_sint8, valueWith(&CMPIValue::sint8, v)) {}
CmpiData::CmpiData(CMPISint16 v) : CmpiData(CMPI_sint16, valueWith(&CMPIValue::sint16, v)) {}
CmpiData::CmpiData(CMPISint32 v) : CmpiData(CMPI_sint32, valueWith(&CMPIValue::sint32, v)) {}
CmpiData::CmpiData(CMPISint64 v) : CmpiData(CMPI_sint64, valueWith(&CMPIValue::sint64, v)) {}
CmpiData::CmpiData(long v) : CmpiData(static_cast<CMPISint64>(v)) {}
CmpiData::CmpiData(CMPIUint8 v) : CmpiData(CMPI_uint8, valueWith(&CMPIValue::uint8, v)) {}
CmpiData::CmpiData(CMPIUint16 v) : CmpiData(CMPI_uint16, valueWith(&CMPIValue::uint16, v)) {}
CmpiData::CmpiData(CMPIUint32 v) : CmpiData(CMPI_uint32, valueWith(&CMPIValue::uint32, v)) {}
CmpiData::CmpiData(CMPIUint64 v) : CmpiData(CMPI_uint64, valueWith(&CMPIValue::uint64, v)) {}
CmpiData::CmpiData(unsigned long v) : CmpiData(static_cast<CMPIUint64>(v)) {}
CmpiData::CmpiData(CMPIReal32 v) : CmpiData(CMPI_real32, valueWith(&CMPIValue::real32, v)) {}
CmpiData::CmpiData(CMPIReal64 v) : CmpiData(CMPI_real64, valueWith(&CMPIValue::real64, v)) {}

CmpiData::CmpiData(const CmpiString& v) : CmpiData(CMPI_string, valueWith(&CMPIValue::string, v.getEnc())) {
    if (v.isNull()) _data.state = CMPI_nullValue;
}

CmpiData::CmpiData(const char* v) : CmpiData(CMPI_chars, valueWith(&CMPIValue::chars, const_cast<char*>(v))) {
    if (v == nullptr) _data.state = CMPI_nullValue;
}

CmpiData::CmpiData(const CmpiObjectPath& v) : CmpiData(CMPI_ref, valueWith(&CMPIValue::ref, v.getEnc())) {
    if (v.isNull()) _data.state = CMPI_nullValue;
}

CmpiData::CmpiData(const CmpiDateTime& v)
    : CmpiData(CMPI_dateTime, valueWith(&CMPIValue::dateTime, v.getEnc())) {
    if (v.isNull()) _data.state = CMPI_nullValue;
}

CmpiData::CmpiData(const CmpiArray& v) : CmpiData(CMPI_ARRAY, valueWith(&CMPIValue::array, v.getEnc())) {
    if (v.isNull()) {
        _data.state = CMPI_nullValue;
    } else {
        _data.type = static_cast<CMPIType>(v.getSimpleType() | CMPI_ARRAY);
    }
}

CmpiData::CmpiData(const CmpiInstance& v) : CmpiData(CMPI_instance, valueWith(&CMPIValue::inst, v.getEnc())) {
    if (v.isNull()) _data.state = CMPI_nullValue;
}

void CmpiData::requireType(CMPIType type) const { requireType(type, type); }

void CmpiData::requireType(CMPIType type, CMPIType alternative) const {
    if (_data.type != type && _data.type != alternative) {
        throw CmpiStatus(CMPI_RC_ERR_TYPE_MISMATCH);
    }
}

CmpiData::operator CmpiString() const {
    requireType(CMPI_string, CMPI_chars);
    if (_data.type == CMPI_chars) {
        return CmpiString(static_cast<const char*>(_data.value.chars));
    }
    return CmpiString(_data.value.string);
}

CmpiData::operator const char*() const {
    requireType(CMPI_string, CMPI_chars);
    if (_data.type == CMPI_chars) {
        return _data.value.chars;
    }
    return CmpiString(_data.value.string).charPtr();
}

CmpiData::operator CmpiDateTime() const {
    requireType(CMPI_dateTime);
    return CmpiDateTime(_data.value.dateTime);
}

CmpiData::operator CmpiArray() const {
    if ((_data.type & CMPI_ARRAY) == 0) {
        throw CmpiStatus(CMPI_RC_ERR_TYPE_MISMATCH);
    }
    return CmpiArray(_data.value.array);
}

CmpiData::operator CmpiInstance() const {
    requireType(CMPI_instance);
    return CmpiInstance(_data.value.inst);
}

CmpiData::operator CmpiObjectPath() const {
    requireType(CMPI_ref);
    return CmpiObjectPath(_data.value.ref);
}

CmpiData::operator CMPISint8() const { requireType(CMPI_sint8); return _data.value.sint8; }
CmpiData::operator CMPISint16() const { requireType(CMPI_sint16); return _data.value.sint16; }
CmpiData::operator CMPISint32() const { requireType(CMPI_sint32); return _data.value.sint32; }
CmpiData::operator CMPISint64() const { requireType(CMPI_sint64); return _data.value.sint64; }
CmpiData::operator long() const { requireType(CMPI_sint64); return static_cast<long>(_data.value.sint64); }

CmpiData::operator unsigned char() const {
    requireType(CMPI_uint8, CMPI_boolean);
    return _data.type == CMPI_boolean ? _data.value.boolean : _data.value.uint8;
}

CmpiData::operator unsigned short() const {
    requireType(CMPI_uint16, CMPI_char16);
    return _data.type == CMPI_char16 ? _data.value.char16 : _data.value.uint16;
}

CmpiData::operator CMPIUint32() const { requireType(CMPI_uint32); return _data.value.uint32; }
CmpiData::operator CMPIUint64() const { requireType(CMPI_uint64); return _data.value.uint64; }

CmpiData::operator unsigned long() const {
    requireType(CMPI_uint64);
    return static_cast<unsigned long>(_data.value.uint64);
}

CmpiData::operator CMPIReal32() const { requireType(CMPI_real32); return _data.value.real32; }
CmpiData::operator CMPIReal64() const { requireType(CMPI_real64); return _data.value.real64; }

CmpiBooleanData::CmpiBooleanData(CMPIBoolean v) : CmpiData(CMPI_boolean, zeroValue()) {
    _data.value.boolean = v;
}

CmpiCharData::CmpiCharData(CMPIChar16 v) : CmpiData(CMPI_char16, zeroValue()) { _data.value.char16 = v; }
