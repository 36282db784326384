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

// Keeps the item, or hands it to the streaming consumer and frees what was made
// for it since `mark` (the sink arena's newest object before the copy).
CMPIStatus append(ResultSink& sink, ReturnedItem::Kind kind, CMPIType type, void* object, const ObjectBase* mark) {
    if (sink.consumer == nullptr) {
        sink.items.push_back(itemOf(kind, type, object));
        return okStatus();
    }
    const CMPIStatus consumed = consume(sink, kind, type, object);
    sink.out->clearAfter(mark);
    return consumed;
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
    const ObjectBase* mark = sink->out->top();
    CMPIInstance* copy = nullptr;
    {
        ArenaGuard guard(*sink->out);
        copy = cloneInstance(instance, Owner::Arena);
    }
    if (copy == nullptr) {
        return status(CMPI_RC_ERR_INVALID_HANDLE, "returnInstance with an object that is not a live instance");
    }
    if (!admitted(*sink, copy)) {
        sink->out->clearAfter(mark);
        return okStatus();
    }
    return append(*sink, ReturnedItem::Kind::Instance, CMPI_instance, copy, mark);
}

CMPIStatus returnObjectPath(const CMPIResult* result, const CMPIObjectPath* path) {
    ResultSink* sink = sinkOf(result);
    if (sink == nullptr) {
        return CMPIStatus{CMPI_RC_ERR_INVALID_HANDLE, nullptr};
    }
    if (path == nullptr) {
        return status(CMPI_RC_ERR_INVALID_PARAMETER, "returnObjectPath with a NULL path");
    }
    const ObjectBase* mark = sink->out->top();
    const bool asInstance = sink->pathsAsInstances;
    void* copy = nullptr;
    {
        ArenaGuard guard(*sink->out);
        if (asInstance) {
            copy = objectPathImpl(path) != nullptr ? newInstance(path, Owner::Arena) : nullptr;
        } else {
            copy = cloneObjectPath(path, Owner::Arena);
        }
    }
    if (copy == nullptr) {
        return status(CMPI_RC_ERR_INVALID_HANDLE, "returnObjectPath with an object that is not a live object path");
    }
    if (asInstance) {
        ++sink->pathsTurnedIntoInstances;
        if (!admitted(*sink, static_cast<CMPIInstance*>(copy))) {
            sink->out->clearAfter(mark);
            return okStatus();
        }
        return append(*sink, ReturnedItem::Kind::Instance, CMPI_instance, copy, mark);
    }
    return append(*sink, ReturnedItem::Kind::ObjectPath, CMPI_ref, copy, mark);
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
