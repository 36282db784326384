#include "latched_health_scenario.hpp"

#include <gtest/gtest.h>

#include <chrono>
#include <ctime>
#include <iostream>
#include <thread>

#include "heartbeat_lines.hpp"
#include "latched_health_client.hpp"

namespace orv::e2e {

namespace {

using Clock = std::chrono::steady_clock;
using Records = std::vector<LatchedRecord>;

constexpr std::chrono::seconds kPeriod{120};
// Room for a busy machine beyond the period: a start, a pass and the requests.
constexpr std::chrono::seconds kSlack{60};
constexpr unsigned kClasses = 12;

constexpr int kOk = 5;
constexpr int kDegraded = 10;
constexpr int kFailed = 20;

// Polls `done` once a second until it holds or `limit` has passed; true when it held.
bool waitUntil(const std::function<bool()>& done, std::chrono::seconds limit,
               const std::function<std::string()>& brokerLog) {
    const auto deadline = Clock::now() + limit;
    while (!done()) {
        brokerLog();
        if (Clock::now() > deadline) {
            return false;
        }
        std::this_thread::sleep_for(std::chrono::seconds(1));
    }
    return true;
}

std::time_t secondsOf(const LatchedRecord& record) {
    const auto seconds = wholeSecondTimestamp(record.timestamp);
    EXPECT_TRUE(seconds.has_value()) << record;
    return seconds.value_or(0);
}

// Where class k's records stand from the second pass on: the second
// elements', latched by the first pass, then the first elements', appended by
// the second.
unsigned secondAt(unsigned k) { return k; }
unsigned firstAt(unsigned k) { return kClasses + k; }

LatchedRecord expected(unsigned eventId, unsigned watched, int healthState, const LatchedRecord& served) {
    return {eventId, kWatchedClasses[watched], "root/cimv2", healthState, served.timestamp};
}

void expectAssociation(int port, unsigned eventId, unsigned watched, Element element) {
    EXPECT_EQ(associatedElements(port, eventId), std::vector<std::string>{elementPath(kWatchedClasses[watched], element)})
        << "event " << eventId;
}

// Each record is served alone by its event number, and its association leads
// to its own element and to nothing else.
void expectServedOneByOne(int port, const Records& records) {
    for (unsigned i = 0; i < records.size(); ++i) {
        const LatchedRecord& record = records[i];
        EXPECT_EQ(recordsIn(getLatched(port, record.eventId)), Records{record});
        expectAssociation(port, record.eventId, i % kClasses, i < kClasses ? Element::Second : Element::First);
    }
}

// An escalation took the time of a later pass, at least a period after the
// state it replaced, and the replaced number finds nothing any more.
void expectEscalated(int port, const LatchedRecord& before, const LatchedRecord& escalated) {
    EXPECT_GE(secondsOf(escalated) - secondsOf(before), kPeriod.count()) << before << " " << escalated;
    EXPECT_NE(getLatched(port, before.eventId).find("failed to get instances"), std::string::npos)
        << getLatched(port, before.eventId);
    const std::vector<std::string> gone = associatedElements(port, before.eventId);
    EXPECT_TRUE(gone.size() == 1 && gone[0].find("Requested event id not found") != std::string::npos)
        << "event " << before.eventId << ": " << ::testing::PrintToString(gone);
}

// The third pass is the one after which every first element's record is failed.
bool firstElementsFailed(const Records& records) {
    if (records.size() != 2 * kClasses) {
        return false;
    }
    for (unsigned k = 0; k < kClasses; ++k) {
        if (records[firstAt(k)].healthState != kFailed) {
            return false;
        }
    }
    return true;
}

void logPass(int pass, Clock::time_point started) {
    std::cout << "pass " << pass << " seen after "
              << std::chrono::duration_cast<std::chrono::seconds>(Clock::now() - started).count() << " s" << std::endl;
}

// The records once `passed` holds, read at once: the next pass is a period away.
Records recordsAfter(int pass, const std::function<bool()>& passed, std::chrono::seconds limit, int port,
                     const std::function<std::string()>& brokerLog) {
    const bool seen = waitUntil(passed, limit, brokerLog);
    const Records records = latchedRecords(port);
    EXPECT_TRUE(seen) << "pass " << pass << " not seen; the roll-up is " << rollUpHealthState(port).value_or(-1)
                      << ", " << records.size() << " records" << brokerLog();
    return records;
}

// Pass 1: the second elements latched at degraded in the monitor's order, the first (OK) ones not.
void expectFirstPass(int port, const Records& records, std::time_t started) {
    for (unsigned k = 0; k < kClasses; ++k) {
        EXPECT_EQ(records[k], expected(k, k, kDegraded, records[k]));
        EXPECT_LE(std::labs(secondsOf(records[k]) - started), 10) << records[k];
    }
    expectServedOneByOne(port, records);
    EXPECT_EQ(rollUpHealthState(port), kDegraded);
}

// Pass 2 (recognised by its roll-up, failed): per class the first element is
// read first, so class k hands out 12 + 2k to the first element, now degraded
// and appended, then 13 + 2k to the second, escalated to failed in place.
void expectSecondPass(int port, const Records& before, const Records& records) {
    for (unsigned k = 0; k < kClasses; ++k) {
        const LatchedRecord& escalated = records[secondAt(k)];
        const LatchedRecord& appended = records[firstAt(k)];
        EXPECT_EQ(escalated, expected(kClasses + 2 * k + 1, k, kFailed, escalated));
        EXPECT_EQ(appended, expected(kClasses + 2 * k, k, kDegraded, appended));
        expectEscalated(port, before[secondAt(k)], escalated);
        // The new record takes the time of this pass too.
        EXPECT_GE(secondsOf(appended) - secondsOf(before[secondAt(k)]), kPeriod.count()) << appended;
    }
    expectServedOneByOne(port, records);
}

// Pass 3: the second pass handed out 12 to 35, so class k's first element,
// now failed, escalates in place to 36 + k; the second element reads degraded,
// lower than its latched failed, which changes nothing. The roll-up stays failed.
void expectThirdPass(int port, const Records& before, const Records& records) {
    for (unsigned k = 0; k < kClasses; ++k) {
        const LatchedRecord& escalated = records[firstAt(k)];
        EXPECT_EQ(escalated, expected(3 * kClasses + k, k, kFailed, escalated));
        expectEscalated(port, before[firstAt(k)], escalated);
        EXPECT_EQ(records[secondAt(k)], before[secondAt(k)]);
    }
    expectServedOneByOne(port, records);
    EXPECT_EQ(rollUpHealthState(port), kFailed);
}

// Pass 4 (recognised by its roll-up, OK): every element OK again; the roll-up
// dropped, the records stay as they were.
void expectFourthPass(int port, const Records& before, const Records& records) {
    EXPECT_EQ(records, before);
    expectServedOneByOne(port, records);
}

}  // namespace

void expectLatchingOverFourPasses(const HealthFixture& fixture, int port,
                                  const std::function<std::string()>& brokerLog) {
    const auto started = Clock::now();
    const std::time_t startedAt = std::time(nullptr);
    // After each pass the host changes at once, before the checks, so that the
    // next pass, a period later, is sure to see the new states.
    const Records first = recordsAfter(
        1, [&] { return latchedRecords(port).size() >= kClasses; }, kSlack, port, brokerLog);
    logPass(1, started);
    ASSERT_EQ(first.size(), kClasses) << brokerLog();
    fixture.write(kDegraded, kFailed);
    expectFirstPass(port, first, startedAt);

    const Records second = recordsAfter(
        2, [&] { return rollUpHealthState(port) == kFailed; }, kPeriod + kSlack, port, brokerLog);
    logPass(2, started);
    ASSERT_EQ(second.size(), 2 * kClasses) << brokerLog();
    fixture.write(kFailed, kDegraded);
    expectSecondPass(port, first, second);

    const Records third = recordsAfter(
        3, [&] { return firstElementsFailed(latchedRecords(port)); }, kPeriod + kSlack, port, brokerLog);
    logPass(3, started);
    ASSERT_EQ(third.size(), 2 * kClasses) << brokerLog();
    fixture.write(kOk, kOk);
    expectThirdPass(port, second, third);

    const Records fourth = recordsAfter(
        4, [&] { return rollUpHealthState(port) == kOk; }, kPeriod + kSlack, port, brokerLog);
    logPass(4, started);
    expectFourthPass(port, third, fourth);
}

}  // namespace orv::e2e
