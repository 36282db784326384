// Helpers shared by the fill operations of the Ethernet port provider.
#ifndef ORV_ETHERNETPORT_FILL_H
#define ORV_ETHERNETPORT_FILL_H

#include <cstddef>
#include <vector>

#include <cmpi/CmpiArray.h>
#include <cmpi/CmpiInstance.h>
#include <cmpi/CmpiString.h>
#include <nodemgr/lib/NodeMgrException.h>

namespace EthernetProvider {

// Runs one fill operation. A failing NIC call ends it early: the properties
// set so far stay on the instance and the caller delivers it all the same, so
// the failure is neither logged nor reported. Other exceptions pass.
template <typename Fill>
void guardFill(Fill&& fill) {
    try {
        fill();
    } catch (const NodeMgr::Lib::NodeMgrException&) {
        // The partial instance is the answer.
    }
}

// An array of CIM type elementType with one element per source item, each
// converted by convert into a CmpiData of that type.
template <typename Item, typename Convert>
CmpiArray convertedArray(const std::vector<Item>& items, CMPIType elementType, Convert convert) {
    CmpiArray array(static_cast<CMPICount>(items.size()), elementType);
    for (std::size_t i = 0; i < items.size(); ++i) {
        array[static_cast<int>(i)] = convert(items[i]);
    }
    return array;
}

// A uint16 array of one element.
inline CmpiArray singleUint16(CMPIUint16 value) {
    CmpiArray array(1, CMPI_uint16);
    array[0] = CmpiData(value);
    return array;
}

// Sets each named member of record as a property of the same name, in table
// order; the member's C++ type gives the CIM type.
template <typename Record, typename Value, std::size_t N>
void setFields(CmpiInstance& instance, const Record& record, const std::pair<const char*, Value Record::*> (&fields)[N]) {
    for (const auto& [name, member] : fields) {
        instance.setProperty(name, CmpiData(record.*member));
    }
}

}  // namespace EthernetProvider

#endif
