// Every record of one NIC read through the substitute, as the port provider's
// requests read them; shared by the Linux benchmarks.
#pragma once

#include "nodemgr/network/Pnic.h"

#include <exception>

namespace orv::linuxbench {

template <typename Call>
void tolerate(Call&& call)
{
    try {
        call();
    } catch (const std::exception&) {
        // a query the driver does not support costs its refusal
    }
}

inline void readAllNicRecords(NodeMgr::Network::Pnic& pnic)
{
    namespace NN = NodeMgr::Network;
    NN::PnicInfo info;
    NN::PnicStats stats;
    NN::PnicDriverInfo driver;
    NN::PnicCoalesceInfo coalesce;
    NN::PnicPauseInfo pause;
    NN::PnicRingInfo preset, current;
    tolerate([&] { pnic.GetPnicInfo(info); });
    tolerate([&] { pnic.GetPnicStats(stats); });
    tolerate([&] { pnic.GetPnicDriverInfo(driver); });
    tolerate([&] { pnic.GetPnicCoalesceInfo(coalesce); });
    tolerate([&] { pnic.GetPnicPauseInfo(pause); });
    tolerate([&] { pnic.GetPnicRingInfo(preset, current); });
    tolerate([&] { (void)pnic.GetMTU(); });
    tolerate([&] { (void)pnic.GetMacAddress(); });
    (void)pnic.GetPciDevice();
}

}  // namespace orv::linuxbench
