#include "linux_backend.hpp"

#include "dmi_identity.hpp"

#include <cerrno>
#include <ifaddrs.h>
#include <unistd.h>

namespace orv::linuxhost {

bool LinuxHost::hostName(std::string& out)
{
    char name[256] = {};
    if (::gethostname(name, sizeof name - 1) != 0) return false;
    out = name;
    return !out.empty();
}

LinuxHost::LinuxHost(CanonicalNameCache::Resolver resolver, CanonicalNameCache::Timing timing)
    : canonical_(std::move(resolver), timing)
{
}

// The canonical name the resolver gives the host name, as far as known
// without waiting on the resolver; the host name itself otherwise.
bool LinuxHost::fqdn(std::string& out)
{
    std::string name;
    if (!hostName(name)) return false;
    out = canonical_.nameFor(name);
    return true;
}

int LinuxHost::sysInfo(struct sysinfo& out) { return ::sysinfo(&out) == 0 ? 0 : errno; }

// The kernel's own list, of the calling thread's network namespace.
int LinuxHost::interfaceAddresses(ifaddrs*& list)
{
    list = nullptr;
    return ::getifaddrs(&list);
}

void LinuxHost::freeInterfaceAddresses(ifaddrs* list)
{
    if (list != nullptr) ::freeifaddrs(list);
}

orv::platform::SystemIdentity LinuxHost::systemIdentity() { return readDmiIdentity(fileRoot_); }

}  // namespace orv::linuxhost
