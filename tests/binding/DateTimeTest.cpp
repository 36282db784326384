// CmpiDateTime conversions between binary microseconds and the CIM text form.
#include "CoreFixture.h"

#include <cmpi/CmpiDateTime.h>

namespace {

using DateTimeTest = orv::bindingtest::CoreFixture;

// 2009-02-13 23:31:30.123456 UTC.
constexpr CMPIUint64 kPoint = 1234567890123456ULL;
// 1 day, 1 hour, 1 minute, 1 second and 1 microsecond.
constexpr CMPIUint64 kSpan = 90061000001ULL;

TEST_F(DateTimeTest, PointInTimeFromBinaryGivesTheCimText) {
    CmpiDateTime dt(kPoint, false);
    EXPECT_FALSE(dt.isInterval());
    EXPECT_EQ(dt.getDateTime(), kPoint);
    EXPECT_STREQ(dt.getStringFormat().charPtr(), "20090213233130.123456+000");
}

TEST_F(DateTimeTest, PointInTimeFromCimTextGivesBinaryMicroseconds) {
    CmpiDateTime dt("20090213233130.123456+000");
    EXPECT_FALSE(dt.isInterval());
    EXPECT_EQ(dt.getDateTime(), kPoint);
}

TEST_F(DateTimeTest, IntervalFromBinaryGivesTheIntervalText) {
    CmpiDateTime dt(kSpan, true);
    EXPECT_TRUE(dt.isInterval());
    EXPECT_STREQ(dt.getStringFormat().charPtr(), "00000001010101.000001:000");
}

TEST_F(DateTimeTest, IntervalFromTextGivesBinaryMicroseconds) {
    CmpiDateTime dt("00000001010101.000001:000");
    EXPECT_TRUE(dt.isInterval());
    EXPECT_EQ(dt.getDateTime(), kSpan);
}

TEST_F(DateTimeTest, EpochIsAPointInTimeNotAnInterval) {
    CmpiDateTime dt(0, false);
    EXPECT_FALSE(dt.isInterval());
    EXPECT_STREQ(dt.getStringFormat().charPtr(), "19700101000000.000000+000");
}

TEST_F(DateTimeTest, CopyIsANewDateTimeWithTheSameValueAndFlag) {
    CmpiDateTime original(kSpan, true);
    CmpiDateTime copy(original);
    EXPECT_NE(copy.getEnc(), original.getEnc());
    EXPECT_EQ(copy.getDateTime(), kSpan);
    EXPECT_TRUE(copy.isInterval());
}

TEST_F(DateTimeTest, MalformedTextThrows) {
    EXPECT_THROW(CmpiDateTime("not a date"), CmpiStatus);
}

}  // namespace
