#include "value.hpp"

#include <algorithm>
#include <cstring>

#include "array.hpp"
#include "memory.hpp"
#include "args.hpp"
#include "datetime.hpp"
#include "enumeration.hpp"
#include "instance.hpp"
#include "name_table.hpp"
#include "names.hpp"
#include "object_path.hpp"
#include "object.hpp"
#include "select_exp.hpp"
#include "string.hpp"

namespace orv::host::detail {

namespace {

// Width of a scalar type's value, 0 for anything that is not a plain scalar.
inline std::size_t scalarWidth(CMPIType type) noexcept {
    switch (type) {
    case CMPI_boolean:
    case CMPI_uint8:
    case CMPI_sint8:
        return 1;
    case CMPI_char16:
    case CMPI_uint16:
    case CMPI_sint16:
        return 2;
    case CMPI_uint32:
    case CMPI_sint32:
    case CMPI_real32:
        return 4;
    case CMPI_uint64:
    case CMPI_sint64:
    case CMPI_real64:
        return 8;
    default:
        return 0;
    }
}

}  // namespace

namespace {

// A Parent-owned copy of an encapsulated input object, or nullptr when the
// object is not one of ours of that type.
void* copyMember(CMPIType type, const void* object) {
    if ((type & CMPI_ARRAY) != 0) {
        return cloneArray(static_cast<const CMPIArray*>(object), Owner::Parent);
    }
    switch (type) {
    case CMPI_instance:
        return cloneInstance(static_cast<const CMPIInstance*>(object), Owner::Parent);
    case CMPI_ref:
        return cloneObjectPath(static_cast<const CMPIObjectPath*>(object), Owner::Parent);
    case CMPI_args:
        return cloneArgs(static_cast<const CMPIArgs*>(object), Owner::Parent);
    case CMPI_filter:
        return cloneSelectExp(static_cast<const CMPISelectExp*>(object), Owner::Parent);
    case CMPI_enumeration:
        return cloneEnumeration(static_cast<const CMPIEnumeration*>(object), Owner::Parent);
    case CMPI_string:
        return memberString(static_cast<const CMPIString*>(object));
    case CMPI_dateTime:
        return cloneDateTime(static_cast<const CMPIDateTime*>(object), Owner::Parent);
    default:
        return nullptr;
    }
}

// Every CMPIValue member that is an object pointer sits at offset 0.
const void* memberPointer(const CMPIValue& value) noexcept { return value.inst; }

CMPIrc checkArrayType(CMPIType type, const void* array) noexcept {
    CMPIType element = storedType(static_cast<CMPIType>(type & ~CMPI_ARRAY));
    CMPIType held = arrayElementType(static_cast<const CMPIArray*>(array));
    return held == element ? CMPI_RC_OK : CMPI_RC_ERR_TYPE_MISMATCH;
}

}  // namespace

bool isKnownType(CMPIType type) noexcept {
    if (scalarWidth(type) != 0) {
        return true;
    }
    if ((type & CMPI_ARRAY) != 0) {
        CMPIType element = static_cast<CMPIType>(type & ~CMPI_ARRAY);
        return element != CMPI_null && (element & CMPI_ARRAY) == 0 && isKnownType(element);
    }
    switch (type) {
    case CMPI_null:
    case CMPI_instance:
    case CMPI_ref:
    case CMPI_args:
    case CMPI_class:
    case CMPI_filter:
    case CMPI_enumeration:
    case CMPI_string:
    case CMPI_chars:
    case CMPI_dateTime:
    case CMPI_ptr:
    case CMPI_charsptr:
        return true;
    default:
        return false;
    }
}

namespace {

// storeValue for CMPI_chars (the value pointer is the text) and CMPI_string.
CMPIrc storeText(CMPIData& out, const CMPIValue* value, CMPIType type) {
    const void* member = value == nullptr      ? nullptr
                         : type == CMPI_chars ? static_cast<const void*>(value)
                                              : static_cast<const void*>(value->string);
    if (member == nullptr) {
        out.state = CMPI_nullValue;
        return CMPI_RC_OK;
    }
    out.value.string = type == CMPI_chars ? newString(static_cast<const char*>(member), Owner::Parent)
                                          : memberString(static_cast<const CMPIString*>(member));
    return out.value.string != nullptr ? CMPI_RC_OK : CMPI_RC_ERR_INVALID_HANDLE;
}

}  // namespace

namespace {

// Copies a scalar of `width` bytes (1, 2, 4 or 8) in one fixed-size move. The
// input may be any variable of the type, aligned for that type only.
inline void copyScalar(CMPIValue& to, const void* from, std::size_t width) noexcept {
    switch (width) {
    case 1: std::memcpy(&to, from, 1); break;
    case 2: std::memcpy(&to, from, 2); break;
    case 4: std::memcpy(&to, from, 4); break;
    default: std::memcpy(&to, from, 8); break;
    }
}

// storeValue for everything but scalars and texts, kept apart so that the
// common cases pay for no more than they use.
[[gnu::noinline]] CMPIrc storeObject(CMPIData& out, const CMPIValue* value, CMPIType type) {
    if (!isKnownType(type)) {
        out = CMPIData{};
        return CMPI_RC_ERR_INVALID_DATA_TYPE;
    }
    if (type == CMPI_null || value == nullptr) {
        out.state = CMPI_nullValue;
        return CMPI_RC_OK;
    }
    if (!ownsMember(type)) {  // class, ptr, charsptr: kept as given
        std::memcpy(&out.value, value, sizeof(void*));
        if (type == CMPI_ptr || type == CMPI_charsptr) {
            out.value.dataPtr = value->dataPtr;
        }
        return CMPI_RC_OK;
    }
    const void* member = memberPointer(*value);
    if (member == nullptr) {
        out.state = CMPI_nullValue;
        return CMPI_RC_OK;
    }
    if ((type & CMPI_ARRAY) != 0 && arrayElementType(static_cast<const CMPIArray*>(member)) != CMPI_null) {
        if (CMPIrc rc = checkArrayType(type, member); rc != CMPI_RC_OK) {
            return rc;
        }
    }
    void* copy = copyMember(type, member);
    if (copy == nullptr) {
        return CMPI_RC_ERR_INVALID_HANDLE;
    }
    out.value.inst = static_cast<CMPIInstance*>(copy);
    return CMPI_RC_OK;
}

}  // namespace

CMPIrc storeValue(CMPIData& out, const CMPIValue* value, CMPIType type) {
    out = CMPIData{};
    out.type = storedType(type);
    out.state = CMPI_goodValue;
    if (std::size_t width = scalarWidth(type); width != 0) {  // the common case first
        if (value == nullptr) {
            out.state = CMPI_nullValue;
        } else {
            copyScalar(out.value, value, width);
        }
        return CMPI_RC_OK;
    }
    if (type == CMPI_chars || type == CMPI_string) {  // then texts
        return storeText(out, value, type);
    }
    return storeObject(out, value, type);
}

void copyValue(CMPIData& out, const CMPIData& in) {
    out = in;
    if (ownsMember(in.type) && in.state == CMPI_goodValue && in.value.inst != nullptr) {
        out.value.inst = static_cast<CMPIInstance*>(copyMember(in.type, in.value.inst));
    }
}

void freeValue(CMPIData& data) noexcept {
    if (ownsMember(data.type) && data.value.inst != nullptr && data.state == CMPI_goodValue &&
        !isPoolString(data.value.inst)) {
        ObjectBase* member = baseOf(data.value.inst);
        member->destroy(member);
    }
    data.value.inst = nullptr;
}

void retireValue(CMPIData& data) noexcept {
    handOverValue(data, currentArena());
    data.value.inst = nullptr;
}

namespace {

// A Parent-owned string holding an entry's name, carved from the list's home.
CMPIString* nameStringOf(std::string_view name, Arena* home) {
    MemberHome members(home);
    return newString(name, Owner::Parent);
}

}  // namespace

ValueList::ValueList() noexcept : home_(memberHome()) {}

ValueList::~ValueList() {
    for (std::uint32_t i = 0; i < size_; ++i) {
        // In a pool, an entry without a member (or with a pool string) has nothing to free.
        if (home_ == nullptr || (ownsMember(items_[i].data.type) && items_[i].data.type != CMPI_string)) {
            freeEntry(items_[i]);
        }
    }
    freeObjectMemory(items_, home_);
    freeObjectMemory(positions_, home_);
}

// Names carved from the same pool are shared: that memory stays until the
// pool goes, whichever list goes first. Values are always copied.
ValueList::ValueList(const ValueList& other) : home_(memberHome()) {
    useNameTable(other.table_);
    for (std::uint32_t i = 0; i < other.size_; ++i) {
        const NamedValue& item = other.items_[i];
        CMPIData copy{};
        copyValue(copy, item.data);
        setStored(item, copy);
    }
}

void ValueList::useNameTable(const NameTable* table) {
    if (home_ == nullptr || table == nullptr || size_ != 0) {
        return;
    }
    table_ = table;
    positions_ = static_cast<std::int32_t*>(allocateObject(home_, sizeof(std::int32_t) * table->size()));
    // Room for the declared names from the start (up to a bound: a list in a pool
    // never gives back what it outgrows).
    constexpr std::uint32_t kReservedNames = 64;
    if (const std::uint32_t room = std::min(table->size(), kReservedNames); room > capacity_) {
        reserve(room);
    }
    indexSlots();
}

void ValueList::indexSlots() noexcept {
    if (table_ == nullptr) {
        return;
    }
    for (std::uint32_t slot = 0; slot < table_->size(); ++slot) {
        positions_[slot] = -1;
    }
    for (std::uint32_t i = 0; i < size_; ++i) {
        if (items_[i].slot != NameTable::kNone) {
            positions_[items_[i].slot] = static_cast<std::int32_t>(i);
        }
    }
}

const NamedValue* ValueList::atSlot(std::uint32_t slot) const noexcept {
    if (table_ == nullptr || slot >= table_->size() || positions_[slot] < 0) {
        return nullptr;
    }
    return &items_[positions_[slot]];
}

void ValueList::freeEntry(NamedValue& item) noexcept {
    freeValue(item.data);
    if (home_ == nullptr) {
        ObjectBase* name = baseOf(item.nameString);
        name->destroy(name);
    }
}

void ValueList::reserve(std::uint32_t capacity) {
    auto* items = static_cast<NamedValue*>(allocateObject(home_, capacity * sizeof(NamedValue)));
    for (std::uint32_t i = 0; i < size_; ++i) {
        items[i] = items_[i];
    }
    freeObjectMemory(items_, home_);
    items_ = items;
    capacity_ = capacity;
}

NamedValue& ValueList::append() {
    if (size_ == capacity_) {
        reserve(capacity_ == 0 ? 8 : capacity_ * 2);
    }
    items_[size_] = NamedValue{};
    return items_[size_++];
}

NamedValue* ValueList::findHashed(std::string_view name, std::uint32_t hash) const noexcept {
    for (std::uint32_t i = 0; i < size_; ++i) {
        NamedValue& item = items_[i];
        if (item.hash == hash && equalsNoCase(item.name(), name)) {
            return &item;
        }
    }
    return nullptr;
}

const NamedValue* ValueList::find(std::string_view name) const noexcept {
    const std::uint32_t hash = hashNoCase(name);
    if (table_ != nullptr) {
        if (const std::uint32_t slot = table_->find(name, hash); slot != NameTable::kNone) {
            return atSlot(slot);
        }
    }
    return findHashed(name, hash);
}

CMPIrc ValueList::set(std::string_view name, const CMPIValue* value, CMPIType type) {
    CMPIData stored{};
    CMPIrc rc = CMPI_RC_OK;
    {
        MemberHome members(home_);
        rc = storeValue(stored, value, type);
    }
    if (rc == CMPI_RC_OK) {
        put(name, nullptr, stored);
    }
    return rc;
}

void ValueList::setStored(std::string_view name, CMPIData stored) { put(name, nullptr, stored); }

void ValueList::setStored(const NamedValue& source, CMPIData stored) { put(source.name(), &source, stored); }

void ValueList::appendDistinct(const NamedValue& source, CMPIData stored) {
    if (table_ != nullptr) {  // the table's slots must be looked up
        setStored(source, stored);
        return;
    }
    CMPIString* nameString = nameFor(source.name(), &source, NameTable::kNone, false);
    NamedValue& item = append();
    item.nameString = nameString;
    item.hash = source.hash;
    item.length = source.length;
    item.slot = NameTable::kNone;
    item.data = stored;
}

// Names are mostly set in the same order on every instance of a class: the
// name set in this place last time is tried first, by its exact spelling.
inline std::uint32_t ValueList::slotOf(std::string_view name, const NamedValue* source, bool& spelledAlike) {
    const std::uint32_t place = sets_++;
    const std::uint32_t slot = table_->guess(place);
    if (slot != NameTable::kNone && table_->spelledAs(slot, name)) [[likely]] {
        spelledAlike = true;
        return slot;
    }
    return lookUpSlot(place, name, source, spelledAlike);
}

std::uint32_t ValueList::lookUpSlot(std::uint32_t place, std::string_view name, const NamedValue* source,
                                    bool& spelledAlike) {
    const std::uint32_t slot = table_->find(name, source != nullptr ? source->hash : hashNoCase(name));
    if (slot != NameTable::kNone) {
        table_->learn(place, slot);
        spelledAlike = table_->spelledAs(slot, name);
    }
    return slot;
}

// The name string of a new entry: the table's when spelled the same, the
// source's when it comes from the same pool, else a copy.
inline CMPIString* ValueList::nameFor(std::string_view name, const NamedValue* source, std::uint32_t slot,
                                      bool spelledAlike) {
    if (spelledAlike) {
        return table_->nameString(slot);
    }
    if (source != nullptr && home_ != nullptr && baseOf(source->nameString)->home == home_) {
        return source->nameString;
    }
    return nameStringOf(name, home_);
}

void ValueList::put(std::string_view name, const NamedValue* source, CMPIData stored) {
    std::uint32_t slot = NameTable::kNone;
    bool spelledAlike = false;
    NamedValue* found = nullptr;
    std::uint32_t hash = 0;
    if (table_ != nullptr && (slot = slotOf(name, source, spelledAlike)) != NameTable::kNone) {
        hash = table_->hash(slot);
        found = positions_[slot] >= 0 ? &items_[positions_[slot]] : nullptr;
    } else {
        hash = source != nullptr ? source->hash : hashNoCase(name);
        found = findHashed(name, hash);
    }
    if (found != nullptr) {
        retireValue(found->data);
        found->data = stored;
        return;
    }
    CMPIString* nameString = nameFor(name, source, slot, spelledAlike);
    NamedValue& item = append();
    item.nameString = nameString;
    item.hash = hash;
    item.length = static_cast<std::uint32_t>(name.size());
    item.slot = slot;
    item.data = stored;
    if (slot != NameTable::kNone) {
        positions_[slot] = static_cast<std::int32_t>(size_ - 1);
    }
}

CMPIData ValueList::get(std::string_view name, CMPIStatus* rc, CMPIValueState missing) const {
    const NamedValue* item = find(name);
    if (item == nullptr) {
        setRc(rc, CMPI_RC_ERR_NO_SUCH_PROPERTY);
        return nullData(missing);
    }
    setRc(rc, CMPI_RC_OK);
    return item->data;
}

// A name carved from a pool is handed out as it is (it lasts as long as the
// pool, at least the invocation); a list on the heap hands out a copy that
// belongs to the current arena, since the list may be released first.
CMPIData ValueList::atOtherwise(CMPICount index, CMPIString** name, CMPIStatus* rc, CMPIValueState missing) const {
    if (index >= size_) {
        setRc(rc, CMPI_RC_ERR_NO_SUCH_PROPERTY);
        if (name != nullptr) {
            *name = nullptr;
        }
        return nullData(missing);
    }
    const NamedValue& item = items_[index];
    if (name != nullptr) {
        *name = home_ != nullptr ? item.nameString : newString(item.name(), Owner::Arena);
    }
    setRc(rc, CMPI_RC_OK);
    return item.data;
}

}  // namespace orv::host::detail

namespace orv::host::detail {

// A member carved from a pool joins that pool's arena, which it must not
// outlive; one from the heap joins `arena`. A pool's string stays as it is: it
// may be shared, and its memory goes with the pool.
void handOverValue(CMPIData& data, Arena& arena) noexcept {
    if (ownsMember(data.type) && data.value.inst != nullptr && data.state == CMPI_goodValue &&
        !isPoolString(data.value.inst)) {
        ObjectBase* member = baseOf(data.value.inst);
        member->owner = Owner::Arena;
        (member->home != nullptr ? *member->home : arena).adopt(member);
    }
}

void handOverObject(const void* object) noexcept {
    ObjectBase* base = baseOf(object);
    base->owner = Owner::Arena;
    (base->home != nullptr ? *base->home : currentArena()).adopt(base);
}

}  // namespace orv::host::detail
