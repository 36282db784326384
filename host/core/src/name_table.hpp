// The property names of one class, made once per class and shared by all its
// instances: a string object per name (what getPropertyAt hands out), a
// case-insensitive index, the key properties, and the order in which
// providers set the names, remembered as a guess that spares the lookup.
#pragma once

#include <cmpidt.h>

#include <atomic>
#include <cstdint>
#include <cstring>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

namespace orv::host::detail {

class NameTable {
public:
    static constexpr std::uint32_t kNone = UINT32_MAX;

    // names: every property of the class, inherited ones included; keys: the
    // key properties among them.
    NameTable(const std::vector<std::string>& names, std::vector<std::string> keys);
    ~NameTable();
    NameTable(const NameTable&) = delete;
    NameTable& operator=(const NameTable&) = delete;

    std::uint32_t size() const noexcept { return static_cast<std::uint32_t>(entries_.size()); }
    CMPIString* nameString(std::uint32_t slot) const noexcept { return entries_[slot].string; }
    std::uint32_t hash(std::uint32_t slot) const noexcept { return entries_[slot].hash; }
    std::uint32_t length(std::uint32_t slot) const noexcept { return entries_[slot].length; }
    // Whether the slot's name is spelled exactly `name`.
    bool spelledAs(std::uint32_t slot, std::string_view name) const noexcept {
        const Entry& entry = entries_[slot];
        return entry.length == name.size() && std::memcmp(entry.chars, name.data(), name.size()) == 0;
    }
    // The slot of `name` in any case (hash: its hashNoCase), or kNone.
    std::uint32_t find(std::string_view name, std::uint32_t hash) const noexcept;

    // The slot whose name was the n-th set on the last instance, or kNone.
    std::uint32_t guess(std::uint32_t n) const noexcept {
        return n < order_.size() ? order_[n].load(std::memory_order_relaxed) : kNone;
    }
    void learn(std::uint32_t n, std::uint32_t slot) const noexcept {
        if (n < order_.size()) {
            order_[n].store(slot, std::memory_order_relaxed);
        }
    }

    const std::vector<std::string>& keyNames() const noexcept { return keys_; }
    // The slots of keyNames(), in their order.
    const std::vector<std::uint32_t>& keySlots() const noexcept { return keySlots_; }

private:
    struct Entry {
        CMPIString* string;
        const char* chars;  // the string's
        std::uint32_t hash;
        std::uint32_t length;
    };

    std::vector<Entry> entries_;
    std::vector<std::uint32_t> index_;  // open addressing over entries_, kNone when empty
    mutable std::vector<std::atomic<std::uint32_t>> order_;  // a guess: shared by threads, never wrong to read
    std::vector<std::string> keys_;
    std::vector<std::uint32_t> keySlots_;
};

}  // namespace orv::host::detail
