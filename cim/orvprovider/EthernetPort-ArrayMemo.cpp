// The look-up of the array memo: a short list compared in order.
#include "EthernetPort-ArrayMemo.h"

namespace EthernetProvider {

const CmpiArray* ArrayMemo::lookUp() const {
    for (const Entry& entry : entries_) {
        if (entry.tag == tag_ && entry.key == key_) {
            return &entry.array;
        }
    }
    return nullptr;
}

}  // namespace EthernetProvider
