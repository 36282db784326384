/*
 * Built with CMPI_VERSION=100: the tables lose their level-200 slots and the
 * objects that exist only at level 200 disappear.
 */
#include <cmpift.h>

#include "abi_assert.h"
#include "abi_level100.h"

#if defined(CMPI_VER_200)
#  error "CMPI_VERSION=100 must not select level 200"
#endif
#if !defined(CMPI_VER_100) || !defined(CMPI_VER_86)
#  error "CMPI_VERSION=100 must define the cumulative feature macros"
#endif

ABI_SIZE(CMPIBroker, 32);
ABI_SIZE(CMPIBrokerFT, 160);
ABI_SIZE(CMPIBrokerEncFT, 136);
ABI_SIZE(CMPIBrokerExtFT, 168);
ABI_SIZE(CMPIContextFT, 56);
ABI_SIZE(CMPIResultFT, 56);
ABI_SIZE(CMPIInstanceFT, 80);
ABI_SIZE(CMPIObjectPathFT, 160);
ABI_SIZE(CMPIPropertyMIFT, 40);
ABI_SIZE(CMPIInstanceMIFT, 80);
ABI_SIZE(CMPIIndicationMIFT, 72);
ABI_SIZE(CMPIData, 24);
ABI_OFFSET(CMPIBrokerEncFT, trace, 128);

int abi_level100_current_version(void)
{
    return CMPICurrentVersion;
}
