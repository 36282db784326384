// The boot.cfg reader on its own, over the shapes of line a boot bank may hold.
#include <gtest/gtest.h>

#include <cstdio>
#include <cstring>
#include <memory>
#include <string>

#include "HypervisorSWID-Version.h"

namespace swid {
namespace {

using Record = TmkuserVersion_SystemVersionInfo;

Record parse(const std::string& content) {
    Record record{};
    std::string buffer = content;
    std::unique_ptr<std::FILE, int (*)(std::FILE*)> file(
        buffer.empty() ? std::tmpfile() : ::fmemopen(buffer.data(), buffer.size(), "r"), std::fclose);
    EXPECT_NE(file, nullptr);
    if (file) {
        HypervisorSWID::readAlternateBootConfig(file.get(), record);
    }
    return record;
}

bool isAllZero(const Record& record) {
    const Record zero{};
    return std::memcmp(&record, &zero, sizeof record) == 0;
}

TEST(BootCfgParserTest, ThreeNumberBuildGivesTheLastNumber) {
    const Record record = parse("build=6.0.0-3.58.4192238\n");
    EXPECT_STREQ(record.product, "Orvane Zolti");
    EXPECT_STREQ(record.productVersion, "6.0.0");
    EXPECT_EQ(record.talmekBuild, 4192238U);
    EXPECT_STREQ(record.buildVersion, "");
    EXPECT_STREQ(record.buildDate, "");
}

TEST(BootCfgParserTest, OneNumberBuildGivesThatNumber) {
    EXPECT_EQ(parse("build=6.0.0-4192238\n").talmekBuild, 4192238U);
}

TEST(BootCfgParserTest, CarriageReturnAndTrailingBlanksAreStripped) {
    EXPECT_EQ(parse("build=6.0.0-4192238\r\n").talmekBuild, 4192238U);
    EXPECT_EQ(parse("build=6.0.0-4192238  \t\v\f \n").talmekBuild, 4192238U);
}

TEST(BootCfgParserTest, LeadingZerosGiveMinusOne) {
    EXPECT_EQ(parse("build=6.0.0-3.58.04192238\n").talmekBuild, 0xffffffffU);
    EXPECT_EQ(parse("build=6.0.0-04192238\n").talmekBuild, 0xffffffffU);
    EXPECT_EQ(parse("build=6.0.0-0\n").talmekBuild, 0U);
}

TEST(BootCfgParserTest, OtherNumberCountsGiveMinusOne) {
    EXPECT_EQ(parse("build=6.0.0-3.58\n").talmekBuild, 0xffffffffU);
    EXPECT_EQ(parse("build=6.0.0-\n").talmekBuild, 0xffffffffU);
    EXPECT_EQ(parse("build=6.0.0-abc\n").talmekBuild, 0xffffffffU);
    EXPECT_EQ(parse("build=6.0.0-1.2.3.4\n").talmekBuild, 0xffffffffU);
}

TEST(BootCfgParserTest, NegativeNumberAfterASecondDashIsKeptAsUnsigned) {
    const Record record = parse("build=6.0.0--5\n");
    EXPECT_STREQ(record.productVersion, "6.0.0");
    EXPECT_EQ(record.talmekBuild, static_cast<std::uint32_t>(-5));
}

TEST(BootCfgParserTest, NoDashLeavesTheRecordZero) {
    EXPECT_TRUE(isAllZero(parse("build=6.0.0\n")));
}

TEST(BootCfgParserTest, BuildKeyNotAtTheLineStartIsNotUsed) {
    EXPECT_TRUE(isAllZero(parse(" build=6.0.0-1\nkernelopt=build=6.0.0-2\n")));
    EXPECT_EQ(parse("kernelopt=build=6.0.0-2\nbuild=6.0.0-3\n").talmekBuild, 3U);
}

TEST(BootCfgParserTest, OnlyTheFirstBuildLineCounts) {
    EXPECT_TRUE(isAllZero(parse("build=6.0.0\nbuild=6.0.0-3\n")));
}

TEST(BootCfgParserTest, EmptyFileLeavesTheRecordZero) {
    EXPECT_TRUE(isAllZero(parse("")));
}

TEST(BootCfgParserTest, VeryLongLinesAreReadWhole) {
    const std::string filler(100000, 'x');
    const Record skipped = parse("title=" + filler + "\nbuild=6.0.0-7\n");
    EXPECT_EQ(skipped.talmekBuild, 7U);
    const Record longVersion = parse("build=" + filler + "-8\n");
    EXPECT_EQ(std::string(longVersion.productVersion), std::string(31, 'x'));
    EXPECT_EQ(longVersion.talmekBuild, 8U);
    EXPECT_EQ(parse("build=6.0.0-" + filler + "\n").talmekBuild, 0xffffffffU);
}

TEST(BootCfgParserTest, NulInsideTheLineEndsTheValue) {
    EXPECT_TRUE(isAllZero(parse(std::string("build=6.0.0\0-1\n", 16))));
}

}  // namespace
}  // namespace swid
