/*
 * cmpipl.h - platform selection for the CMPI headers.
 *
 * The CMPI headers need to know which operating system and compiler they are
 * built for, because the thread, mutex and condition types of cmpios.h depend
 * on it. These headers target Linux with a GNU-compatible compiler (gcc,
 * clang). When the build does not name the platform, it is chosen here.
 */
#ifndef CMPIPL_H
#define CMPIPL_H

#if !defined(CMPI_PLATFORM_LINUX_GENERIC_GNU)
#  if defined(__linux__) && defined(__GNUC__)
#    define CMPI_PLATFORM_LINUX_GENERIC_GNU 1
#  else
#    error "cmpipl.h: only Linux with a GNU-compatible compiler is supported; define CMPI_PLATFORM_LINUX_GENERIC_GNU"
#  endif
#endif

#if defined(CMPI_PLATFORM_HPUX_ACC) || defined(CMPI_PLATFORM_AIX_RS_IBMCXX) || \
    defined(CMPI_PLATFORM_SOLARIS_SPARC_GNU) || defined(CMPI_PLATFORM_SOLARIS_SPARC_CC) || \
    defined(CMPI_PLATFORM_ZOS_ZSERIES_IBM) || defined(CMPI_PLATFORM_WIN32_IX86_MSVC) || \
    defined(CMPI_PLATFORM_DARWIN_PPC_GNU) || defined(CMPI_PLATFORM_TRU64_ALPHA_DECCXX)
#  error "cmpipl.h: more than one CMPI platform macro is defined"
#endif

#endif /* CMPIPL_H */
