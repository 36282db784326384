// The Ethernet port provider: the host's physical NICs as "Orvane_EthernetPort"
// instances, each NIC's driver and firmware identities, statistics, coalescing,
// pause and ring settings, and the associations from a port to those objects.
//
// One object serves the instance and the association interfaces. It keeps no
// state: every request asks the host-management library afresh. What the
// ports of one request have in common (the system name, arrays with the same
// elements) is made once for that request (EthernetPort-Request.h).
#ifndef ORV_ETHERNETPORT_PROVIDER_H
#define ORV_ETHERNETPORT_PROVIDER_H

#include <cstddef>
#include <string>
#include <utility>
#include <vector>

#include <cmpi/CmpiInstanceMI.h>
#include <nodemgr/network/Pnic.h>
#include <omc/SimpleAssociationMI.h>

namespace EthernetProvider {

struct FarEndClass;
struct ServedClass;
class PortRequest;

class EthernetPortProvider : public CmpiInstanceMI, private OMC::SimpleAssociationMI {
public:
    // CIM values the conversions produce.
    enum EthernetPortType {
        PORT_TYPE_UNKNOWN = 0,
        PORT_TYPE_OTHER = 1,
        PORT_TYPE_TP_10 = 50,
        PORT_TYPE_TP_100 = 52,
        PORT_TYPE_TP_1000 = 53,
        PORT_TYPE_TP_2500 = 54,
        PORT_TYPE_TP_10000 = 55,
        PORT_TYPE_FIBRE_100 = 100,
        PORT_TYPE_FIBRE_1000 = 102,
        PORT_TYPE_FIBRE_10000 = 105
    };
    enum EthernetSupportedPortType {
        MODE_UNKNOWN = 0,
        MODE_TP = 1,
        MODE_AUI = 2,
        MODE_BNC = 3,
        MODE_MII = 4,
        MODE_FIBRE = 5,
        MODE_DA = 6
    };
    // TRANSCEIVER_ENTERNAL is the established spelling of this enumerator.
    enum EthernetTransceiver { TRANSCEIVER_UNKNOWN = 0, TRANSCEIVER_INTERNAL = 1, TRANSCEIVER_ENTERNAL = 2 };
    enum EthernetWOLOptions {
        MODE_DISABLE = 0,
        MODE_PHY = 1,
        MODE_UCAST = 2,
        MODE_MCAST = 3,
        MODE_BCAST = 4,
        MODE_ARP = 5,
        MODE_MAGIC = 6,
        MODE_MAGICSECURE = 7
    };

    EthernetPortProvider(const CmpiBroker& mbp, const CmpiContext& ctx);
    ~EthernetPortProvider() override;

    CmpiStatus enumInstanceNames(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& cop) override;
    CmpiStatus enumInstances(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& cop,
                             const char** properties) override;
    CmpiStatus getInstance(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& cop,
                           const char** properties) override;
    CmpiStatus createInstance(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& cop,
                              const CmpiInstance& inst) override;
    CmpiStatus setInstance(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& cop,
                           const CmpiInstance& inst, const char** properties) override;
    CmpiStatus deleteInstance(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& cop) override;

    // The conversions from the NIC library's enumerations to CIM values. They
    // use no state of the object.
    static CMPIUint16 getPortType(NodeMgr::Network::PnicPortMode port, NodeMgr::Network::LinkSpeed speed);
    static EthernetSupportedPortType convertPortMode(NodeMgr::Network::PnicPortMode mode);
    static std::string convertLinkMode(std::pair<NodeMgr::Network::LinkSpeed, NodeMgr::Network::Duplex> mode);
    static EthernetTransceiver convertTransceiver(NodeMgr::Network::TransceiverMode mode);
    static EthernetWOLOptions convertWOLOption(NodeMgr::Network::WakeOnMode mode);

    // The key's value; an empty string (null text) when the key is absent,
    // null or not a string.
    static CmpiString getKey(const CmpiObjectPath& op, const char* name);
    // The text after the last ':' of id; null when id is null or has no ':'.
    static const char* getDeviceName(const CmpiString& id);

