// Joining a network namespace made with `ip netns add`.
#pragma once

#include <string>

namespace orv::linuxtest {

// Moves the calling thread into /var/run/netns/<name> (sockets it makes
// afterwards belong there); false when it cannot.
bool joinNamedNamespace(const std::string& name);

}  // namespace orv::linuxtest
