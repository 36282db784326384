// A sequence of owned pointers: destruction deletes every element through its
// virtual destructor and then empties the sequence. Not copyable (that would
// delete twice); a plain std::vector<T*> copy of the pointers is the way to
// hand the elements to code that does not own them.
#pragma once

#include <utility>
#include <vector>

namespace TmkCtl {
namespace Util {

template <typename T>
class AutoVector : public std::vector<T*> {
public:
    AutoVector() = default;
    AutoVector(std::vector<T*>&& items) : std::vector<T*>(std::move(items)) {}  // NOLINT: implicit on purpose
    AutoVector(const AutoVector&) = delete;
    AutoVector& operator=(const AutoVector&) = delete;

    AutoVector& operator=(std::vector<T*>&& items)
    {
        DeleteAll();
        std::vector<T*>::operator=(std::move(items));
        return *this;
    }

    ~AutoVector() { DeleteAll(); }

    // Deletes every element and empties the sequence.
    void DeleteAll()
    {
        for (T* item : *this) {
            delete item;
        }
        std::vector<T*>::clear();
    }
};

} // namespace Util
} // namespace TmkCtl
