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

namespace orv::host::detail {

class Arena;
class NameTable;

// Converts setter input into an owned value, whose member is carved from
// memberHome(). Null `value` (or a NULL object
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
inline bool ownsMember(CMPIType type) noexcept {
    if ((type & CMPI_ARRAY) != 0) {
        return true;
    }
    switch (type) {
    case CMPI_instance:
    case CMPI_ref:
    case CMPI_args:
    case CMPI_filter:
    case CMPI_enumeration:
    case CMPI_string:
    case CMPI_dateTime:
        return true;
    default:
        return false;
    }
}

// One entry of a ValueList. The name is a string object of the list (hdl: its
// characters), handed out as it is by the getters that report names.
struct NamedValue {
    CMPIString* nameString = nullptr;
    std::uint32_t hash = 0;    // hashNoCase of the name
    std::uint32_t length = 0;  // of the name
    std::uint32_t slot = 0;    // in the list's name table, NameTable::kNone when not there
    CMPIData data{};

    std::string_view name() const noexcept {
        return std::string_view(static_cast<const char*>(nameString->hdl), length);
    }
};

// An ordered list of named values with case-insensitive lookup. Its entries,
// names and values live where the list's owner lives (memberHome() when the
// list is made): in an arena's pool, or on the heap.
//
// A list in a pool may use a class's NameTable (an instance's properties): an
// entry of a declared name then carries the table's name string when spelled
// the same, and setting a name is mostly a comparison with the name set in the
// same place last time instead of a hash and a scan.
class ValueList {
public:
    ValueList() noexcept;
    ~ValueList();
    ValueList(const ValueList& other);
    ValueList& operator=(const ValueList&) = delete;

    std::size_t size() const noexcept { return size_; }
    const NamedValue& operator[](std::size_t i) const noexcept { return items_[i]; }
    const NamedValue* find(std::string_view name) const noexcept;
    // Adds, or replaces the value of the same name (the first spelling stays).
    CMPIrc set(std::string_view name, const CMPIValue* value, CMPIType type);
    // Same with an already stored value (taken over).
    void setStored(std::string_view name, CMPIData stored);
    // Same, naming the entry after `source` (an entry of another list).
    void setStored(const NamedValue& source, CMPIData stored);
    // Appends an entry named after `source` whose name the caller knows the
    // list does not hold yet (such as the distinct keys of a new path).
    void appendDistinct(const NamedValue& source, CMPIData stored);
    // Keeps only the entries for which keep(name) is true, in order.
    template <class Pred>
    void keepIf(Pred keep) {
        std::size_t kept = 0;
        for (std::size_t i = 0; i < size_; ++i) {
            if (keep(items_[i].name())) {
                items_[kept++] = items_[i];
            } else {
                freeEntry(items_[i]);
            }
        }
        size_ = kept;
        indexSlots();
    }
    // The arena whose pool holds the entries, nullptr for the heap.
    Arena* home() const noexcept { return home_; }
    // Uses `table` for the names from now on (ignored for a list on the heap).
    // The list must be empty.
    void useNameTable(const NameTable* table);
    const NameTable* nameTable() const noexcept { return table_; }
    // The entry of a slot of the name table, or null.
    const NamedValue* atSlot(std::uint32_t slot) const noexcept;

    // Getter helpers: the value, or rc CMPI_RC_ERR_NO_SUCH_PROPERTY and a null
    // CMPIData with state CMPI_notFound (entries: CMPI_nullValue).
    CMPIData get(std::string_view name, CMPIStatus* rc, CMPIValueState missing) const;
    CMPIData at(CMPICount index, CMPIString** name, CMPIStatus* rc, CMPIValueState missing) const {
        if (index < size_ && home_ != nullptr) [[likely]] {  // the name is handed out as it is
            if (name != nullptr) {
                *name = items_[index].nameString;
            }
            if (rc != nullptr) {
                *rc = CMPIStatus{CMPI_RC_OK, nullptr};
            }
            return items_[index].data;
        }
        return atOtherwise(index, name, rc, missing);
    }

private:
    // at() past the end or for a list on the heap.
    CMPIData atOtherwise(CMPICount index, CMPIString** name, CMPIStatus* rc, CMPIValueState missing) const;
    // The entry named `name`, whose hashNoCase is `hash`, or null.
    NamedValue* findHashed(std::string_view name, std::uint32_t hash) const noexcept;
    // Stores `stored` under `name` (source: an entry of another list with that
    // name, whose name string may be shared).
    void put(std::string_view name, const NamedValue* source, CMPIData stored);
    // The slot of `name` in the name table, or NameTable::kNone.
    // spelledAlike: set when the table spells the name the same.
    std::uint32_t slotOf(std::string_view name, const NamedValue* source, bool& spelledAlike);
    // slotOf when the guess is wrong: the name looked up in the table, which
    // learns its place.
    std::uint32_t lookUpSlot(std::uint32_t place, std::string_view name, const NamedValue* source,
                             bool& spelledAlike);
    NamedValue& append();
    void reserve(std::uint32_t capacity);
    CMPIString* nameFor(std::string_view name, const NamedValue* source, std::uint32_t slot, bool spelledAlike);
    void freeEntry(NamedValue& item) noexcept;
    void indexSlots() noexcept;

    Arena* home_;
    NamedValue* items_ = nullptr;
    std::uint32_t size_ = 0;
    std::uint32_t capacity_ = 0;
    const NameTable* table_ = nullptr;
    std::int32_t* positions_ = nullptr;  // per slot of table_: index in items_, or -1
    std::uint32_t sets_ = 0;             // names set so far: the place of the next one
};

}  // namespace orv::host::detail

namespace orv::host::detail {
class Arena;
// Moves the encapsulated member of a stored value into `arena`; the value
// keeps pointing at it.
void handOverValue(CMPIData& data, Arena& arena) noexcept;
// Makes a Parent-owned object belong to an arena: its pool's when carved from
// one, else the current arena.
void handOverObject(const void* object) noexcept;
}  // namespace orv::host::detail
