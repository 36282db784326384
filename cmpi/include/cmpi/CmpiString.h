// CmpiString: a broker string. Copy construction makes a new broker string;
// assignment shares the wrapped one.
#ifndef ORV_CMPI_CMPISTRING_H
#define ORV_CMPI_CMPISTRING_H

#include <cmpi/CmpiDefs.h>

class CmpiString {
public:
    CmpiString() : enc(nullptr) {}
    CmpiString(const char* s);
    CmpiString(const CmpiString& other);
    explicit CmpiString(const CMPIString* s) : enc(const_cast<CMPIString*>(s)) {}
    CmpiString& operator=(const CmpiString& other) = default;

    CmpiBoolean isNull() const { return enc == nullptr; }
    // The characters, or null for a null string.
    const char* charPtr() const;

    // Comparisons treat a null string like the empty text.
    CmpiBoolean equals(const char* s) const;
    CmpiBoolean equals(const CmpiString& s) const;
    CmpiBoolean equalsIgnoreCase(const char* s) const;
    CmpiBoolean equalsIgnoreCase(const CmpiString& s) const;

    CMPIString* getEnc() const { return enc; }

private:
    CMPIString* enc;
};

#endif
