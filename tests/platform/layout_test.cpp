// Sizes, offsets, enumerator values and virtual slot order of the platform
// declarations, which the providers depend on byte for byte.
#include <gtest/gtest.h>

#include <cstddef>
#include <cstdint>
#include <cstring>

#include "ksi/Ksi.h"
#include "nodemgr/network/Pnic.h"
#include "tmkctl/util/AutoVector.h"
#include "tmkuser/Version.h"

extern "C" size_t orvLayoutCheckPolicySizeFromC(void);

namespace {

using namespace NodeMgr::Network;
using NodeMgr::Lib::NodeMgrObject;

// The virtual-table slot a pointer to a virtual member function refers to
// (the Itanium C++ ABI stores 1 + the byte offset in the table).
template <typename Pointer>
long slotOf(Pointer member)
{
    struct Representation {
        uintptr_t pointer;
        ptrdiff_t adjustment;
    };
    static_assert(sizeof(Pointer) == sizeof(Representation));
    Representation raw;
    std::memcpy(&raw, &member, sizeof raw);
    EXPECT_EQ(raw.pointer % sizeof(void*), 1u) << "not a virtual member";
    return static_cast<long>((raw.pointer - 1) / sizeof(void*));
}

TEST(KernelRecordLayout, SizesAreTheKernelInterfaceSizes)
{
    EXPECT_EQ(sizeof(PowerKsi_Policy), 588u);
    EXPECT_EQ(sizeof(Hardware_CPUGlobalInfoStruct), 36u);
    EXPECT_EQ(sizeof(KSI_HardwareCharArray48), 48u);
    EXPECT_EQ(sizeof(Hardware_CPUPackageInfoStruct), 4u);
    EXPECT_EQ(sizeof(Hardware_PCPUInfoStruct), 200u);
    EXPECT_EQ(sizeof(Hardware_PCPUCPUIDSummaryStruct), 96u);
    EXPECT_EQ(sizeof(Hardware_PCPUCPUIDLeafStruct), 16u);
    EXPECT_EQ(sizeof(SchedKsi_PcpuInfo), 156u);
    EXPECT_EQ(sizeof(SchedKsi_PcpuLoad), 36u);
    EXPECT_EQ(sizeof(TcpipKsi_VnicIPv6AddrSummary), 68u);
    EXPECT_EQ(sizeof(TmkuserVersion_SystemVersionInfo), 164u);
    EXPECT_EQ(orvLayoutCheckPolicySizeFromC(), 588u + 156u + 68u);
}

TEST(KernelRecordLayout, FieldOffsetsAreTheKernelInterfaceOffsets)
{
    EXPECT_EQ(offsetof(PowerKsi_Policy, shortName), 8u);
    EXPECT_EQ(offsetof(PowerKsi_Policy, name), 201u);
    EXPECT_EQ(offsetof(PowerKsi_Policy, description), 394u);
    EXPECT_EQ(offsetof(Hardware_PCPUInfoStruct, stepping), 3u);
    EXPECT_EQ(offsetof(Hardware_PCPUInfoStruct, cpuid), 44u);
    EXPECT_EQ(offsetof(Hardware_PCPUCPUIDSummaryStruct, id81), 48u);
    EXPECT_EQ(offsetof(Hardware_PCPUCPUIDSummaryStruct, id8a), 80u);
    EXPECT_EQ(offsetof(SchedKsi_PcpuInfo, halted), 64u);
    EXPECT_EQ(offsetof(SchedKsi_PcpuLoad, activeLoad), 8u);
    EXPECT_EQ(offsetof(TcpipKsi_VnicIPv6AddrSummary, prefixLength), 48u);
    EXPECT_EQ(offsetof(TmkuserVersion_SystemVersionInfo, talmekBuild), 160u);
    EXPECT_EQ(sizeof(Hardware_HTStateEnum), 4u);
}

TEST(KernelInterface, SignatureIsTwentyOneBytesWithItsTerminator)
{
    EXPECT_EQ(sizeof(KSI_SIGNATURE), static_cast<size_t>(KSI_SIGNATURE_LENGTH));
    EXPECT_EQ(KSI_SIGNATURE_LENGTH, 21);
}

TEST(NicEnumerations, ValuesAreTheLibraryValues)
{
    EXPECT_EQ(CONNECTION_AUTO, 0);
    EXPECT_EQ(CONNECTION_2500, 2500);
    EXPECT_EQ(CONNECTION_56000, 56000);
    EXPECT_EQ(CONNECTION_100000, 100000);
    EXPECT_EQ(DUPLEX_MODE_HALF, 2);
    EXPECT_EQ(PNICPORT_MODE_DA, 5);
    EXPECT_EQ(PNICPORT_MODE_UNKNOWN, 6);
    EXPECT_EQ(TRANSCEIVER_MODE_UNKNOWN, 2);
    EXPECT_EQ(WAKEON_MODE_MAGICSECURE, 6);
    EXPECT_EQ(WAKEON_MODE_UNSUPPORTED, 7);
    EXPECT_EQ(WAKEON_MODE_DISABLE, 8);
    EXPECT_EQ(HTTMKDisabled, 2);
    EXPECT_EQ(HTEnabled, 3);
}

TEST(NicRecords, FieldsAreInTheLibraryOrder)
{
    PnicInfo info;
    EXPECT_LT(static_cast<void*>(&info.supportedPorts), static_cast<void*>(&info.supportedLinkModes));
    EXPECT_LT(static_cast<void*>(&info.advertisedAutoNegotiation), static_cast<void*>(&info.linkStatusChanged));
    EXPECT_LT(static_cast<void*>(&info.autoNegChanged), static_cast<void*>(&info.speed));
    EXPECT_LT(static_cast<void*>(&info.PHYAD), static_cast<void*>(&info.transceiver));
    EXPECT_LT(static_cast<void*>(&info.wakeOn), static_cast<void*>(&info.msglvlChanged));
    EXPECT_LT(static_cast<void*>(&info.viraddr), static_cast<void*>(&info.linkStatus));
    EXPECT_EQ(offsetof(PnicRingInfo, changed), 0u);
    EXPECT_EQ(offsetof(PnicRingInfo, rx), 4u);
    EXPECT_EQ(offsetof(PnicRingInfo, tx), 16u);
    EXPECT_EQ(offsetof(PnicStats, packetsTx), 0u);
    EXPECT_EQ(offsetof(PnicStats, dot3OutPauseFrames), 38u * 8u);
    EXPECT_EQ(offsetof(PnicCoalesceInfo, statsBlockUsecs), 4u);
    EXPECT_EQ(offsetof(PnicCoalesceInfo, txFrameHigh), 4u + 19u * 4u);
    EXPECT_EQ(offsetof(PnicPauseInfo, rxAutoNegRes), 4u);
}

TEST(PnicVirtualTable, BaseObjectOperationsComeFirstAfterTheDestructor)
{
    // Slots 0 and 1 hold the two destructor entries.
    EXPECT_EQ(slotOf(&NodeMgrObject::Refresh), 2);
    EXPECT_EQ(slotOf(&NodeMgrObject::SaveConfig), 3);
    EXPECT_EQ(slotOf(&NodeMgrObject::LoadConfig), 4);
    EXPECT_EQ(slotOf(&NodeMgrObject::Print), 5);
    EXPECT_EQ(slotOf(&NodeMgrObject::GetName), 6);
    EXPECT_EQ(slotOf(&NodeMgrObject::GetChildren), 7);
    EXPECT_EQ(slotOf(&Pnic::GetName), 6);
}

TEST(PnicVirtualTable, PnicOperationsFollowInTheirOrder)
{
    long slot = 8;
    EXPECT_EQ(slotOf(&Pnic::GetPciDevice), slot++);
    EXPECT_EQ(slotOf(&Pnic::GetConfiguredDuplex), slot++);
    EXPECT_EQ(slotOf(&Pnic::GetDuplex), slot++);
    EXPECT_EQ(slotOf(&Pnic::IsLinkUp), slot++);
    EXPECT_EQ(slotOf(&Pnic::IsOperationalLinkUp), slot++);
    EXPECT_EQ(slotOf(&Pnic::IsAdministrativeLinkUp), slot++);
    EXPECT_EQ(slotOf(&Pnic::IsEnabled), slot++);
    EXPECT_EQ(slotOf(&Pnic::GetConfiguredLinkSpeed), slot++);
    EXPECT_EQ(slotOf(&Pnic::GetLinkSpeed), slot++);
    EXPECT_EQ(slotOf(&Pnic::SetLinkSpeedAndDuplex), slot++);
    EXPECT_EQ(slotOf(&Pnic::GetHardwareCapabilities), slot++);
    EXPECT_EQ(slotOf(&Pnic::GetDriverName), slot++);
    EXPECT_EQ(slotOf(&Pnic::GetSupportedModes), slot++);
    EXPECT_EQ(slotOf(&Pnic::GetPort), slot++);
    EXPECT_EQ(slotOf(&Pnic::GetHint), slot++);
    EXPECT_EQ(slotOf(&Pnic::GetMacAddress), slot++);
    EXPECT_EQ(slotOf(&Pnic::GetVirtualMacAddress), slot++);
    EXPECT_EQ(slotOf(&Pnic::GetResPoolsSchedAllowed), slot++);
    EXPECT_EQ(slotOf(&Pnic::SetEnabled), slot++);
    EXPECT_EQ(slotOf(&Pnic::SetResPoolsSchedAllowed), slot++);
    EXPECT_EQ(slotOf(&Pnic::GetResPoolsSchedSupported), slot++);
    EXPECT_EQ(slotOf(&Pnic::GetWakeOnLANEnabled), slot++);
    EXPECT_EQ(slotOf(&Pnic::GetWakeOnLANSupported), slot++);
    EXPECT_EQ(slotOf(&Pnic::SetWakeOnLANEnabled), slot++);
    EXPECT_EQ(slotOf(&Pnic::GetDPStatus), slot++);
    EXPECT_EQ(slotOf(&Pnic::GetCdpInfo), slot++);
    EXPECT_EQ(slotOf(&Pnic::GetLldpInfo), slot++);
    EXPECT_EQ(slotOf(&Pnic::GetMTU), slot++);
    EXPECT_EQ(slotOf(&Pnic::IsPseudoDevice), slot++);
    EXPECT_EQ(slotOf(&Pnic::GetSourcePortStats), slot++);
    EXPECT_EQ(slotOf(&Pnic::GetPnicStats), slot++);
    EXPECT_EQ(slotOf(&Pnic::GetPnicPrivStats), slot++);
    EXPECT_EQ(slotOf(&Pnic::GetPnicInfo), slot++);
    EXPECT_EQ(slotOf(&Pnic::GetPnicPauseInfo), slot++);
    EXPECT_EQ(slotOf(&Pnic::GetPnicCoalesceInfo), slot++);
    EXPECT_EQ(slotOf(&Pnic::GetPnicRingInfo), slot++);
    EXPECT_EQ(slotOf(&Pnic::GetPnicOffloadInfo), slot++);
    EXPECT_EQ(slotOf(&Pnic::GetPnicSoftwareSimulationInfo), slot++);
    EXPECT_EQ(slotOf(&Pnic::GetPnicDriverInfo), slot++);
    EXPECT_EQ(slotOf(&Pnic::SetPnicInfo), slot++);
    EXPECT_EQ(slotOf(&Pnic::SetPnicPauseInfo), slot++);
    EXPECT_EQ(slotOf(&Pnic::SetPnicCoalesceInfo), slot++);
    EXPECT_EQ(slotOf(&Pnic::SetPnicRingInfo), slot++);
    EXPECT_EQ(slotOf(&Pnic::SetPnicOffloadInfo), slot++);
    EXPECT_EQ(slotOf(&Pnic::SetPnicSoftwareSimulationInfo), slot++);
    EXPECT_EQ(slotOf(&Pnic::DumpRegister), slot++);
    EXPECT_EQ(slotOf(&Pnic::DumpEEPROM), slot++);
    EXPECT_EQ(slotOf(static_cast<void (Pnic::*)(uint32_t, const std::vector<uint8_t>&)>(&Pnic::ChangeEEPROM)), slot++);
    EXPECT_EQ(slotOf(static_cast<void (Pnic::*)(const std::string&)>(&Pnic::ChangeEEPROM)), slot++);
    EXPECT_EQ(slotOf(&Pnic::RestartNegotiation), slot++);
    EXPECT_EQ(slotOf(&Pnic::IdentifyNic), slot++);
    EXPECT_EQ(slotOf(&Pnic::RunSelfTest), slot++);
    EXPECT_EQ(slot, 8 + 52);
}

TEST(PciDeviceVirtualTable, ReadOperationsInTheirRelativeOrder)
{
    EXPECT_LT(slotOf(&PciDevice::GetSegment), slotOf(&PciDevice::GetBus));
    EXPECT_EQ(slotOf(&PciDevice::GetBus), slotOf(&PciDevice::GetSegment) + 1);
    EXPECT_EQ(slotOf(&PciDevice::GetSlot), slotOf(&PciDevice::GetSegment) + 2);
    EXPECT_EQ(slotOf(&PciDevice::GetFunction), slotOf(&PciDevice::GetSegment) + 3);
    EXPECT_EQ(slotOf(&PciDevice::GetVendorId), slotOf(&PciDevice::GetSegment) + 4);
    EXPECT_EQ(slotOf(&PciDevice::GetDeviceId), slotOf(&PciDevice::GetSegment) + 5);
}

struct Counted {
    explicit Counted(int& deletions) : deletions_(deletions) {}
    virtual ~Counted() { ++deletions_; }
    int& deletions_;
};

TEST(AutoVector, DeletesEveryElementAndEmptiesOnDestruction)
{
    int deletions = 0;
    {
        TmkCtl::Util::AutoVector<Counted> items(std::vector<Counted*>{new Counted(deletions), new Counted(deletions)});
        EXPECT_EQ(items.size(), 2u);
        std::vector<Counted*> borrowed(items);
        EXPECT_EQ(borrowed.size(), 2u);
    }
    EXPECT_EQ(deletions, 2);
}

TEST(AutoVector, AssigningANewSequenceDeletesTheOldElements)
{
    int deletions = 0;
    TmkCtl::Util::AutoVector<Counted> items;
    items = std::vector<Counted*>{new Counted(deletions)};
    items = std::vector<Counted*>{new Counted(deletions), new Counted(deletions)};
    EXPECT_EQ(deletions, 1);
    items.DeleteAll();
    EXPECT_EQ(deletions, 3);
    EXPECT_TRUE(items.empty());
}

TEST(MacAddress, WritesSixBytesMostSignificantFirst)
{
    const unsigned char bytes[6] = {0x00, 0x50, 0x56, 0xAB, 0xCD, 0xEF};
    MacAddress mac(bytes);
    unsigned char out[8] = {0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF};
    mac.GetBinaryAddress(out);
    EXPECT_EQ(std::memcmp(out, bytes, 6), 0);
    EXPECT_EQ(out[6], 0xFF);
}

} // namespace
