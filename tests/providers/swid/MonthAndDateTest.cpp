// Month names and release dates as the software identity reads them.
#include <gtest/gtest.h>

#include <cstdlib>
#include <ctime>
#include <utility>

#include "HypervisorSWID-Version.h"

namespace swid {
namespace {

using HypervisorSWID::charToNumMonth;

TEST(MonthTest, FullAndShortEnglishNamesMapToTheirMonths) {
    const std::pair<const char*, int> months[] = {
        {"Jan", 0}, {"Feb", 1}, {"Mar", 2}, {"Apr", 3}, {"May", 4},  {"Jun", 5},
        {"Jul", 6}, {"Aug", 7}, {"Sep", 8}, {"Oct", 9}, {"Nov", 10}, {"Dec", 11},
        {"January", 0}, {"February", 1}, {"March", 2}, {"April", 3}, {"June", 5},
        {"July", 6}, {"August", 7}, {"September", 8}, {"October", 9}, {"November", 10}, {"December", 11},
    };
    for (const auto& [name, month] : months) {
        EXPECT_EQ(charToNumMonth(name), month) << name;
    }
}

TEST(MonthTest, LettersAfterTheFirstMayBeEitherCase) {
    EXPECT_EQ(charToNumMonth("APR"), 3);
    EXPECT_EQ(charToNumMonth("AUG"), 7);
    EXPECT_EQ(charToNumMonth("JUN"), 5);
    EXPECT_EQ(charToNumMonth("JUL"), 6);
    EXPECT_EQ(charToNumMonth("MAR"), 2);
    EXPECT_EQ(charToNumMonth("MAY"), 4);
    EXPECT_EQ(charToNumMonth("JAN"), 0);
}

TEST(MonthTest, FirstLetterInLowerCaseIsJanuary) {
    for (const char* name : {"dec", "feb", "jul", "nov", "oct", "sep", "aug", "may"}) {
        EXPECT_EQ(charToNumMonth(name), 0) << name;
    }
}

TEST(MonthTest, ALettersOtherThanPOrUAreJanuary) {
    EXPECT_EQ(charToNumMonth("A"), 0);
    EXPECT_EQ(charToNumMonth("Ax"), 0);
    EXPECT_EQ(charToNumMonth("Ap"), 3);
    EXPECT_EQ(charToNumMonth("Au"), 7);
}

TEST(MonthTest, JDecidesBySecondThenThirdLetter) {
    EXPECT_EQ(charToNumMonth("Jan"), 0);
    EXPECT_EQ(charToNumMonth("Jaz"), 0);
    EXPECT_EQ(charToNumMonth("Jxn"), 5);
    EXPECT_EQ(charToNumMonth("Jxl"), 6);
    EXPECT_EQ(charToNumMonth("Jux"), 0);
    EXPECT_EQ(charToNumMonth("Ju"), 0);
    EXPECT_EQ(charToNumMonth("J"), 0);
}

TEST(MonthTest, MDecidesByTheThirdLetter) {
    EXPECT_EQ(charToNumMonth("Mxr"), 2);
    EXPECT_EQ(charToNumMonth("Mxy"), 4);
    EXPECT_EQ(charToNumMonth("Max"), 0);
    EXPECT_EQ(charToNumMonth("Ma"), 0);
    EXPECT_EQ(charToNumMonth("M"), 0);
}

TEST(MonthTest, SingleLetterMonthsNeedOnlyTheirFirstLetter) {
    EXPECT_EQ(charToNumMonth("D"), 11);
    EXPECT_EQ(charToNumMonth("Fxx"), 1);
    EXPECT_EQ(charToNumMonth("N"), 10);
    EXPECT_EQ(charToNumMonth("Oops"), 9);
    EXPECT_EQ(charToNumMonth("Sept"), 8);
}

TEST(MonthTest, AnyOtherFirstLetterIsJanuary) {
    EXPECT_EQ(charToNumMonth(""), 0);
    EXPECT_EQ(charToNumMonth("Xyz"), 0);
    EXPECT_EQ(charToNumMonth("1"), 0);
}

class ReleaseDateTest : public ::testing::Test {
protected:
    void SetUp() override { useTimeZone("UTC"); }
    void TearDown() override { useTimeZone("UTC"); }
    static void useTimeZone(const char* tz) {
        ::setenv("TZ", tz, 1);
        ::tzset();
    }
    static std::uint64_t releaseOf(const char* buildDate) {
        std::uint64_t microseconds = 0;
        EXPECT_TRUE(HypervisorSWID::releaseDateOf(buildDate, microseconds)) << buildDate;
        return microseconds;
    }
};

TEST_F(ReleaseDateTest, UtcMidnightInMicroseconds) {
    EXPECT_EQ(releaseOf("Jul 5 2016"), 1467676800ULL * 1000000);
    EXPECT_EQ(releaseOf("Jan 1 1970"), 0U);
    EXPECT_EQ(releaseOf("Dec 31 1999"), 946598400ULL * 1000000);
}

TEST_F(ReleaseDateTest, StandardTimeMidnightUnderDaylightSaving) {
    useTimeZone("CET-1CEST,M3.5.0,M10.5.0/3");
    EXPECT_EQ(releaseOf("Jul 5 2016"), (1467676800ULL - 3600) * 1000000);
}

TEST_F(ReleaseDateTest, SmallYearsAreYearsSince1900) {
    EXPECT_EQ(releaseOf("Jul 5 116"), 1467676800ULL * 1000000);
    EXPECT_EQ(releaseOf("Jul 5 1901"), releaseOf("Jul 5 1"));
}

TEST_F(ReleaseDateTest, DayOutOfRangeRollsOver) {
    EXPECT_EQ(releaseOf("Feb 30 2016"), releaseOf("Mar 1 2016"));
}

TEST_F(ReleaseDateTest, TextWithoutAllThreeItemsHasNoDate) {
    std::uint64_t microseconds = 42;
    EXPECT_FALSE(HypervisorSWID::releaseDateOf("", microseconds));
    EXPECT_FALSE(HypervisorSWID::releaseDateOf("Jul", microseconds));
    EXPECT_FALSE(HypervisorSWID::releaseDateOf("Jul 5", microseconds));
    EXPECT_FALSE(HypervisorSWID::releaseDateOf("Jul x 2016", microseconds));
    EXPECT_EQ(microseconds, 42U);
}

}  // namespace
}  // namespace swid
