// Detection of replaced IP addresses on the host's network interfaces, and the
// "Orvane_KernelIPChangedIndication" that reports each replacement.
//
// ORV::IAddress and its two families hold one configured address of an
// interface, taken from the interface-address list (getifaddrs). The detector
// ORV::KernelIpIndication keeps two snapshots of that list, the previous and
// the current one, and on every testAndSend reports each interface on which a
// new address appeared while an address of the same family vanished.
//
// The detector is driven from outside (the kernel IP monitor thread and the
// IP-changed indication provider): enableIndication / disableIndication switch
// it on and off, testAndSend compares and delivers.
#ifndef ORV_KERNEL_IP_INDICATION_H
#define ORV_KERNEL_IP_INDICATION_H

#include <ifaddrs.h>

#include <cstddef>
#include <cstdint>
#include <map>
#include <string>
#include <vector>

#include <boost/shared_ptr.hpp>

#include <cmpi/CmpiBroker.h>
#include <cmpi/CmpiContext.h>
#include <cmpi/CmpiInstance.h>
#include <omc/Mutex.h>

namespace ORV {

// One configured address of a network interface.
class IAddress {
public:
    // The endpoint instance that stands for this address on interface `ifname`.
    virtual CmpiInstance buildInterfaceObject(CmpiContext const& context, CmpiBroker* broker,
                                              std::string const& ifname) = 0;
    // True for the same record, or a record of the same family that holds the
    // same address (IPv4: and the same netmask). False for null or another family.
    virtual bool isEqual(IAddress const* other) const = 0;
    // The address text.
    virtual std::string getAddress() const = 0;
    virtual ~IAddress();
    // The endpoint class of this family.
    virtual std::string getCreationClassName() const = 0;

    // The address family of the interface entry (AF_INET or AF_INET6).
    uint16_t getType() const { return _type; }

protected:
    explicit IAddress(uint16_t type) : _type(type) {}

    uint16_t _type;
};

class IPv4Address : public IAddress {
public:
    // Throws std::invalid_argument("Address conversion failed") when the
    // entry's address cannot be rendered; a netmask that cannot be rendered
    // only leaves the netmask empty.
    explicit IPv4Address(ifaddrs const* entry);

    CmpiInstance buildInterfaceObject(CmpiContext const& context, CmpiBroker* broker,
                                      std::string const& ifname) override;
    bool isEqual(IAddress const* other) const override;
    std::string getAddress() const override;
    std::string getCreationClassName() const override;

    std::string getNetmask() const { return _netmask; }

private:
    char _addr[16];
    char _netmask[16];
};

class IPv6Address : public IAddress {
public:
    // Never throws for a bad address: the text is then empty.
    explicit IPv6Address(ifaddrs const* entry);

    CmpiInstance buildInterfaceObject(CmpiContext const& context, CmpiBroker* broker,
                                      std::string const& ifname) override;
    bool isEqual(IAddress const* other) const override;
    std::string getAddress() const override;
    std::string getCreationClassName() const override;

    int getPrefixLength() const { return _prefix; }

    // Prefix length of the `length` mask bytes at `mask`: the leading one bits
    // when they are contiguous and everything after them is zero, else 0. Bit 0
    // of the first byte that is not 0xFF is never examined.
    static int getPrefix(unsigned char const* mask, std::size_t length);

private:
    char _addr[46];
    int32_t _prefix;
};

class KernelIpIndication {
public:
    typedef boost::shared_ptr<IAddress> AddressPtr;
    // Interface name -> its addresses, in the order of the interface list.
    typedef std::multimap<std::string, AddressPtr> AddressMap;

    KernelIpIndication();
    ~KernelIpIndication();
    KernelIpIndication(KernelIpIndication const&) = delete;
    KernelIpIndication& operator=(KernelIpIndication const&) = delete;

    // Switches indications on and refreshes the snapshots (the first call
    // takes the previous snapshot too).
    void enableIndication();
    // Switches indications off; the snapshots are kept.
    void disableIndication();
    bool isEnabled() const;
    // Refreshes the current snapshot; takes the previous one once.
    void poll();
    // While enabled: refreshes the current snapshot, delivers one indication per
    // vanished address of every replaced address, then takes the previous
    // snapshot afresh from the system.
    void testAndSend(CmpiContext const& context, CmpiBroker* broker);

    // Builds and delivers one indication; a refused delivery is logged.
    void send(CmpiContext const& context, CmpiBroker* broker, std::string const& ifname,
              AddressPtr const& previous, AddressPtr const& current);
    // Sets the indication's properties on `instance`.
    void formatIndication(CmpiContext const& context, CmpiInstance& instance, CmpiBroker* broker,
                          std::string const& ifname, AddressPtr const& previous, AddressPtr const& current);

    // The record of one interface-list entry. Throws std::invalid_argument for
    // an unsupported family or an IPv4 address that cannot be rendered.
    static AddressPtr getAddressPtr(ifaddrs const* entry);

private:
    // Replaces `map` with the system's interface list; on failure logs and
    // keeps the old content.
    void buildMap(AddressMap& map);
    // True when `current` is new on interface `name` and at least one address
    // of its family vanished from it; the vanished ones land in `vanished`.
    bool isChanged(std::string const& name, AddressPtr const& current, std::vector<AddressPtr>& vanished);

    bool _enabled;
    bool _previousBuilt;
    mutable OMC::Mutex _lock;
    AddressMap _current;
    AddressMap _previous;
};

}  // namespace ORV

#endif
