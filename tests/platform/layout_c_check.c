/* The C declarations compile as C, with their layout checks. */
#include "ksi/HostType.h"
#include "ksi/Ksi.h"
#include "orv/platform/HostInfo.h"
#include "tmkuser/Version.h"

_Static_assert(sizeof(PowerKsi_Policy) == 588, "policy record size in C");
_Static_assert(sizeof(TmkuserVersion_SystemVersionInfo) == 164, "version record size in C");

size_t orvLayoutCheckPolicySizeFromC(void);
size_t orvLayoutCheckPolicySizeFromC(void)
{
    return sizeof(PowerKsi_Policy) + sizeof(SchedKsi_PcpuInfo) + sizeof(TcpipKsi_VnicIPv6AddrSummary);
}
