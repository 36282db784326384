// The latching of the health monitor as a client sees it over the monitor's
// first three passes, the same in either broker. The monitor passes once when
// it starts and then every 120 s of wall clock, so the scenario waits two real
// periods. Each watched class has two elements; between them they walk every
// step from OK to degraded to failed and back to OK:
//
//   pass   first element   second element   roll-up   records
//   1      OK (5)          degraded (10)    10        second elements latched at 10: events 0 to 11
//   2      degraded (10)   failed (20)      20        second elements escalate to 20 (new events),
//                                                     first elements latched at 10 (appended)
//   3      OK (5)          OK (5)           5         unchanged: OK lowers nothing
//
// Before the broker starts, the fixture must hold the first pass's states
// (HealthFixture::write(5, 10)); the scenario writes the next ones.
#pragma once

#include <functional>
#include <string>

#include "health_fixture.hpp"

namespace orv::e2e {

// Runs the scenario against the broker at `port`, which serves `fixture`.
// `brokerLog` is called while waiting (it may drain a pipe) and its text is
// added to failure messages.
void expectLatchingOverThreePasses(const HealthFixture& fixture, int port, const std::function<std::string()>& brokerLog);

}  // namespace orv::e2e
