// RETURNVALUE and output PARAMVALUE elements of method responses, with values made
// by the broker core's factory functions as a provider would make them.
#include <gtest/gtest.h>

#include "orv/cimxml/method_encoder.hpp"
#include "orv/host/broker_core.hpp"

namespace orv::cimxml {
namespace {

class MethodEncoderTest : public ::testing::Test {
protected:
    const CMPIBroker* broker() const { return core.broker(); }
    std::string written(const std::function<void(XmlWriter&)>& write) {
        XmlWriter out;
        write(out);
        return out.take();
    }
    static CMPIData scalar(CMPIType type, CMPIValue value) {
        CMPIData data{};
        data.type = type;
        data.state = CMPI_goodValue;
        data.value = value;
        return data;
    }

    // Arguments holding "Codes" = 7, NULL, 9 (uint16[]).
    CMPIArgs* argsWithCodes() {
        CMPIArgs* args = broker()->eft->newArgs(broker(), nullptr);
        CMPIArray* codes = broker()->eft->newArray(broker(), 3, CMPI_uint16, nullptr);
        CMPIValue item{};
        item.uint16 = 7;
        codes->ft->setElementAt(codes, 0, &item, CMPI_uint16);
        item.uint16 = 9;
        codes->ft->setElementAt(codes, 2, &item, CMPI_uint16);
        CMPIValue arrayValue{};
        arrayValue.array = codes;
        args->ft->addArg(args, "Codes", &arrayValue, CMPI_uint16A);
        return args;
    }

    host::BrokerCore core{host::CoreConfig{}};
    host::ObjectScope scope;
};

TEST_F(MethodEncoderTest, ReturnValueCarriesTypeAndText) {
    CMPIValue value{};
    value.uint32 = 42;
    EXPECT_EQ(written([&](XmlWriter& out) { writeReturnValue(out, scalar(CMPI_uint32, value)); }),
              "<RETURNVALUE PARAMTYPE=\"uint32\"><VALUE>42</VALUE></RETURNVALUE>");
}

TEST_F(MethodEncoderTest, NullReturnValueKeepsItsTypeWithoutValue) {
    CMPIData data = scalar(CMPI_boolean, CMPIValue{});
    data.state = CMPI_nullValue;
    EXPECT_EQ(written([&](XmlWriter& out) { writeReturnValue(out, data); }),
              "<RETURNVALUE PARAMTYPE=\"boolean\"></RETURNVALUE>");
}

TEST_F(MethodEncoderTest, ValueWithoutCimXmlTypeWritesNothing) {
    CMPIValue value{};
    value.dataPtr.ptr = nullptr;
    EXPECT_EQ(written([&](XmlWriter& out) { writeReturnValue(out, scalar(CMPI_ptr, value)); }), "");
}

TEST_F(MethodEncoderTest, OutputArgumentsLeaveNullArrayElementsOutByDefault) {
    CMPIArgs* args = argsWithCodes();
    EXPECT_EQ(written([&](XmlWriter& out) { writeOutArguments(out, args); }),
              "<PARAMVALUE NAME=\"Codes\" PARAMTYPE=\"uint16\"><VALUE.ARRAY><VALUE>7</VALUE><VALUE>9</VALUE>"
              "</VALUE.ARRAY></PARAMVALUE>");
}

TEST_F(MethodEncoderTest, OutputArgumentsInProviderOrderWithArraysNullElementsAndReferences) {
    CMPIArgs* args = argsWithCodes();
    CMPIObjectPath* path = broker()->eft->newObjectPath(broker(), "root/cimv2", "Raw_Element", nullptr);
    path->ft->addKey(path, "Name", reinterpret_cast<const CMPIValue*>("e1"), CMPI_chars);
    CMPIValue ref{};
    ref.ref = path;
    args->ft->addArg(args, "Target", &ref, CMPI_ref);
    args->ft->addArg(args, "Why", reinterpret_cast<const CMPIValue*>("a<b"), CMPI_chars);
    args->ft->addArg(args, "Nothing", nullptr, CMPI_string);
    const std::string xml =
        written([&](XmlWriter& out) { writeOutArguments(out, args, ArrayNullElements::ValueNull); });
    EXPECT_EQ(xml,
              "<PARAMVALUE NAME=\"Codes\" PARAMTYPE=\"uint16\"><VALUE.ARRAY><VALUE>7</VALUE><VALUE.NULL></VALUE.NULL>"
              "<VALUE>9</VALUE></VALUE.ARRAY></PARAMVALUE>"
              "<PARAMVALUE NAME=\"Target\" PARAMTYPE=\"reference\"><VALUE.REFERENCE><LOCALINSTANCEPATH>"
              "<LOCALNAMESPACEPATH><NAMESPACE NAME=\"root\"></NAMESPACE><NAMESPACE NAME=\"cimv2\"></NAMESPACE>"
              "</LOCALNAMESPACEPATH><INSTANCENAME CLASSNAME=\"Raw_Element\"><KEYBINDING NAME=\"Name\">"
              "<KEYVALUE VALUETYPE=\"string\" TYPE=\"string\">e1</KEYVALUE></KEYBINDING></INSTANCENAME></LOCALINSTANCEPATH>"
              "</VALUE.REFERENCE></PARAMVALUE>"
              "<PARAMVALUE NAME=\"Why\" PARAMTYPE=\"string\"><VALUE>a&lt;b</VALUE></PARAMVALUE>"
              "<PARAMVALUE NAME=\"Nothing\" PARAMTYPE=\"string\"></PARAMVALUE>");
}

TEST_F(MethodEncoderTest, EmbeddedInstanceArgumentIsMarkedAndCarriesTheInstanceText) {
    CMPIObjectPath* path = broker()->eft->newObjectPath(broker(), "root/cimv2", "Raw_Element", nullptr);
    CMPIInstance* instance = broker()->eft->newInstance(broker(), path, nullptr);
    CMPIValue flag{};
    flag.boolean = 1;
    instance->ft->setProperty(instance, "Flag", &flag, CMPI_boolean);
    CMPIValue value{};
    value.inst = instance;
    EXPECT_EQ(written([&](XmlWriter& out) { writeParamValue(out, "Item", scalar(CMPI_instance, value)); }),
              "<PARAMVALUE NAME=\"Item\" PARAMTYPE=\"string\" EmbeddedObject=\"instance\"><VALUE>"
              "&lt;INSTANCE CLASSNAME=&quot;Raw_Element&quot;&gt;&lt;PROPERTY NAME=&quot;Flag&quot; "
              "TYPE=&quot;boolean&quot;&gt;&lt;VALUE&gt;TRUE&lt;/VALUE&gt;&lt;/PROPERTY&gt;&lt;/INSTANCE&gt;"
              "</VALUE></PARAMVALUE>");
}

}  // namespace
}  // namespace orv::cimxml
