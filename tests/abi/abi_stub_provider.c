/*
 * A provider library made with the MI stub macros, built as a loadable module
 * with hidden visibility (once as C, once as C++). Every MI function returns
 * its slot number (1 = cleanup) as the status code, so the test can check
 * that each function sits in the right slot. Method invocation answers with a
 * message made by the broker the factory stored; the instance factory's hook
 * puts a message into the factory status.
 */
#include <cmpift.h>
#include <cmpimacs.h>

static const CMPIBroker* stubBroker;

#define SLOT(n) CMReturn((CMPIrc)(n))

/* Not a factory: must stay hidden from dlsym. */
#if defined(__cplusplus)
extern "C" {
#endif
int abi_stub_hidden_helper(void);
#if defined(__cplusplus)
}
#endif
int abi_stub_hidden_helper(void)
{
    return 1;
}

static void stub_hook(const CMPIBroker* brkr, CMPIStatus* rc)
{
    if (rc != NULL) {
        rc->msg = CMNewString(brkr, "hooked", NULL);
    }
}

/* ---- instance ---------------------------------------------------------- */

static CMPIStatus AbiStubCleanup(CMPIInstanceMI* mi, const CMPIContext* ctx, CMPIBoolean term)
{
    (void)mi, (void)ctx, (void)term;
    SLOT(1);
}

static CMPIStatus AbiStubEnumInstanceNames(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                           const CMPIResult* rslt, const CMPIObjectPath* op)
{
    (void)mi, (void)ctx, (void)rslt, (void)op;
    SLOT(2);
}

static CMPIStatus AbiStubEnumInstances(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                       const CMPIResult* rslt, const CMPIObjectPath* op,
                                       const char** props)
{
    (void)mi, (void)ctx, (void)rslt, (void)op, (void)props;
    SLOT(3);
}

static CMPIStatus AbiStubGetInstance(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                     const CMPIResult* rslt, const CMPIObjectPath* op,
                                     const char** props)
{
    (void)mi, (void)ctx, (void)rslt, (void)op, (void)props;
    SLOT(4);
}

static CMPIStatus AbiStubCreateInstance(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                        const CMPIResult* rslt, const CMPIObjectPath* op,
                                        const CMPIInstance* inst)
{
    (void)mi, (void)ctx, (void)rslt, (void)op, (void)inst;
    SLOT(5);
}

static CMPIStatus AbiStubModifyInstance(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                        const CMPIResult* rslt, const CMPIObjectPath* op,
                                        const CMPIInstance* inst, const char** props)
{
    (void)mi, (void)ctx, (void)rslt, (void)op, (void)inst, (void)props;
    SLOT(6);
}

static CMPIStatus AbiStubDeleteInstance(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                        const CMPIResult* rslt, const CMPIObjectPath* op)
{
    (void)mi, (void)ctx, (void)rslt, (void)op;
    SLOT(7);
}

static CMPIStatus AbiStubExecQuery(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                   const CMPIResult* rslt, const CMPIObjectPath* op,
                                   const char* query, const char* lang)
{
    (void)mi, (void)ctx, (void)rslt, (void)op, (void)query, (void)lang;
    SLOT(8);
}

CMInstanceMIStub(AbiStub, AbiStub, stubBroker, stub_hook(brkr, rc))

/* ---- association ------------------------------------------------------- */

static CMPIStatus AbiStubAssociationCleanup(CMPIAssociationMI* mi, const CMPIContext* ctx,
                                            CMPIBoolean term)
{
    (void)mi, (void)ctx, (void)term;
    SLOT(1);
}

static CMPIStatus AbiStubAssociators(CMPIAssociationMI* mi, const CMPIContext* ctx,
                                     const CMPIResult* rslt, const CMPIObjectPath* op,
                                     const char* assocClass, const char* resultClass,
                                     const char* role, const char* resultRole,
                                     const char** props)
{
    (void)mi, (void)ctx, (void)rslt, (void)op, (void)assocClass, (void)resultClass;
    (void)role, (void)resultRole, (void)props;
    SLOT(2);
}

static CMPIStatus AbiStubAssociatorNames(CMPIAssociationMI* mi, const CMPIContext* ctx,
                                         const CMPIResult* rslt, const CMPIObjectPath* op,
                                         const char* assocClass, const char* resultClass,
                                         const char* role, const char* resultRole)
{
    (void)mi, (void)ctx, (void)rslt, (void)op, (void)assocClass, (void)resultClass;
    (void)role, (void)resultRole;
    SLOT(3);
}

static CMPIStatus AbiStubReferences(CMPIAssociationMI* mi, const CMPIContext* ctx,
                                    const CMPIResult* rslt, const CMPIObjectPath* op,
                                    const char* resultClass, const char* role,
                                    const char** props)
{
    (void)mi, (void)ctx, (void)rslt, (void)op, (void)resultClass, (void)role, (void)props;
    SLOT(4);
}

