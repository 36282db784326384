/*
 * Objects whose function tables are filled by C code (abi_c_tables.c), and C
 * functions that call through tables filled by C++ code. The runtime test uses
 * both directions to show that the two languages agree on the layout.
 */
#ifndef ABI_C_TABLES_H
#define ABI_C_TABLES_H

#include <cmpi/cmpift.h>

#if defined(__cplusplus)
extern "C" {
#endif

/* A broker with newString and getMessage; strings it makes are released by
 * CMRelease. getMessage lists its insert arguments as "type=value" items. */
const CMPIBroker* abi_c_broker(void);

/* A new string made by the C broker (release it with CMRelease). */
CMPIString* abi_c_new_string(const char* text);

/* An instance with one property, "Answer" = uint32 42. setProperty refuses
 * with CMPI_RC_ERR_NOT_SUPPORTED and the message "read-only". */
const CMPIInstance* abi_c_instance(void);

/* Contexts that differ in what they report for CMPI_ORV_HostExtensions. */
typedef enum AbiContextKind {
    ABI_CONTEXT_EMBEDDED_HOST, /* uint32 1, extended table */
    ABI_CONTEXT_STANDARD,      /* no such entry, table ends at addEntry */
    ABI_CONTEXT_WRONG_TYPE,    /* entry present as uint16 */
    ABI_CONTEXT_ZERO_SLOTS     /* uint32 0 */
} AbiContextKind;
const CMPIContext* abi_c_context(AbiContextKind kind);

/* How often the embedded host's releaseThreadMemory has run. */
unsigned abi_c_release_thread_memory_calls(void);

/* Calls through tables built by the caller. */
CMPIData abi_c_get_key(const CMPIObjectPath* op, const char* name, CMPIStatus* rc);
CMPIStatus abi_c_return_done(const CMPIResult* rslt);

/* Status helpers written with the C macros. */
CMPIStatus abi_c_return_code(CMPIrc rc);
CMPIStatus abi_c_return_with_chars(CMPIrc rc, const char* text);
void abi_c_set_status_with_chars(CMPIStatus* st, CMPIrc rc, const char* text);

/* CMGetMessage with a signed, an unsigned, a chars and a boolean insert. */
CMPIString* abi_c_message_with_inserts(int sint, unsigned uint, const char* chars, int flag);

#if defined(__cplusplus)
}
#endif

#endif /* ABI_C_TABLES_H */
