// Date-times: binary microseconds, intervals and both CIM string forms.
#include "core_fixture.hpp"
#include "datetime.hpp"

namespace orv::host::test {
namespace {

using DateTimeTest = CoreTest;

TEST_F(DateTimeTest, BinaryPointFormatsAsUtcString) {
    CMPIDateTime* dt = mb()->eft->newDateTimeFromBinary(mb(), 1234567890123456ULL, 0, nullptr);
    EXPECT_EQ(text(dt->ft->getStringFormat(dt, nullptr)), "20090213233130.123456+000");
    EXPECT_FALSE(dt->ft->isInterval(dt, nullptr));
    EXPECT_EQ(dt->ft->getBinaryFormat(dt, nullptr), 1234567890123456ULL);
}

TEST_F(DateTimeTest, IntervalFormatsWithDaysAndColon) {
    CMPIUint64 micros = ((3ULL * 86400 + 4 * 3600 + 5 * 60 + 6) * 1000000ULL) + 7;
    CMPIDateTime* dt = mb()->eft->newDateTimeFromBinary(mb(), micros, 1, nullptr);
    EXPECT_EQ(text(dt->ft->getStringFormat(dt, nullptr)), "00000003040506.000007:000");
    EXPECT_TRUE(dt->ft->isInterval(dt, nullptr));
}

std::string stringOf(const CMPIBroker* broker, CMPIUint64 micros, bool interval) {
    CMPIDateTime* dt = broker->eft->newDateTimeFromBinary(broker, micros, interval ? 1 : 0, nullptr);
    return text(dt->ft->getStringFormat(dt, nullptr));
}

TEST_F(DateTimeTest, LastMicrosecondOf9999IsWrittenAsIs) {
    EXPECT_EQ(stringOf(mb(), 253402300799999999ULL, false), "99991231235959.999999+000");
}

// A build date before 1970 whose arithmetic wrapped below zero lands far beyond
// year 9999: the string form carries four year digits, so it is the latest
// timestamp, never a longer string.
TEST_F(DateTimeTest, PointsBeyondYear9999AreClampedToTheLatestTimestamp) {
    EXPECT_EQ(stringOf(mb(), 253402300800000000ULL, false), "99991231235959.999999+000");
    const CMPIUint64 wrappedBuildDate = static_cast<CMPIUint64>(-86400LL * 365) * 1000000ULL;
    EXPECT_EQ(stringOf(mb(), wrappedBuildDate, false), "99991231235959.999999+000");
    EXPECT_EQ(stringOf(mb(), ~0ULL, false), "99991231235959.999999+000");
}

TEST_F(DateTimeTest, IntervalsOfAHundredMillionDaysAreClampedNotWrapped) {
    const CMPIUint64 lastDay = (99999999ULL * 86400 + 86399) * 1000000ULL + 999999;
    EXPECT_EQ(stringOf(mb(), lastDay, true), "99999999235959.999999:000");
    EXPECT_EQ(stringOf(mb(), lastDay + 1, true), "99999999235959.999999:000");
    EXPECT_EQ(stringOf(mb(), ~0ULL, true), "99999999235959.999999:000");
}

TEST_F(DateTimeTest, StringFormsParseBackIncludingTheUtcOffset) {
    CMPIDateTime* utc = mb()->eft->newDateTimeFromChars(mb(), "20090213233130.123456+000", nullptr);
    EXPECT_EQ(utc->ft->getBinaryFormat(utc, nullptr), 1234567890123456ULL);
    CMPIDateTime* east = mb()->eft->newDateTimeFromChars(mb(), "20090214003130.123456+060", nullptr);
    EXPECT_EQ(east->ft->getBinaryFormat(east, nullptr), 1234567890123456ULL);
    CMPIDateTime* west = mb()->eft->newDateTimeFromChars(mb(), "20090213223130.123456-060", nullptr);
    EXPECT_EQ(west->ft->getBinaryFormat(west, nullptr), 1234567890123456ULL);
    CMPIDateTime* interval = mb()->eft->newDateTimeFromChars(mb(), "00000001000000.000000:000", nullptr);
    EXPECT_TRUE(interval->ft->isInterval(interval, nullptr));
    EXPECT_EQ(interval->ft->getBinaryFormat(interval, nullptr), 86400ULL * 1000000ULL);
}

TEST_F(DateTimeTest, MalformedStringsAreRefused) {
    CMPIStatus rc{};
    EXPECT_EQ(mb()->eft->newDateTimeFromChars(mb(), "2009", &rc), nullptr);
    EXPECT_EQ(rc.rc, CMPI_RC_ERR_INVALID_PARAMETER);
    EXPECT_FALSE(detail::parseDateTime("20091313233130.123456+000"));
    EXPECT_FALSE(detail::parseDateTime("20090213233130.123456*000"));
    EXPECT_FALSE(detail::parseDateTime("00000001250000.000000:000"));
}

TEST_F(DateTimeTest, NowIsAPointInTime) {
    CMPIDateTime* now = mb()->eft->newDateTime(mb(), nullptr);
    EXPECT_FALSE(now->ft->isInterval(now, nullptr));
    EXPECT_GT(now->ft->getBinaryFormat(now, nullptr), 1600000000ULL * 1000000ULL);
    CMPIDateTime* copy = now->ft->clone(now, nullptr);
    EXPECT_EQ(copy->ft->getBinaryFormat(copy, nullptr), now->ft->getBinaryFormat(now, nullptr));
    copy->ft->release(copy);
}

}  // namespace
}  // namespace orv::host::test
