/*
 * Checks that the build names its platform: exactly one of the macros below, given on the
 * compiler command line. Everything platform-dependent stands in cmpios.h.
 */
#ifndef _CMPIPL_H_
#define _CMPIPL_H_

#if (defined(CMPI_PLATFORM_LINUX_GENERIC_GNU) + defined(CMPI_PLATFORM_HPUX_ACC) +         \
     defined(CMPI_PLATFORM_WIN32_IX86_MSVC) + defined(CMPI_PLATFORM_SOLARIS_SPARC_GNU) +  \
     defined(CMPI_PLATFORM_SOLARIS_SPARC_CC) + defined(CMPI_PLATFORM_AIX_RS_IBMCXX) +     \
     defined(CMPI_PLATFORM_ZOS_ZSERIES_IBM) + defined(CMPI_PLATFORM_TRU64_ALPHA_DECCXX) + \
     defined(CMPI_PLATFORM_OS400_ISERIES_IBM) + defined(CMPI_PLATFORM_DARWIN_PPC_GNU) +   \
     defined(CMPI_PLATFORM_VMS_ALPHA_DECCXX) + defined(CMPI_PLATFORM_VMS_IA64_DECCXX)) != 1
#error "Define exactly one CMPI_PLATFORM_ macro, on Linux CMPI_PLATFORM_LINUX_GENERIC_GNU."
#endif

#endif /* _CMPIPL_H_ */