    // Fill operations: each adds the non-key properties of one class to an
    // instance its caller made. A failing NIC call ends the fill early and
    // leaves the instance with the properties set so far. The port's fill
    // shares what it can with the other ports of its request.
    void fillEPInstance(CmpiInstance& instance, NodeMgr::Network::Pnic* pnic, PortRequest& request);
    void fillEPDriverInstance(CmpiInstance& instance, NodeMgr::Network::Pnic* pnic);
    void fillEPFirmwareInstance(CmpiInstance& instance, NodeMgr::Network::Pnic* pnic);
    void fillEPStatsInstance(CmpiInstance& instance, NodeMgr::Network::Pnic* pnic);
    void fillEPCoalesceInstance(CmpiInstance& instance, NodeMgr::Network::Pnic* pnic);
    void fillEPPauseParamsInstance(CmpiInstance& instance, NodeMgr::Network::Pnic* pnic);
    void fillEPRingInstance(CmpiInstance& instance, NodeMgr::Network::Pnic* pnic, bool current);

private:
    CmpiStatus doReferences(const CmpiContext& ctx, CmpiResult& result, const CmpiObjectPath& objectPath,
                            const char* assocClass, const char* resultClass, const char* role,
                            const char* resultRole) override;

    // Whether an enumeration delivers instances or object paths.
    enum class Delivery { Instances, Paths };

    CmpiStatus enumInstancesInt(const CmpiContext& ctx, CmpiResult& result, const CmpiObjectPath& op,
                                const char** properties, const char* deviceName);
    // The enumeration both instance and name requests run: fetches the NICs
    // (all, or the one named deviceName), then delivers the class of op for
    // each of them.
    CmpiStatus enumerate(const CmpiContext& ctx, CmpiResult& result, const CmpiObjectPath& op,
                         const char** properties, const char* deviceName, Delivery delivery);
    void deliverClass(const CmpiContext& ctx, CmpiResult& result, const CmpiObjectPath& op,
                      const ServedClass& served, const std::vector<NodeMgr::Network::Pnic*>& pnics,
                      const char** properties, Delivery delivery);
    void deliverPort(CmpiResult& result, PortRequest& request, NodeMgr::Network::Pnic* pnic,
                     const char** properties, Delivery delivery);
    void deliverFarEnd(CmpiResult& result, const CmpiString& ns, const CmpiString& className,
                       const FarEndClass& row, NodeMgr::Network::Pnic* pnic, Delivery delivery);
    void deliverAssociation(CmpiResult& result, PortRequest& request, const CmpiString& className,
                            const FarEndClass& row, NodeMgr::Network::Pnic* pnic, Delivery delivery);
    // The device name a getInstance path names, or a failure status.
    CmpiStatus deviceNameOf(const CmpiObjectPath& cop, const ServedClass& served, std::string& deviceName) const;

    CmpiStatus doReferencesFromPort(CmpiResult& result, const CmpiObjectPath& objectPath,
                                    const CmpiString& ns, const char* assocClass, const char* resultClass,
                                    const char* role, const char* resultRole);
    // References from a far end (software identity, statistics or setting
    // data: the table makes them alike) to its port.
    CmpiStatus doReferencesSettingData(const CmpiContext& ctx, CmpiResult& result, const CmpiObjectPath& objectPath,
                                       const char* resultClass, const char* role, const char* resultRole,
                                       const FarEndClass& assocClass, const CmpiString& ns);
    // Delivers the association of row between the request's port path and the
    // far end of deviceId (no returnDone); every far-end row goes through it.
    void doReferencesClassEPSettingData(const FarEndClass& row, const CmpiString& ns, const char* deviceId,
                                        const CmpiObjectPath& portPathOfRequest, CmpiResult& result);
    // One association (instance or path) per NIC from start on, between the
    // NIC's port and its setting data of row; no returnDone.
    void enumInstSettingAssoc(const FarEndClass& row, const CmpiString& assocClass,
                              const std::vector<NodeMgr::Network::Pnic*>& nics, std::size_t start,
                              PortRequest& request, CmpiResult& result, bool instances);
};

}  // namespace EthernetProvider

#endif
