// The machine's firmware identity from the kernel's DMI system information
// (/sys/class/dmi/id). Serial number and UUID are readable by root only on
// most kernels: what the caller may not read is left out.
#pragma once

#include "orv/platform/SystemIdentity.h"

#include <string>

namespace orv::linuxhost {

// root stands for "/" (empty: the machine's own tree). A file that is
// missing, unreadable or blank leaves its value out.
orv::platform::SystemIdentity readDmiIdentity(const std::string& root);

}  // namespace orv::linuxhost
