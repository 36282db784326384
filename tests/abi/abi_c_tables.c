/* Function tables filled in C, and C callers of tables filled in C++. */
#include "abi_c_tables.h"

#include <stdarg.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>

/* ---- strings: hdl is a heap copy of the text --------------------------- */

static CMPIStatus string_release(CMPIString* st)
{
    free(st->hdl);
    free(st);
    CMReturn(CMPI_RC_OK);
}

static CMPIString* string_clone(const CMPIString* st, CMPIStatus* rc)
{
    CMSetStatus(rc, CMPI_RC_OK);
    return abi_c_new_string(CMGetCharPtr(st));
}

static char* string_chars(const CMPIString* st, CMPIStatus* rc)
{
    CMSetStatus(rc, CMPI_RC_OK);
    return (char*)st->hdl;
}

static CMPIStringFT string_ft = {1, string_release, string_clone, string_chars};

CMPIString* abi_c_new_string(const char* text)
{
    size_t len = strlen(text) + 1;
    CMPIString* st = (CMPIString*)malloc(sizeof *st);
    st->hdl = malloc(len);
    memcpy(st->hdl, text, len);
    st->ft = &string_ft;
    return st;
}

/* ---- broker ------------------------------------------------------------ */

static CMPIString* broker_new_string(const CMPIBroker* mb, const char* data, CMPIStatus* rc)
{
    (void)mb;
    CMSetStatus(rc, CMPI_RC_OK);
    return abi_c_new_string(data);
}

/* Appends one insert argument, decoded as cmpimacs.h documents it. */
static void append_insert(char* out, size_t size, int type, va_list* args)
{
    size_t used = strlen(out);
    char* at = out + used;
    size_t room = size - used;
    switch (type) {
    case CMPI_sint32: snprintf(at, room, "sint32=%ld;", va_arg(*args, long)); break;
    case CMPI_uint32: snprintf(at, room, "uint32=%lu;", va_arg(*args, unsigned long)); break;
    case CMPI_sint64: snprintf(at, room, "sint64=%lld;", va_arg(*args, long long)); break;
    case CMPI_uint64:
        snprintf(at, room, "uint64=%llu;", va_arg(*args, unsigned long long));
        break;
    case CMPI_real64: snprintf(at, room, "real64=%g;", va_arg(*args, double)); break;
    case CMPI_boolean: snprintf(at, room, "boolean=%d;", va_arg(*args, int)); break;
    case CMPI_chars: snprintf(at, room, "chars=%s;", va_arg(*args, const char*)); break;
    default: snprintf(at, room, "unknown=%d;", type); break;
    }
}

static CMPIString* broker_get_message(const CMPIBroker* mb, const char* msgId,
                                      const char* defMsg, CMPIStatus* rc, CMPICount count, ...)
{
    char text[256];
    va_list args;
    CMPICount i;
    (void)mb;
    (void)msgId;
    snprintf(text, sizeof text, "%s|", defMsg);
    va_start(args, count);
    for (i = 0; i < count; ++i) {
        int type = va_arg(args, int);
        append_insert(text, sizeof text, type, &args);
    }
    va_end(args);
    CMSetStatus(rc, CMPI_RC_OK);
    return abi_c_new_string(text);
}

static CMPIBrokerFT broker_ft = {
    .brokerCapabilities = CMPI_MB_Class_2 | CMPI_MB_Indications, .brokerName = "AbiBroker"};
static CMPIBrokerEncFT broker_enc_ft = {
    .ftVersion = 1, .newString = broker_new_string, .getMessage = broker_get_message};
static CMPIBroker broker = {"AbiBroker", &broker_ft, &broker_enc_ft, NULL, NULL};

const CMPIBroker* abi_c_broker(void)
{
    return &broker;
}

/* ---- instance ---------------------------------------------------------- */

static CMPIData no_such_value(CMPIStatus* rc)
{
    CMPIData d;
    memset(&d, 0, sizeof d);
    d.type = CMPI_null;
    d.state = CMPI_nullValue;
    CMSetStatus(rc, CMPI_RC_ERR_NO_SUCH_PROPERTY);
    return d;
}

static CMPIData uint32_value(CMPIUint32 v, CMPIStatus* rc)
{
    CMPIData d;
    memset(&d, 0, sizeof d);
    d.type = CMPI_uint32;
    d.state = CMPI_goodValue;
    d.value.uint32 = v;
    CMSetStatus(rc, CMPI_RC_OK);
    return d;
}

