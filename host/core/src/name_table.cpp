#include "name_table.hpp"

#include "memory.hpp"
#include "names.hpp"
#include "object.hpp"
#include "string.hpp"

namespace orv::host::detail {

namespace {

// A power of two with room for twice `count` names.
std::size_t indexSize(std::size_t count) {
    std::size_t size = 8;
    while (size < count * 2) {
        size *= 2;
    }
    return size;
}

}  // namespace

NameTable::NameTable(const std::vector<std::string>& names, std::vector<std::string> keys)
    : index_(indexSize(names.size()), kNone), order_(names.size() * 2), keys_(std::move(keys)) {
    MemberHome heap(nullptr);
    for (const std::string& name : names) {
        const std::uint32_t hash = hashNoCase(name);
        if (find(name, hash) != kNone) {
            continue;  // declared twice in the class's ancestry: one slot
        }
        const auto slot = static_cast<std::uint32_t>(entries_.size());
        // Parent-owned: a provider releasing the name handed to it changes nothing.
        CMPIString* string = newString(name, Owner::Parent);
        entries_.push_back(Entry{string, static_cast<const char*>(baseOf(string)->hdl), hash,
                                 static_cast<std::uint32_t>(name.size())});
        std::size_t at = hash & (index_.size() - 1);
        while (index_[at] != kNone) {
            at = (at + 1) & (index_.size() - 1);
        }
        index_[at] = slot;
    }
    for (auto& next : order_) {
        next.store(kNone, std::memory_order_relaxed);
    }
    for (const std::string& key : keys_) {
        const std::uint32_t slot = find(key, hashNoCase(key));
        if (slot != kNone) {
            keySlots_.push_back(slot);
        }
    }
}

NameTable::~NameTable() {
    for (Entry& entry : entries_) {
        ObjectBase* string = baseOf(entry.string);
        string->destroy(string);
    }
}

std::uint32_t NameTable::find(std::string_view name, std::uint32_t hash) const noexcept {
    std::size_t at = hash & (index_.size() - 1);
    while (index_[at] != kNone) {
        const Entry& entry = entries_[index_[at]];
        if (entry.hash == hash && equalsNoCase(std::string_view(entry.chars, entry.length), name)) {
            return index_[at];
        }
        at = (at + 1) & (index_.size() - 1);
    }
    return kNone;
}

}  // namespace orv::host::detail
