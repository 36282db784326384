// Instruction counts of one request under callgrind.
//
// Run the program as `valgrind --tool=callgrind --collect-atstart=no prog ...`: the
// request is made once to warm caches and lazy set-up, then again with callgrind
// collecting, so the reported count is that of one steady-state request.
#pragma once

#include <valgrind/callgrind.h>

#include <cstddef>

namespace orv::bench {

// Calls `request` twice and collects only around the second call; returns what
// the second call returned (for example the number of instances it produced).
template <class Request>
std::size_t collectSecondRun(Request&& request) {
    request();
    CALLGRIND_ZERO_STATS;
    CALLGRIND_TOGGLE_COLLECT;
    const std::size_t result = request();
    CALLGRIND_TOGGLE_COLLECT;
    return result;
}

}  // namespace orv::bench
