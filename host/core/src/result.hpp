// CMPIResult: collects, in order, what a provider returns. Returned objects are
// copied into the sink's arena (the reply's or the up-calling invocation's),
// since the provider may change or release its own after returning them.
#pragma once

#include <vector>

#include "object.hpp"
#include "query.hpp"
#include "orv/host/broker_core.hpp"

namespace orv::host::detail {

extern const CMPIResultFT kResultFT;

struct ResultSink {
    explicit ResultSink(Arena& arena) : out(&arena) {}
    Arena* out;
    std::vector<ReturnedItem> items;
    unsigned done = 0;
    // Set for instance requests (EnumerateInstances, GetInstance): an object
    // path returned there is kept as an instance made from it (its keys as
    // properties, on that path), as the C++ binding does for its providers.
    bool pathsAsInstances = false;
    // How many paths were turned into instances so.
    unsigned pathsTurnedIntoInstances = 0;
    // Set while an enumeration answers a query (query_fallback.hpp): only the
    // instances the query selects are kept, cut down to its SELECT list.
    const Query* query = nullptr;
    // Set when the caller streams (CallOptions::onItem): instances and paths go to
    // it and are freed at once instead of being kept in `items`.
    const ItemConsumer* consumer = nullptr;
};

// A caller-owned result feeding `sink`; free it with disposeObject.
CMPIResult* newResult(ResultSink& sink);

}  // namespace orv::host::detail
