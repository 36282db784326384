// Reading the IP-changed indication orv-cimlistener prints (one text line
// each), for the end-to-end IP change tests of both brokers.
#pragma once

#include <string>
#include <vector>

#include "listener_process.hpp"

namespace orv::e2e {

// Waits for the listener's first line, at most one period of the kernel IP
// monitor (30 s) and some slack, and prints how long it took; the lines seen.
std::vector<std::string> waitForIpChange(listener::test::ListenerProcess& listener);

// Expects `line` to be the Orvane_KernelIPChangedIndication of vif0's IPv4
// address `previous` replaced by `current` on the simulated host.
void expectVif0Replaced(const std::string& line, const std::string& previous, const std::string& current);

}  // namespace orv::e2e
