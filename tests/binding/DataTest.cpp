// CmpiData types, states and conversions.
#include "CoreFixture.h"

#include <cmpi/CmpiArray.h>
#include <cmpi/CmpiData.h>
#include <cmpi/CmpiDateTime.h>
#include <cmpi/CmpiInstance.h>

#include <functional>

namespace {

using DataTest = orv::bindingtest::CoreFixture;

constexpr CMPIUint64 kNoon() { return 43200000000ULL; }

CMPIrc thrownCode(const std::function<void()>& f) {
    try {
        f();
    } catch (const CmpiStatus& st) {
        return st.rc();
    }
    return CMPI_RC_OK;
}

TEST_F(DataTest, BooleanAndUint8StayDistinct) {
    EXPECT_EQ(CmpiBooleanData(1).getType(), CMPI_boolean);
    EXPECT_EQ(CmpiData(true).getType(), CMPI_boolean);
    EXPECT_EQ(CmpiData(CMPIUint8(1)).getType(), CMPI_uint8);
    EXPECT_EQ(CmpiCharData(65).getType(), CMPI_char16);
    EXPECT_EQ(CmpiData(CMPIUint16(65)).getType(), CMPI_uint16);
}

TEST_F(DataTest, EveryScalarTypeRoundTrips) {
    EXPECT_EQ(CMPIUint64(CmpiData(CMPIUint64(18446744073709551615ULL))), 18446744073709551615ULL);
    EXPECT_EQ(CMPISint64(CmpiData(CMPISint64(-5))), -5);
    EXPECT_EQ(CMPIUint32(CmpiData(CMPIUint32(7))), 7u);
    EXPECT_EQ(CMPISint32(CmpiData(-7)), -7);
    EXPECT_EQ(CMPISint16(CmpiData(CMPISint16(-3))), -3);
    EXPECT_EQ(CMPISint8(CmpiData(CMPISint8(-2))), -2);
    EXPECT_EQ(CMPIReal64(CmpiData(2.5)), 2.5);
    EXPECT_EQ(CMPIReal32(CmpiData(1.5f)), 1.5f);
    EXPECT_EQ(CMPIBoolean(CmpiData(true)), 1);
    EXPECT_STREQ(static_cast<const char*>(CmpiData("text")), "text");
    EXPECT_STREQ(static_cast<const char*>(CmpiData(CmpiString("broker text"))), "broker text");
    EXPECT_EQ(CmpiData(size_t{9}).getType(), CMPI_uint64);
}

TEST_F(DataTest, ConversionToAnotherTypeThrowsTypeMismatch) {
    EXPECT_EQ(thrownCode([] { (void)CMPIUint32(CmpiData(CMPIUint64(1))); }), CMPI_RC_ERR_TYPE_MISMATCH);
    EXPECT_EQ(thrownCode([] { (void)static_cast<const char*>(CmpiData(5)); }), CMPI_RC_ERR_TYPE_MISMATCH);
    EXPECT_EQ(thrownCode([] { (void)CmpiObjectPath(CmpiData("x")); }), CMPI_RC_ERR_TYPE_MISMATCH);
}

TEST_F(DataTest, DefaultDataIsNullOfNoType) {
    CmpiData d;
    EXPECT_EQ(d.getType(), CMPI_null);
    EXPECT_TRUE(d.isNullValue());
    EXPECT_FALSE(d.isNotFound());
}

TEST_F(DataTest, MissingPropertyReadsAsNotFound) {
    CmpiInstance inst(CmpiObjectPath("root/cimv2", "Test_Element"));
    CmpiData d = inst.getProperty("NoSuchProperty");
    EXPECT_TRUE(d.isNotFound());
    EXPECT_EQ(d.getType(), CMPI_null);
}

TEST_F(DataTest, ReferencesArraysDateTimesAndEmbeddedInstancesKeepTheirTypes) {
    CmpiObjectPath path("root/cimv2", "Test_Element");
    path.setKey("Name", CmpiString("alpha"));
    CmpiInstance embedded(path);
    CmpiArray names(2, CMPI_string);
    names[0] = CmpiString("a");
    names[1] = CmpiString("b");
    CmpiInstance inst(path);
    inst.setProperty("Ref", path);
    inst.setProperty("Names", names);
    inst.setProperty("When", CmpiDateTime(kNoon(), false));
    inst.setProperty("Inner", embedded);

    EXPECT_EQ(inst.getProperty("Ref").getType(), CMPI_ref);
    EXPECT_TRUE(CmpiObjectPath(inst.getProperty("Ref")) == path);
    CmpiArray back = inst.getProperty("Names");
    ASSERT_EQ(back.size(), 2u);
    EXPECT_EQ(back.getSimpleType(), CMPI_string);
    EXPECT_STREQ(static_cast<const char*>(back[1]), "b");
    EXPECT_EQ(CmpiDateTime(inst.getProperty("When")).getDateTime(), kNoon());
    EXPECT_EQ(inst.getProperty("Inner").getType(), CMPI_instance);
}

TEST_F(DataTest, ArrayElementOfAnotherTypeIsRefused) {
    CmpiArray numbers(1, CMPI_uint32);
    EXPECT_EQ(thrownCode([&] { numbers[0] = CmpiData(CMPIUint64(1)); }), CMPI_RC_ERR_TYPE_MISMATCH);
    numbers[0] = CmpiData(CMPIUint32(4));
    EXPECT_EQ(CMPIUint32(numbers[0]), 4u);
}

TEST_F(DataTest, ArrayElementOfAnotherTypeIsRefusedBeforeItsIndexIsChecked) {
    CmpiArray numbers(1, CMPI_uint32);
    EXPECT_EQ(thrownCode([&] { numbers[5] = CmpiData(CMPIUint64(1)); }), CMPI_RC_ERR_TYPE_MISMATCH);
    EXPECT_EQ(thrownCode([&] { numbers[5] = CmpiData(CMPIUint32(1)); }), CMPI_RC_ERR_NO_SUCH_PROPERTY);
}

TEST_F(DataTest, CharsAndNullValuesAreRefusedByATypedArray) {
    CmpiArray names(1, CMPI_string);
    names[0] = CmpiData(CmpiString("kept"));
    EXPECT_EQ(thrownCode([&] { names[0] = CmpiData("text"); }), CMPI_RC_ERR_TYPE_MISMATCH);
    EXPECT_EQ(thrownCode([&] { names[0] = CmpiData(); }), CMPI_RC_ERR_TYPE_MISMATCH);
    EXPECT_STREQ(static_cast<const char*>(names[0]), "kept");
}

}  // namespace
