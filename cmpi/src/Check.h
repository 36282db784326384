// Turning the broker's answers into exceptions.
#ifndef ORV_CMPI_SRC_CHECK_H
#define ORV_CMPI_SRC_CHECK_H

#include <cmpidt.h>

namespace cmpibinding {

// A status to be filled by a broker call.
inline CMPIStatus freshStatus() { return CMPIStatus{CMPI_RC_OK, nullptr}; }

// Throws the status as CmpiStatus.
[[noreturn]] void throwStatus(const CMPIStatus& st);
// Throws the status as CmpiStatus unless it is OK (the test inline, the throw not).
inline void throwOnError(const CMPIStatus& st) {
    if (st.rc != CMPI_RC_OK) [[unlikely]] {
        throwStatus(st);
    }
}

// Runs a broker call that reports through a status pointer, throws its
// status unless OK, and returns its result.
template <class Call>
auto checked(Call&& call) {
    CMPIStatus st = freshStatus();
    auto result = call(&st);
    throwOnError(st);
    return result;
}

}  // namespace cmpibinding

#endif
