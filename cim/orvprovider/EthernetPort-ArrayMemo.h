// Arrays that one request sets on many instances, each built once per
// distinct content. The broker copies an array given as a property value
// (setProperty copies it into the instance), so one array can be the value
// of every instance of the request that carries the same elements.
//
// The memo lives as long as the request: the arrays are the broker's
// objects of that invocation.
#ifndef ORV_ETHERNETPORT_ARRAYMEMO_H
#define ORV_ETHERNETPORT_ARRAYMEMO_H

#include <cstddef>
#include <cstdint>
#include <vector>

#include <cmpi/CmpiArray.h>

namespace EthernetProvider {

// What the key of an array stands for: arrays of different tags never share
// an entry, even with equal keys.
enum class ArrayTag { Uint16Values, LinkModes, Texts };

class ArrayMemo {
public:
    // A request keeps at most this many distinct arrays; arrays beyond them
    // are built each time they are asked for, so a look-up stays short.
    static constexpr std::size_t kCapacity = 32;

    ArrayMemo();
    ArrayMemo(const ArrayMemo&) = delete;
    ArrayMemo& operator=(const ArrayMemo&) = delete;

    // Starts the key of the next look-up: the caller appends its elements.
    std::vector<std::int64_t>& key(ArrayTag tag) {
        tag_ = tag;
        key_.clear();
        return key_;
    }
    const std::vector<std::int64_t>& currentKey() const { return key_; }

    // The array of the key just made; build() makes it the first time.
    template <typename Build>
    CmpiArray find(Build build) {
        if (const CmpiArray* known = lookUp()) {
            return *known;
        }
        CmpiArray made = build();
        keep(made);
        return made;
    }

    std::size_t size() const { return entries_.size(); }

private:
    // The key of an entry is its stretch of keys_.
    struct Entry {
        ArrayTag tag;
        std::size_t keyStart;
        std::size_t keySize;
        CmpiArray array;
    };

    const CmpiArray* lookUp() const;
    void keep(const CmpiArray& array);

    std::vector<Entry> entries_;
    std::vector<std::int64_t> keys_;
    ArrayTag tag_ = ArrayTag::Uint16Values;
    std::vector<std::int64_t> key_;
};

}  // namespace EthernetProvider

#endif
