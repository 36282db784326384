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

LatchedRecord expected(unsigned eventId, unsigned watched, int healthState, const LatchedRecord& served) {
    return {eventId, kWatchedClasses[watched], "root/cimv2", healthState, served.timestamp};
}

void expectAssociation(int port, unsigned eventId, unsigned watched, Element element) {
    EXPECT_EQ(associatedElements(port, eventId), std::vector<std::string>{elementPath(kWatchedClasses[watched], element)})
        << "event " << eventId;
}

void expectServedOneByOne(int port, const std::vector<LatchedRecord>& records) {
    for (const LatchedRecord& record : records) {
        EXPECT_EQ(recordsIn(getLatched(port, record.eventId)), std::vector<LatchedRecord>{record});
    }
}

void logPass(int pass, Clock::time_point started) {
    std::cout << "pass " << pass << " seen after "
              << std::chrono::duration_cast<std::chrono::seconds>(Clock::now() - started).count() << " s" << std::endl;
}

// The records once `passed` holds, read at once: the next pass is a period away.
std::vector<LatchedRecord> recordsAfter(int pass, const std::function<bool()>& passed, std::chrono::seconds limit,
                                        int port, const std::function<std::string()>& brokerLog) {
    const bool seen = waitUntil(passed, limit, brokerLog);
    const std::vector<LatchedRecord> records = latchedRecords(port);
    EXPECT_TRUE(seen) << "pass " << pass << " not seen; the roll-up is " << rollUpHealthState(port).value_or(-1)
                      << ", " << records.size() << " records" << brokerLog();
    return records;
}

// Pass 1: the second elements latched at degraded in the monitor's order, the first (OK) ones not.
void expectFirstPass(int port, const std::vector<LatchedRecord>& records, std::time_t started) {
    for (unsigned k = 0; k < kClasses; ++k) {
        EXPECT_EQ(records[k], expected(k, k, kDegraded, records[k]));
        EXPECT_LE(std::labs(secondsOf(records[k]) - started), 10) << records[k];
        expectAssociation(port, k, k, Element::Second);
    }
    expectServedOneByOne(port, records);
    EXPECT_EQ(rollUpHealthState(port), kDegraded);
}

// Pass 2: each second element escalates to failed with a new event number in
// place; each first element, now degraded, is appended. Per class the first
// element is read first, so class k hands out 12 + 2k (new) and 13 + 2k (escalated).
void expectSecondPass(int port, const std::vector<LatchedRecord>& before, const std::vector<LatchedRecord>& records) {
    for (unsigned k = 0; k < kClasses; ++k) {
        const LatchedRecord& escalated = records[k];
        const LatchedRecord& appended = records[kClasses + k];
        EXPECT_EQ(escalated, expected(kClasses + 2 * k + 1, k, kFailed, escalated));
        EXPECT_EQ(appended, expected(kClasses + 2 * k, k, kDegraded, appended));
        // The escalation takes the time of the pass, one period after the first.
        EXPECT_GE(secondsOf(escalated) - secondsOf(before[k]), kPeriod.count()) << before[k] << " " << escalated;
        expectAssociation(port, escalated.eventId, k, Element::Second);
        expectAssociation(port, appended.eventId, k, Element::First);
        // The replaced number finds nothing any more.
        EXPECT_NE(getLatched(port, k).find("failed to get instances"), std::string::npos) << getLatched(port, k);
        const std::vector<std::string> gone = associatedElements(port, k);
        EXPECT_TRUE(gone.size() == 1 && gone[0].find("Requested event id not found") != std::string::npos)
            << "event " << k << ": " << ::testing::PrintToString(gone);
    }
    expectServedOneByOne(port, records);
}

// Pass 3: every element OK again; the roll-up dropped, the records stay as they were.
void expectThirdPass(int port, const std::vector<LatchedRecord>& before, const std::vector<LatchedRecord>& records) {
    EXPECT_EQ(records, before);
    for (unsigned k = 0; k < kClasses; ++k) {
        expectAssociation(port, before[k].eventId, k, Element::Second);
        expectAssociation(port, before[kClasses + k].eventId, k, Element::First);
    }
}

}  // namespace

void expectLatchingOverThreePasses(const HealthFixture& fixture, int port,
                                   const std::function<std::string()>& brokerLog) {
    const auto started = Clock::now();
    const std::time_t startedAt = std::time(nullptr);
    // After each pass the host changes at once, before the checks, so that the
    // next pass, a period later, is sure to see the new states.
    const std::vector<LatchedRecord> first = recordsAfter(
        1, [&] { return latchedRecords(port).size() >= kClasses; }, kSlack, port, brokerLog);
    logPass(1, started);
    ASSERT_EQ(first.size(), kClasses) << brokerLog();
    fixture.write(kDegraded, kFailed);
    expectFirstPass(port, first, startedAt);

    const std::vector<LatchedRecord> second = recordsAfter(
        2, [&] { return rollUpHealthState(port) == kFailed; }, kPeriod + kSlack, port, brokerLog);
    logPass(2, started);
    ASSERT_EQ(second.size(), 2 * kClasses) << brokerLog();
    fixture.write(kOk, kOk);
    expectSecondPass(port, first, second);

    const std::vector<LatchedRecord> third = recordsAfter(
        3, [&] { return rollUpHealthState(port) == kOk; }, kPeriod + kSlack, port, brokerLog);
    logPass(3, started);
    expectThirdPass(port, second, third);
}

}  // namespace orv::e2e
