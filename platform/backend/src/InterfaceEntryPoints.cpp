// The interface-address list, answered by the selected substitute.
#include <cerrno>

#include "orv/platform/InterfaceAddresses.h"
#include "orv/platform/backend/Selector.h"

extern "C" {

int OrvHost_GetIfAddrs(struct ifaddrs** list)
{
    if (list == nullptr) {
        errno = EINVAL;
        return -1;
    }
    *list = nullptr;
    try {
        orv::platform::Backend& backend = orv::platform::activeBackend();
        backend.beginBatch();
        ifaddrs* answered = nullptr;
        const int result = backend.host().interfaceAddresses(answered);
        if (result == 0) {
            *list = answered;
        }
        return result;
    } catch (...) {
        errno = EIO;
        return -1;
    }
}

void OrvHost_FreeIfAddrs(struct ifaddrs* list)
{
    if (list != nullptr) {
        orv::platform::activeBackend().host().freeInterfaceAddresses(list);
    }
}

} // extern "C"
