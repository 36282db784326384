// The broker's factory table (CMPIBrokerEncFT): new objects of the calling
// thread's current arena, type queries, messages and logging.
#include <cstdio>
#include <string>

#include "args.hpp"
#include "array.hpp"
#include "broker_tables.hpp"
#include "context.hpp"
#include "core.hpp"
#include "datetime.hpp"
#include "enumeration.hpp"
#include "error.hpp"
#include "instance.hpp"
#include "object_path.hpp"
#include "result.hpp"
#include "select_exp.hpp"
#include "string.hpp"

namespace orv::host::detail {

namespace {

// Answers OK when `object` was made, NULL + CMPI_RC_ERR_INVALID_PARAMETER otherwise.
template <class T>
T* made(T* object, CMPIStatus* rc) {
    setRc(rc, object != nullptr ? CMPI_RC_OK : CMPI_RC_ERR_INVALID_PARAMETER);
    return object;
}

CMPIInstance* newInstanceFn(const CMPIBroker* /*mb*/, const CMPIObjectPath* op, CMPIStatus* rc) {
    return made(newInstance(op, Owner::Arena), rc);
}

CMPIObjectPath* newObjectPathFn(const CMPIBroker* mb, const char* ns, const char* cn, CMPIStatus* rc) {
    setRc(rc, CMPI_RC_OK);
    return newObjectPath(ns != nullptr ? ns : "", cn != nullptr ? cn : "", coreOf(mb), Owner::Arena);
}

CMPIArgs* newArgsFn(const CMPIBroker* /*mb*/, CMPIStatus* rc) { return made(newArgs(Owner::Arena), rc); }

CMPIString* newStringFn(const CMPIBroker* /*mb*/, const char* data, CMPIStatus* rc) {
    return made(data != nullptr ? newString(data, Owner::Arena) : nullptr, rc);
}

CMPIArray* newArrayFn(const CMPIBroker* /*mb*/, CMPICount max, CMPIType type, CMPIStatus* rc) {
    if (!isKnownType(static_cast<CMPIType>(type & ~CMPI_ARRAY))) {
        setRc(rc, CMPI_RC_ERR_INVALID_DATA_TYPE);
        return nullptr;
    }
    return made(newArray(max, type, Owner::Arena), rc);
}

CMPIDateTime* newDateTimeFn(const CMPIBroker* /*mb*/, CMPIStatus* rc) { return made(newDateTimeNow(Owner::Arena), rc); }

CMPIDateTime* newDateTimeFromBinary(const CMPIBroker* /*mb*/, CMPIUint64 binTime, CMPIBoolean interval, CMPIStatus* rc) {
    return made(newDateTime(binTime, interval != 0, Owner::Arena), rc);
}

CMPIDateTime* newDateTimeFromChars(const CMPIBroker* /*mb*/, const char* text, CMPIStatus* rc) {
    std::optional<DateTimeImpl> parsed = text != nullptr ? parseDateTime(text) : std::nullopt;
    return made(parsed ? newDateTime(parsed->micros, parsed->interval, Owner::Arena) : nullptr, rc);
}

CMPISelectExp* newSelectExpFn(const CMPIBroker* /*mb*/, const char* query, const char* lang, CMPIArray** projection,
                              CMPIStatus* rc) {
    CMPISelectExp* exp = newSelectExp(query, lang, Owner::Arena, rc);
    if (projection != nullptr) {
        *projection = nullptr;
        SelectExpImpl* e = selectExpImpl(exp);
        if (e != nullptr && !e->query.projection.empty()) {
            const auto& names = e->query.projection;
            *projection = newArray(static_cast<CMPICount>(names.size()), CMPI_string, Owner::Arena);
            for (CMPICount i = 0; i < names.size(); ++i) {
                (*projection)->ft->setElementAt(*projection, i, reinterpret_cast<const CMPIValue*>(names[i].c_str()),
                                                CMPI_chars);
            }
        }
    }
    return exp;
}

CMPIBoolean classPathIsA(const CMPIBroker* mb, const CMPIObjectPath* op, const char* type, CMPIStatus* rc) {
    ObjectPathImpl* path = objectPathImpl(op);
    CoreServices* core = coreOf(mb);
    if (path == nullptr || type == nullptr || core == nullptr) {
        setRc(rc, CMPI_RC_ERR_INVALID_PARAMETER);
        return 0;
    }
    setRc(rc, CMPI_RC_OK);
    return static_cast<CMPIBoolean>(core->isA(path->nameSpace, path->className, type));
}

// The type name of one of our objects, from its function table.
const char* typeName(const void* object) {
    if (object == nullptr) {
        return nullptr;
    }
    const void* ft = static_cast<const ObjectBase*>(object)->ft;
    struct Entry {
        const void* ft;
        const char* name;
    };
    static const Entry kNames[] = {
        {&kInstanceFT, "CMPIInstance"},   {&kObjectPathFT, "CMPIObjectPath"}, {&kArgsFT, "CMPIArgs"},
        {&kStringFT, "CMPIString"},       {&kArrayFT, "CMPIArray"},           {&kEnumerationFT, "CMPIEnumeration"},
        {&kDateTimeFT, "CMPIDateTime"},   {&kSelectExpFT, "CMPISelectExp"},   {&kSelectCondFT, "CMPISelectCond"},
        {&kSubCondFT, "CMPISubCond"},     {&kPredicateFT, "CMPIPredicate"},   {&kResultFT, "CMPIResult"},
        {&kContextFT.std, "CMPIContext"}, {&kErrorFT, "CMPIError"},
    };
    for (const Entry& entry : kNames) {
        if (entry.ft == ft) {
            return entry.name;
        }
    }
    return nullptr;
}

CMPIString* toStringFn(const CMPIBroker* /*mb*/, const void* object, CMPIStatus* rc) {
    if (InstanceImpl* inst = instanceImpl(static_cast<const CMPIInstance*>(object)); inst != nullptr) {
        setRc(rc, CMPI_RC_OK);
        return newString(instanceText(*inst), Owner::Arena);
    }
    if (ObjectPathImpl* path = objectPathImpl(static_cast<const CMPIObjectPath*>(object)); path != nullptr) {
        setRc(rc, CMPI_RC_OK);
        return newString(objectPathText(*path), Owner::Arena);
    }
    setRc(rc, CMPI_RC_ERR_NOT_SUPPORTED);
    return nullptr;
}

CMPIBoolean isOfType(const CMPIBroker* /*mb*/, const void* object, const char* type, CMPIStatus* rc) {
    const char* name = typeName(object);
    setRc(rc, name != nullptr ? CMPI_RC_OK : CMPI_RC_ERR_INVALID_HANDLE);
    return static_cast<CMPIBoolean>(name != nullptr && type != nullptr && std::string(name) == type);
}

CMPIString* getType(const CMPIBroker* /*mb*/, const void* object, CMPIStatus* rc) {
    const char* name = typeName(object);
    setRc(rc, name != nullptr ? CMPI_RC_OK : CMPI_RC_ERR_INVALID_HANDLE);
    return name != nullptr ? newString(name, Owner::Arena) : nullptr;
}

// Message catalogues are not kept: the default message comes back, unformatted,
// with CMPI_RC_ERR_NOT_SUPPORTED (as in sfcb).
CMPIString* getMessage(const CMPIBroker* /*mb*/, const char* /*msgId*/, const char* defMsg, CMPIStatus* rc,
                       CMPICount /*count*/, ...) {
    setRc(rc, CMPI_RC_ERR_NOT_SUPPORTED);
    return newString(defMsg != nullptr ? defMsg : "", Owner::Arena);
}

CMPIStatus writeLog(const char* kind, int level, const char* id, const char* text, const CMPIString* string) {
    const char* extra = stringText(string);
    std::fprintf(stderr, "[%s %d] %s: %s%s%s\n", kind, level, id != nullptr ? id : "", text != nullptr ? text : "",
                 extra != nullptr ? " " : "", extra != nullptr ? extra : "");
    return okStatus();
}

CMPIStatus logMessage(const CMPIBroker* /*mb*/, int severity, const char* id, const char* text, const CMPIString* string) {
    return writeLog("log", severity, id, text, string);
}

CMPIStatus trace(const CMPIBroker* /*mb*/, int level, const char* component, const char* text, const CMPIString* string) {
    return writeLog("trace", level, component, text, string);
}

CMPIError* newCMPIError(const CMPIBroker* /*mb*/, const char* owner, const char* msgID, const char* msg,
                        const CMPIErrorSeverity sev, const CMPIErrorProbableCause pc, const CMPIrc cimStatusCode,
                        CMPIStatus* rc) {
    ErrorImpl fields;
    fields.owningEntity = owner != nullptr ? owner : "";
    fields.messageId = msgID != nullptr ? msgID : "";
    fields.message = msg != nullptr ? msg : "";
    fields.severity = sev;
    fields.cause = pc;
    fields.statusCode = cimStatusCode;
    return made(newError(std::move(fields), Owner::Arena), rc);
}

CMPIStatus openMessageFile(const CMPIBroker* /*mb*/, const char* /*msgFile*/, CMPIMsgFileHandle* handle) {
    if (handle != nullptr) {
        *handle = nullptr;
    }
    return CMPIStatus{CMPI_RC_ERR_NOT_SUPPORTED, nullptr};
}

CMPIStatus closeMessageFile(const CMPIBroker* /*mb*/, const CMPIMsgFileHandle /*handle*/) {
    return CMPIStatus{CMPI_RC_ERR_NOT_SUPPORTED, nullptr};
}

CMPIString* getMessage2(const CMPIBroker* /*mb*/, const char* /*msgId*/, const CMPIMsgFileHandle /*handle*/,
                        const char* defMsg, CMPIStatus* rc, CMPICount /*count*/, ...) {
    setRc(rc, CMPI_RC_ERR_NOT_SUPPORTED);
    return newString(defMsg != nullptr ? defMsg : "", Owner::Arena);
}

}  // namespace

const CMPIBrokerEncFT kBrokerEncFT = {
    1,
    newInstanceFn,
    newObjectPathFn,
    newArgsFn,
    newStringFn,
    newArrayFn,
    newDateTimeFn,
    newDateTimeFromBinary,
    newDateTimeFromChars,
    newSelectExpFn,
    classPathIsA,
    toStringFn,
    isOfType,
    getType,
    getMessage,
    logMessage,
    trace,
    newCMPIError,
    openMessageFile,
    closeMessageFile,
    getMessage2,
};

}  // namespace orv::host::detail
