// The latching of the health monitor as a client sees it over the monitor's
// first four passes, the same in either broker. The monitor passes once when
// it starts and then every 120 s of wall clock, so the scenario waits three
// real periods. Each watched class has two elements: the first walks from OK
// to degraded to failed and back to OK; the second starts degraded, so that
// the first pass latches something, and escalates in the pass that appends
// the first, so that one class hands out two numbers in one pass. A class's
// first element is read before its second, and the classes in the monitor's
// order (k = 0 to 11), so the event numbers are:
//
//   pass   first element   second element   roll-up   records (class k)
//   1      OK (5)          degraded (10)    10        second latched at 10: event k
//   2      degraded (10)   failed (20)      20        first appended at 10: event 12 + 2k;
//                                                     second escalates in place to 20: 13 + 2k
//   3      failed (20)     degraded (10)    20        first escalates in place to 20: 36 + k;
//                                                     second unchanged: a lower state lowers nothing
//   4      OK (5)          OK (5)           5         unchanged: OK lowers nothing
//
// The list holds the twelve second elements' records, then the twelve first
// ones'. Before the broker starts, the fixture must hold the first pass's
// states (HealthFixture::write(5, 10)); the scenario writes the next ones.
#pragma once

#include <functional>
#include <string>

#include "health_fixture.hpp"

namespace orv::e2e {

// Runs the scenario against the broker at `port`, which serves `fixture`.
// `brokerLog` is called while waiting (it may drain a pipe) and its text is
// added to failure messages.
void expectLatchingOverFourPasses(const HealthFixture& fixture, int port, const std::function<std::string()>& brokerLog);

}  // namespace orv::e2e
