// Host identity and uptime, answered by the selected substitute.
#include <cerrno>
#include <cstring>
#include <string>

#include "orv/platform/HostInfo.h"
#include "orv/platform/backend/Selector.h"

namespace {

using NameQuery = bool (orv::platform::HostBackend::*)(std::string&);

// Copies the answer of query into buf; nonzero when unknown or buf too small.
int copyName(NameQuery query, char* buf, size_t size)
{
    if (buf == nullptr || size == 0) {
        return EINVAL;
    }
    buf[0] = '\0';
    std::string name;
    try {
        orv::platform::Backend& backend = orv::platform::activeBackend();
        backend.beginBatch();
        if (!(backend.host().*query)(name)) {
            return ENOENT;
        }
    } catch (...) {
        return EIO;
    }
    if (name.size() >= size) {
        return ERANGE;
    }
    std::memcpy(buf, name.c_str(), name.size() + 1);
    return 0;
}

} // namespace

extern "C" {

int OrvHost_GetFqdn(char* buf, size_t size)
{
    return copyName(&orv::platform::HostBackend::fqdn, buf, size);
}

int OrvHost_GetHostName(char* buf, size_t size)
{
    return copyName(&orv::platform::HostBackend::hostName, buf, size);
}

int OrvHost_Sysinfo(struct sysinfo* info)
{
    int error = EINVAL;
    if (info != nullptr) {
        try {
            orv::platform::Backend& backend = orv::platform::activeBackend();
            backend.beginBatch();
            std::memset(info, 0, sizeof *info);
            error = backend.host().sysInfo(*info);
        } catch (...) {
            error = EIO;
        }
    }
    if (error != 0) {
        errno = error;
        return -1;
    }
    return 0;
}

} // extern "C"
