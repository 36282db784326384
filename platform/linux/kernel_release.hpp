// Whether the running kernel names a link's parent bus device in its rtnetlink
// answers (IFLA_PARENT_DEV_NAME, sent since Linux 5.16).
#pragma once

#include <string_view>

namespace orv::linuxhost {

// From a kernel release text as uname writes it: "5.16", "6.1.0-13-amd64" ->
// true; "5.15.0-91-generic" -> false. A text that does not start with
// "<major>.<minor>" is taken for an older kernel (false).
bool releaseNamesParentDevices(std::string_view release);

// The running kernel's answer, read from uname once per process.
bool kernelNamesParentDevices();

}  // namespace orv::linuxhost
