#include "result.hpp"

#include "error.hpp"
#include "instance.hpp"
#include "object_path.hpp"
#include "query_fallback.hpp"
#include "value.hpp"

namespace orv::host::detail {

namespace {

struct ResultImpl {
    ResultSink* sink;
};

ResultSink* sinkOf(const CMPIResult* result) {
    ResultImpl* r = implOf<ResultImpl>(result, &kResultFT);
    return r != nullptr ? r->sink : nullptr;
}

CMPIStatus status(CMPIrc rc, const char* message) { return makeStatus(rc, message); }

CMPIStatus release(CMPIResult* result) { return releaseAny(result, &kResultFT); }

CMPIResult* clone(const CMPIResult* /*result*/, CMPIStatus* rc) {
    setRc(rc, CMPI_RC_ERR_NOT_SUPPORTED);  // a result belongs to one MI call
    return nullptr;
}

// Whether an instance returned to the sink is kept (see ResultSink::query).
bool admitted(const ResultSink& sink, CMPIInstance* instance) {
    return sink.query == nullptr || admitForQuery(*sink.query, instance);
}

ReturnedItem itemOf(ReturnedItem::Kind kind, CMPIType type, void* object) {
    ReturnedItem item;
    item.kind = kind;
    item.data.type = type;
    item.data.state = CMPI_goodValue;
    item.data.value.inst = static_cast<CMPIInstance*>(object);
    return item;
}

// Hands an object to the streaming consumer (ResultSink::consumer).
CMPIStatus consume(const ResultSink& sink, ReturnedItem::Kind kind, CMPIType type, void* object) {
    if (!(*sink.consumer)(itemOf(kind, type, object))) {
        return status(CMPI_RC_ERR_FAILED, "the client no longer takes results of this request");
    }
    return okStatus();
}

// A copy of a returned object made by `copy` with `arena` current, so that it
// and its contents belong to that arena.
template <class Copy>
void* copyInto(Arena& arena, Copy&& copy) {
    ArenaGuard guard(arena);
    return copy();
}

// A returned object copied for the sink: kept in the sink's arena, or, for a
// streaming consumer, made in an arena of its own that is freed as soon as the
// consumer has it, so that a stream costs the memory of one object. An instance
// the query (if any) does not select is dropped.
template <class Copy>
CMPIStatus deliverCopy(ResultSink& sink, ReturnedItem::Kind kind, CMPIType type, bool isInstance, Copy&& copy,
                       const char* invalid) {
    if (sink.consumer != nullptr) {
        Arena scratch;
        void* object = copyInto(scratch, copy);
        if (object == nullptr) {
            return status(CMPI_RC_ERR_INVALID_HANDLE, invalid);
        }
        if (isInstance && !admitted(sink, static_cast<CMPIInstance*>(object))) {
            return okStatus();
        }
        return consume(sink, kind, type, object);
    }
    const ObjectBase* mark = sink.out->top();
    void* object = copyInto(*sink.out, copy);
    if (object == nullptr) {
        return status(CMPI_RC_ERR_INVALID_HANDLE, invalid);
    }
    if (isInstance && !admitted(sink, static_cast<CMPIInstance*>(object))) {
        sink.out->clearAfter(mark);
        return okStatus();
    }
    sink.items.push_back(itemOf(kind, type, object));
    return okStatus();
}

CMPIStatus returnData(const CMPIResult* result, const CMPIValue* value, CMPIType type) {
    ResultSink* sink = sinkOf(result);
    if (sink == nullptr) {
        return CMPIStatus{CMPI_RC_ERR_INVALID_HANDLE, nullptr};
    }
    if (type == CMPI_ref) {
        // sfcb aborts the provider process here; answer loudly instead.
        return status(CMPI_RC_ERR_INVALID_DATA_TYPE, "returnData with CMPI_ref: use returnObjectPath");
    }
    ReturnedItem item;
    MemberHome members(sink->out);
    if (CMPIrc rc = storeValue(item.data, value, type); rc != CMPI_RC_OK) {
        return CMPIStatus{rc, nullptr};
    }
    handOverValue(item.data, *sink->out);
    sink->items.push_back(item);
    return okStatus();
}

CMPIStatus returnInstance(const CMPIResult* result, const CMPIInstance* instance) {
    ResultSink* sink = sinkOf(result);
    if (sink == nullptr) {
        return CMPIStatus{CMPI_RC_ERR_INVALID_HANDLE, nullptr};
    }
    if (instance == nullptr) {
        return status(CMPI_RC_ERR_INVALID_PARAMETER, "returnInstance with a NULL instance");
    }
    if (sink->consumer != nullptr && sink->query == nullptr && instanceImpl(instance) != nullptr) {
        // No copy: the consumer is done with the provider's instance when it returns.
        return consume(*sink, ReturnedItem::Kind::Instance, CMPI_instance, const_cast<CMPIInstance*>(instance));
    }
    return deliverCopy(*sink, ReturnedItem::Kind::Instance, CMPI_instance, true,
                       [&]() -> void* { return cloneInstance(instance, Owner::Arena); },
                       "returnInstance with an object that is not a live instance");
}

CMPIStatus returnObjectPath(const CMPIResult* result, const CMPIObjectPath* path) {
    ResultSink* sink = sinkOf(result);
    if (sink == nullptr) {
        return CMPIStatus{CMPI_RC_ERR_INVALID_HANDLE, nullptr};
    }
    if (path == nullptr) {
        return status(CMPI_RC_ERR_INVALID_PARAMETER, "returnObjectPath with a NULL path");
    }
    const char* invalid = "returnObjectPath with an object that is not a live object path";
    if (!sink->pathsAsInstances) {
        return deliverCopy(*sink, ReturnedItem::Kind::ObjectPath, CMPI_ref, false,
                           [&]() -> void* { return cloneObjectPath(path, Owner::Arena); }, invalid);
    }
    if (objectPathImpl(path) == nullptr) {
        return status(CMPI_RC_ERR_INVALID_HANDLE, invalid);
    }
    ++sink->pathsTurnedIntoInstances;
    return deliverCopy(*sink, ReturnedItem::Kind::Instance, CMPI_instance, true,
                       [&]() -> void* { return newInstance(path, Owner::Arena); }, invalid);
}

CMPIStatus returnDone(const CMPIResult* result) {
    ResultSink* sink = sinkOf(result);
    if (sink == nullptr) {
        return CMPIStatus{CMPI_RC_ERR_INVALID_HANDLE, nullptr};
    }
    ++sink->done;
    return okStatus();
}

CMPIStatus returnError(const CMPIResult* result, const CMPIError* error) {
    ResultSink* sink = sinkOf(result);
    if (sink == nullptr) {
        return CMPIStatus{CMPI_RC_ERR_INVALID_HANDLE, nullptr};
    }
    ArenaGuard guard(*sink->out);
    CMPIError* copy = cloneError(error, Owner::Arena);
    if (copy == nullptr) {
        return status(CMPI_RC_ERR_INVALID_PARAMETER, "returnError with an object that is not a live error");
    }
    ReturnedItem item;
    item.kind = ReturnedItem::Kind::Error;
    item.data.type = CMPI_ptr;
    item.data.value.dataPtr.ptr = copy;
    sink->items.push_back(item);
    return okStatus();
}

}  // namespace

const CMPIResultFT kResultFT = {1, release, clone, returnData, returnInstance, returnObjectPath, returnDone, returnError};

CMPIResult* newResult(ResultSink& sink) {
    return makeObject<CMPIResult, ResultImpl>(&kResultFT, Owner::Caller, ResultImpl{&sink});
}


}  // namespace orv::host::detail
