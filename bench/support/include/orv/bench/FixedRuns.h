// The "--fixed=N" mode of the benchmark programs: N requests and nothing else
// (no Google Benchmark timing loop), for valgrind --tool=callgrind counts.
#pragma once

#include <cstdlib>
#include <cstring>

namespace orv::bench {

// N of a "--fixed=N" argument, or -1 when the command line has none.
inline long fixedRuns(int argc, char** argv) {
    for (int i = 1; i < argc; ++i) {
        if (std::strncmp(argv[i], "--fixed=", 8) == 0) {
            return std::atol(argv[i] + 8);
        }
    }
    return -1;
}

}  // namespace orv::bench
