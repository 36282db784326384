// KSI parameters naming the default TCP/IP stack, then the given texts
// (interface name, address).
#pragma once

#include "linux_ksi.hpp"

#include <initializer_list>
#include <string>

namespace orv::linuxtest {

inline orv::platform::KsiParams stackParams(std::initializer_list<std::string> rest)
{
    orv::platform::KsiParams params{KSI_Param::ofString(orv::linuxhost::kDefaultStack)};
    for (const auto& item : rest) params.push_back(KSI_Param::ofString(item));
    return params;
}

}  // namespace orv::linuxtest
