// The IP change detector: two snapshots of the interface-address list, the
// previous and the current one, compared on every testAndSend.
//
// A change is an address that appeared on an interface while at least one
// address of the same family vanished from it; each vanished address gives one
// indication. New interfaces, added or removed addresses without a
// replacement, and a change of family are not changes.
#include <netdb.h>
#include <sys/socket.h>
#include <syslog.h>

#include <memory>
#include <stdexcept>
#include <string>

#include <orv/platform/InterfaceAddresses.h>

#include "KernelIpIndication.h"

namespace ORV {

namespace {

struct InterfaceListRelease {
    void operator()(ifaddrs* list) const { OrvHost_FreeIfAddrs(list); }
};
using InterfaceList = std::unique_ptr<ifaddrs, InterfaceListRelease>;

KernelIpIndication::AddressPtr newRecord(ifaddrs const* entry) {
    const sa_family_t family = entry->ifa_addr->sa_family;
    switch (family) {
    case AF_INET:
        return KernelIpIndication::AddressPtr(new IPv4Address(entry));
    case AF_INET6:
        return KernelIpIndication::AddressPtr(new IPv6Address(entry));
    default:
        throw std::invalid_argument("Unsupported protocol family: " + std::to_string(family));
    }
}

}  // namespace

KernelIpIndication::KernelIpIndication() : _enabled(false), _previousBuilt(false) {}

KernelIpIndication::~KernelIpIndication() = default;

void KernelIpIndication::enableIndication() {
    {
        OMC::MutexLock lock(_lock);
        _enabled = true;
    }
    poll();
}

void KernelIpIndication::disableIndication() {
    OMC::MutexLock lock(_lock);
    _enabled = false;
}

bool KernelIpIndication::isEnabled() const {
    OMC::MutexLock lock(_lock);
    return _enabled;
}

void KernelIpIndication::poll() {
    OMC::MutexLock lock(_lock);
    buildMap(_current);
    if (!_previousBuilt) {
        buildMap(_previous);
        _previousBuilt = true;
    }
}

void KernelIpIndication::testAndSend(CmpiContext const& context, CmpiBroker* broker) {
    if (!isEnabled()) {
        return;
    }
    poll();
    OMC::MutexLock lock(_lock);
    std::vector<AddressPtr> vanished;
    for (AddressMap::const_iterator it = _current.begin(); it != _current.end(); ++it) {
        if (!isChanged(it->first, it->second, vanished)) {
            continue;
        }
        for (const AddressPtr& previous : vanished) {
            send(context, broker, it->first, previous, it->second);
        }
    }
    // Taken afresh from the system rather than copied from the current map.
    buildMap(_previous);
}

KernelIpIndication::AddressPtr KernelIpIndication::getAddressPtr(ifaddrs const* entry) {
    try {
        return newRecord(entry);
    } catch (const std::invalid_argument&) {
        throw;
    } catch (const std::exception& e) {
        syslog(LOG_ERR, "Caught exception: %s\n", e.what());
        throw std::exception();
    }
}

void KernelIpIndication::buildMap(AddressMap& map) {
    ifaddrs* first = nullptr;
    const int result = OrvHost_GetIfAddrs(&first);
    if (result != 0) {
        syslog(LOG_ERR, "Unable to refresh network interface information of the system, Error: %s\n",
               gai_strerror(result));
        return;
    }
    const InterfaceList list(first);
    map.clear();
    for (const ifaddrs* entry = list.get(); entry != nullptr; entry = entry->ifa_next) {
        // Entries without an address (or a name) describe no configured address.
        if (entry->ifa_addr == nullptr || entry->ifa_name == nullptr) {
            continue;
        }
        try {
            map.insert(AddressMap::value_type(entry->ifa_name, getAddressPtr(entry)));
        } catch (const std::invalid_argument&) {
            // Link-layer and other non-IP entries, and unreadable IPv4 addresses.
        }
    }
}

bool KernelIpIndication::isChanged(std::string const& name, AddressPtr const& current,
                                   std::vector<AddressPtr>& vanished) {
    const std::pair<AddressMap::const_iterator, AddressMap::const_iterator> before = _previous.equal_range(name);
    if (before.first == before.second) {
        return false;
    }
    vanished.clear();
    const std::pair<AddressMap::const_iterator, AddressMap::const_iterator> now = _current.equal_range(name);
    for (AddressMap::const_iterator previous = before.first; previous != before.second; ++previous) {
        if (current->isEqual(previous->second.get())) {
            return false;
        }
        if (previous->second->getType() != current->getType()) {
            continue;
        }
        bool present = false;
        for (AddressMap::const_iterator it = now.first; it != now.second && !present; ++it) {
            present = previous->second->isEqual(it->second.get());
        }
        if (!present) {
            vanished.push_back(previous->second);
        }
    }
    return !vanished.empty();
}

}  // namespace ORV
