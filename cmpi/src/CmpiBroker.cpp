#include <cmpi/CmpiBroker.h>

#include "Check.h"

using cmpibinding::checked;
using cmpibinding::throwOnError;

CmpiContext CmpiBroker::prepareAttachThread(const CmpiContext& ctx) {
    return CmpiContext(getEnc()->bft->prepareAttachThread(getEnc(), ctx.getEnc()));
}

void CmpiBroker::attachThread(const CmpiContext& ctx) {
    throwOnError(getEnc()->bft->attachThread(getEnc(), ctx.getEnc()));
}

void CmpiBroker::detachThread(const CmpiContext& ctx) {
    throwOnError(getEnc()->bft->detachThread(getEnc(), ctx.getEnc()));
}

void CmpiBroker::deliverIndication(const CmpiContext& ctx, const char* ns, const CmpiInstance& ind) {
    throwOnError(getEnc()->bft->deliverIndication(getEnc(), ctx.getEnc(), ns, ind.getEnc()));
}

CmpiEnumeration CmpiBroker::enumInstanceNames(const CmpiContext& ctx, const CmpiObjectPath& op) {
    const CMPIBroker* b = getEnc();
    return CmpiEnumeration(checked([&](CMPIStatus* st) {
        return b->bft->enumerateInstanceNames(b, ctx.getEnc(), op.getEnc(), st);
    }));
}

CmpiEnumeration CmpiBroker::enumInstances(const CmpiContext& ctx, const CmpiObjectPath& op,
                                          const char** properties) {
    const CMPIBroker* b = getEnc();
    return CmpiEnumeration(checked([&](CMPIStatus* st) {
        return b->bft->enumerateInstances(b, ctx.getEnc(), op.getEnc(), properties, st);
    }));
}

CmpiInstance CmpiBroker::getInstance(const CmpiContext& ctx, const CmpiObjectPath& op,
                                     const char** properties) {
    const CMPIBroker* b = getEnc();
    return CmpiInstance(checked([&](CMPIStatus* st) {
        return b->bft->getInstance(b, ctx.getEnc(), op.getEnc(), properties, st);
    }));
}

CmpiObjectPath CmpiBroker::createInstance(const CmpiContext& ctx, const CmpiObjectPath& op,
                                          const CmpiInstance& inst) {
    const CMPIBroker* b = getEnc();
    return CmpiObjectPath(checked([&](CMPIStatus* st) {
        return b->bft->createInstance(b, ctx.getEnc(), op.getEnc(), inst.getEnc(), st);
    }));
}

void CmpiBroker::setInstance(const CmpiContext& ctx, const CmpiObjectPath& op, const CmpiInstance& inst,
                             const char** properties) {
    throwOnError(getEnc()->bft->modifyInstance(getEnc(), ctx.getEnc(), op.getEnc(), inst.getEnc(), properties));
}

void CmpiBroker::deleteInstance(const CmpiContext& ctx, const CmpiObjectPath& op) {
    throwOnError(getEnc()->bft->deleteInstance(getEnc(), ctx.getEnc(), op.getEnc()));
}

CmpiBoolean CmpiBroker::classPathIsA(const CmpiObjectPath& op, const char* className) {
    const CMPIBroker* b = getEnc();
    return checked([&](CMPIStatus* st) { return b->eft->classPathIsA(b, op.getEnc(), className, st); });
}
