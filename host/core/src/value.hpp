// Values held inside broker objects (properties, keys, arguments, context
// entries, array elements).
//
// A stored CMPIData owns its encapsulated member (string, instance, path,
// array, ...) as a Parent-owned copy. Setters follow sfcb's conventions:
// CMPI_chars takes the value pointer itself as the char*, and is stored and
// reported back as CMPI_string. Scalars are read with the width of their type
// only, so a pointer to a one-byte variable is a valid CMPI_uint8 value.
#pragma once

#include <cmpidt.h>
#include <cmpift.h>

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace orv::host::detail {

// Converts setter input into an owned value. Null `value` (or a NULL object
// pointer) gives a null value of the type. Answers CMPI_RC_ERR_INVALID_DATA_TYPE
// for an unknown type code, CMPI_RC_ERR_INVALID_HANDLE for an object that is not
// a live broker object of the type, CMPI_RC_ERR_TYPE_MISMATCH for an array whose
// element type contradicts `type`.
CMPIrc storeValue(CMPIData& out, const CMPIValue* value, CMPIType type);
// Deep copy of a stored value.
void copyValue(CMPIData& out, const CMPIData& in);
// Frees the encapsulated member of a stored value.
void freeValue(CMPIData& data) noexcept;
// Hands the encapsulated member of a stored value to the current arena, so
// pointers a provider read from it stay valid until the invocation ends.
void retireValue(CMPIData& data) noexcept;
// The type code a CMPI_chars input is stored as.
inline CMPIType storedType(CMPIType type) noexcept {
    if (type == CMPI_chars) {
        return CMPI_string;
    }
    if (type == CMPI_charsA) {
        return CMPI_stringA;
    }
    return type;
}
bool isKnownType(CMPIType type) noexcept;
// Whether a stored value of this type owns an encapsulated member.
bool ownsMember(CMPIType type) noexcept;

struct NamedValue {
    std::string name;
    std::uint32_t hash = 0;
    CMPIData data{};
};

// An ordered list of named values with case-insensitive lookup.
class ValueList {
public:
    ValueList() = default;
    ~ValueList();
    ValueList(const ValueList& other);
    ValueList& operator=(const ValueList&) = delete;

    std::size_t size() const noexcept { return items_.size(); }
    const NamedValue& operator[](std::size_t i) const noexcept { return items_[i]; }
    const NamedValue* find(std::string_view name) const noexcept;
    // Adds, or replaces the value of the same name (the first spelling stays).
    CMPIrc set(std::string_view name, const CMPIValue* value, CMPIType type);
    // Same with an already stored value (taken over).
    void setStored(std::string_view name, CMPIData stored);
    // Keeps only the entries for which keep(name) is true, in order.
    template <class Pred>
    void keepIf(Pred keep) {
        std::vector<NamedValue> kept;
        for (NamedValue& item : items_) {
            if (keep(item.name)) {
                kept.push_back(std::move(item));
            } else {
                freeValue(item.data);
            }
        }
        items_ = std::move(kept);
    }

    // Getter helpers: the value, or rc CMPI_RC_ERR_NO_SUCH_PROPERTY and a null
    // CMPIData with state CMPI_notFound (entries: CMPI_nullValue).
    CMPIData get(std::string_view name, CMPIStatus* rc, CMPIValueState missing) const;
    CMPIData at(CMPICount index, CMPIString** name, CMPIStatus* rc, CMPIValueState missing) const;

private:
    // The entry named `name`, whose hashNoCase is `hash`, or null.
    const NamedValue* findHashed(std::string_view name, std::uint32_t hash) const noexcept;

    std::vector<NamedValue> items_;
};

}  // namespace orv::host::detail

namespace orv::host::detail {
class Arena;
// Moves the encapsulated member of a stored value into `arena`; the value
// keeps pointing at it.
void handOverValue(CMPIData& data, Arena& arena) noexcept;
}  // namespace orv::host::detail