static CMPIData instance_get_property(const CMPIInstance* inst, const char* name, CMPIStatus* rc)
{
    (void)inst;
    return strcmp(name, "Answer") == 0 ? uint32_value(42, rc) : no_such_value(rc);
}

static CMPIStatus instance_set_property(const CMPIInstance* inst, const char* name,
                                        const CMPIValue* value, CMPIType type)
{
    (void)inst;
    (void)name;
    (void)value;
    (void)type;
    CMReturnWithChars(&broker, CMPI_RC_ERR_NOT_SUPPORTED, "read-only");
}

static CMPIInstanceFT instance_ft = {
    .ftVersion = 1, .getProperty = instance_get_property, .setProperty = instance_set_property};
static CMPIInstance instance = {"AbiInstance", &instance_ft};

const CMPIInstance* abi_c_instance(void)
{
    return &instance;
}

/* ---- contexts ---------------------------------------------------------- */

/* What a context reports for CMPI_ORV_HostExtensions (its hdl). */
typedef struct ContextEntry {
    CMPIrc rc;
    CMPIType type;
    CMPIUint32 value;
} ContextEntry;

static CMPIData context_get_entry(const CMPIContext* ctx, const char* name, CMPIStatus* rc)
{
    const ContextEntry* entry = (const ContextEntry*)ctx->hdl;
    CMPIData d;
    if (strcmp(name, CMPI_ORV_HostExtensions) != 0 || entry->rc != CMPI_RC_OK) {
        return no_such_value(rc);
    }
    d = uint32_value(entry->value, rc);
    d.type = entry->type;
    return d;
}

static unsigned release_thread_memory_calls;

static CMPIStatus context_release_thread_memory(const CMPIContext* ctx)
{
    (void)ctx;
    ++release_thread_memory_calls;
    CMReturn(CMPI_RC_OK);
}

unsigned abi_c_release_thread_memory_calls(void)
{
    return release_thread_memory_calls;
}

static CMPIContextFTExt host_context_ft = {{.ftVersion = 1, .getEntry = context_get_entry},
                                           context_release_thread_memory};
static CMPIContextFT standard_context_ft = {.ftVersion = 1, .getEntry = context_get_entry};

static ContextEntry entries[] = {
    {CMPI_RC_OK, CMPI_uint32, 1},
    {CMPI_RC_ERR_NO_SUCH_PROPERTY, CMPI_null, 0},
    {CMPI_RC_OK, CMPI_uint16, 1},
    {CMPI_RC_OK, CMPI_uint32, 0},
};

static CMPIContext contexts[] = {
    {&entries[ABI_CONTEXT_EMBEDDED_HOST], &host_context_ft.std},
    {&entries[ABI_CONTEXT_STANDARD], &standard_context_ft},
    {&entries[ABI_CONTEXT_WRONG_TYPE], &host_context_ft.std},
    {&entries[ABI_CONTEXT_ZERO_SLOTS], &host_context_ft.std},
};

const CMPIContext* abi_c_context(AbiContextKind kind)
{
    return &contexts[kind];
}

/* ---- C callers --------------------------------------------------------- */

CMPIData abi_c_get_key(const CMPIObjectPath* op, const char* name, CMPIStatus* rc)
{
    return CMGetKey(op, name, rc);
}

CMPIStatus abi_c_return_done(const CMPIResult* rslt)
{
    return CMReturnDone(rslt);
}

CMPIStatus abi_c_return_code(CMPIrc rc)
{
    CMReturn(rc);
}

CMPIStatus abi_c_return_with_chars(CMPIrc rc, const char* text)
{
    CMReturnWithChars(&broker, rc, text);
}

void abi_c_set_status_with_chars(CMPIStatus* st, CMPIrc rc, const char* text)
{
    CMSetStatusWithChars(&broker, st, rc, text);
}

CMPIString* abi_c_message_with_inserts(int sint, unsigned uint, const char* chars, int flag)
{
    CMPIStatus rc = {CMPI_RC_ERR_FAILED, NULL};
    CMPIString* msg = CMGetMessage(&broker, "ABI0001", "inserts", &rc,
                                   CMFmtArgs4(CMFmtSint(sint), CMFmtUint(uint), CMFmtChars(chars),
                                              CMFmtBoolean(flag)));
    return rc.rc == CMPI_RC_OK ? msg : NULL;
}