static CMPIStatus AbiStubReferenceNames(CMPIAssociationMI* mi, const CMPIContext* ctx,
                                        const CMPIResult* rslt, const CMPIObjectPath* op,
                                        const char* resultClass, const char* role)
{
    (void)mi, (void)ctx, (void)rslt, (void)op, (void)resultClass, (void)role;
    SLOT(5);
}

CMAssociationMIStub(AbiStub, AbiStub, stubBroker, CMNoHook)

/* ---- method ------------------------------------------------------------ */

static CMPIStatus AbiStubMethodCleanup(CMPIMethodMI* mi, const CMPIContext* ctx,
                                       CMPIBoolean term)
{
    (void)mi, (void)ctx, (void)term;
    SLOT(1);
}

static CMPIStatus AbiStubInvokeMethod(CMPIMethodMI* mi, const CMPIContext* ctx,
                                      const CMPIResult* rslt, const CMPIObjectPath* op,
                                      const char* method, const CMPIArgs* in, CMPIArgs* out)
{
    (void)mi, (void)ctx, (void)rslt, (void)op, (void)in, (void)out;
    CMReturnWithChars(stubBroker, 2, method);
}

CMMethodMIStub(AbiStub, AbiStub, stubBroker, CMNoHook)

/* ---- property ---------------------------------------------------------- */

static CMPIStatus AbiStubPropertyCleanup(CMPIPropertyMI* mi, const CMPIContext* ctx,
                                         CMPIBoolean term)
{
    (void)mi, (void)ctx, (void)term;
    SLOT(1);
}

static CMPIStatus AbiStubSetProperty(CMPIPropertyMI* mi, const CMPIContext* ctx,
                                     const CMPIResult* rslt, const CMPIObjectPath* op,
                                     const char* name, const CMPIData data)
{
    (void)mi, (void)ctx, (void)rslt, (void)op, (void)name;
    /* The value arrives on the stack by value: report it back as the code. */
    CMReturn(data.type == CMPI_uint32 ? (CMPIrc)data.value.uint32 : CMPI_RC_ERR_FAILED);
}

static CMPIStatus AbiStubGetProperty(CMPIPropertyMI* mi, const CMPIContext* ctx,
                                     const CMPIResult* rslt, const CMPIObjectPath* op,
                                     const char* name)
{
    (void)mi, (void)ctx, (void)rslt, (void)op, (void)name;
    SLOT(3);
}

static CMPIStatus AbiStubSetPropertyWithOrigin(CMPIPropertyMI* mi, const CMPIContext* ctx,
                                               const CMPIResult* rslt, CMPIObjectPath* op,
                                               const char* name, const CMPIData data,
                                               const char* origin)
{
    (void)mi, (void)ctx, (void)rslt, (void)op, (void)name, (void)data, (void)origin;
    SLOT(4);
}

CMPropertyMIStub(AbiStub, AbiStub, stubBroker, CMNoHook)

/* ---- indication -------------------------------------------------------- */

static CMPIStatus AbiStubIndicationCleanup(CMPIIndicationMI* mi, const CMPIContext* ctx,
                                           CMPIBoolean term)
{
    (void)mi, (void)ctx, (void)term;
    SLOT(1);
}

static CMPIStatus AbiStubAuthorizeFilter(CMPIIndicationMI* mi, const CMPIContext* ctx,
                                         const CMPISelectExp* filter, const char* className,
                                         const CMPIObjectPath* op, const char* owner)
{
    (void)mi, (void)ctx, (void)filter, (void)className, (void)op, (void)owner;
    SLOT(2);
}

static CMPIStatus AbiStubMustPoll(CMPIIndicationMI* mi, const CMPIContext* ctx,
                                  const CMPISelectExp* filter, const char* className,
                                  const CMPIObjectPath* classPath)
{
    (void)mi, (void)ctx, (void)filter, (void)className, (void)classPath;
    SLOT(3);
}

static CMPIStatus AbiStubActivateFilter(CMPIIndicationMI* mi, const CMPIContext* ctx,
                                        const CMPISelectExp* filter, const char* className,
                                        const CMPIObjectPath* classPath, CMPIBoolean first)
{
    (void)mi, (void)ctx, (void)filter, (void)className, (void)classPath, (void)first;
    SLOT(4);
}

static CMPIStatus AbiStubDeActivateFilter(CMPIIndicationMI* mi, const CMPIContext* ctx,
                                          const CMPISelectExp* filter, const char* className,
                                          const CMPIObjectPath* classPath, CMPIBoolean last)
{
    (void)mi, (void)ctx, (void)filter, (void)className, (void)classPath, (void)last;
    SLOT(5);
}

static CMPIStatus AbiStubEnableIndications(CMPIIndicationMI* mi, const CMPIContext* ctx)
{
    (void)mi, (void)ctx;
    SLOT(6);
}

static CMPIStatus AbiStubDisableIndications(CMPIIndicationMI* mi, const CMPIContext* ctx)
{
    (void)mi, (void)ctx;
    SLOT(7);
}

CMIndicationMIStub(AbiStub, AbiStub, stubBroker, CMNoHook)
