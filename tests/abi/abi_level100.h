/* What the translation unit built at CMPI level 100 reports. */
#ifndef ABI_LEVEL100_H
#define ABI_LEVEL100_H

#if defined(__cplusplus)
extern "C" {
#endif

/* CMPICurrentVersion as seen with CMPI_VERSION=100. */
int abi_level100_current_version(void);

#if defined(__cplusplus)
}
#endif

#endif
