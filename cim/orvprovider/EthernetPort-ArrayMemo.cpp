// The look-up of the array memo: a short list compared in order. The keys
// of all entries share one vector, so keeping an entry seldom allocates.
#include "EthernetPort-ArrayMemo.h"

#include <algorithm>

namespace EthernetProvider {

namespace {

// Key elements room made at once: enough for the arrays of most requests.
constexpr std::size_t kKeyRoom = 64;

}  // namespace

ArrayMemo::ArrayMemo() {
    entries_.reserve(kCapacity);
    keys_.reserve(kKeyRoom);
    key_.reserve(kKeyRoom / 4);
}

const CmpiArray* ArrayMemo::lookUp() const {
    for (const Entry& entry : entries_) {
        if (entry.tag == tag_ && entry.keySize == key_.size() &&
            std::equal(key_.begin(), key_.end(), keys_.begin() + static_cast<std::ptrdiff_t>(entry.keyStart))) {
            return &entry.array;
        }
    }
    return nullptr;
}

void ArrayMemo::keep(const CmpiArray& array) {
    if (entries_.size() == kCapacity) {
        return;
    }
    entries_.push_back(Entry{tag_, keys_.size(), key_.size(), array});
    keys_.insert(keys_.end(), key_.begin(), key_.end());
}

}  // namespace EthernetProvider
