#include "linux_backend.hpp"

#include <cerrno>
#include <ifaddrs.h>
#include <memory>
#include <netdb.h>
#include <sys/socket.h>
#include <unistd.h>

namespace orv::linuxhost {

bool LinuxHost::hostName(std::string& out)
{
    char name[256] = {};
    if (::gethostname(name, sizeof name - 1) != 0) return false;
    out = name;
    return !out.empty();
}

// The canonical name the resolver gives the host name; the host name itself
// when the resolver knows no other.
bool LinuxHost::fqdn(std::string& out)
{
    std::string name;
    if (!hostName(name)) return false;
    addrinfo hints{};
    hints.ai_family = AF_UNSPEC;
    hints.ai_flags = AI_CANONNAME;
    addrinfo* result = nullptr;
    out = name;
    if (::getaddrinfo(name.c_str(), nullptr, &hints, &result) != 0) return true;
    std::unique_ptr<addrinfo, void (*)(addrinfo*)> owner(result, freeaddrinfo);
    if (result && result->ai_canonname && *result->ai_canonname) out = result->ai_canonname;
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

}  // namespace orv::linuxhost
