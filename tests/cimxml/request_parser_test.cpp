// The CIM-XML request reader: what it extracts from requests, and what it refuses.
#include <gtest/gtest.h>

#include "orv/cimxml/cim_status.hpp"
#include "orv/cimxml/request_params.hpp"
#include "orv/cimxml/request_parser.hpp"

namespace orv::cimxml {
namespace {

std::string call(const std::string& params, const std::string& method = "GetInstance") {
    return "<?xml version=\"1.0\"?><CIM CIMVERSION=\"2.0\" DTDVERSION=\"2.0\"><MESSAGE ID=\"42\" "
           "PROTOCOLVERSION=\"1.0\"><SIMPLEREQ><IMETHODCALL NAME=\"" + method +
           "\"><LOCALNAMESPACEPATH><NAMESPACE NAME=\"root\"/><NAMESPACE NAME=\"cimv2\"/></LOCALNAMESPACEPATH>" +
           params + "</IMETHODCALL></SIMPLEREQ></MESSAGE></CIM>";
}

ProtocolError::Kind failureKind(const std::string& body) {
    try {
        parseRequest(body);
    } catch (const ProtocolError& error) {
        return error.kind();
    }
    ADD_FAILURE() << "accepted: " << body;
    return ProtocolError::Kind::NotValid;
}

TEST(RequestParser, ReadsMethodNamespaceAndMessageId) {
    const CimRequest request = parseRequest(call(""));
    EXPECT_TRUE(request.intrinsic);
    EXPECT_EQ(request.methodName, "GetInstance");
    EXPECT_EQ(request.nameSpace, "root/cimv2");
    EXPECT_EQ(request.messageId, "42");
}

TEST(RequestParser, ReadsInstanceNameWithTypedAndReferenceKeys) {
    const CimRequest request = parseRequest(call(
        "<IPARAMVALUE NAME=\"InstanceName\"><INSTANCENAME CLASSNAME=\"A\">"
        "<KEYBINDING NAME=\"Name\"><KEYVALUE VALUETYPE=\"string\">x &amp; y</KEYVALUE></KEYBINDING>"
        "<KEYBINDING NAME=\"N\"><KEYVALUE VALUETYPE=\"numeric\">-3</KEYVALUE></KEYBINDING>"
        "<KEYBINDING NAME=\"R\"><VALUE.REFERENCE><LOCALINSTANCEPATH><LOCALNAMESPACEPATH><NAMESPACE NAME=\"ns\"/>"
        "</LOCALNAMESPACEPATH><INSTANCENAME CLASSNAME=\"B\"/></LOCALINSTANCEPATH></VALUE.REFERENCE></KEYBINDING>"
        "</INSTANCENAME></IPARAMVALUE>"));
    const ParamValue* value = request.param("instancename");
    ASSERT_NE(value, nullptr);
    const auto& path = std::get<ObjectPathModel>(*value);
    ASSERT_EQ(path.keys.size(), 3U);
    EXPECT_EQ(path.keys[0].value, "x & y");
    EXPECT_EQ(path.keys[1].kind, KeyBindingModel::Kind::Numeric);
    ASSERT_TRUE(path.keys[2].reference);
    EXPECT_EQ(path.keys[2].reference->className, "B");
    EXPECT_EQ(path.keys[2].reference->nameSpace, "ns");
}

// A key value a response carried with a control picture names the provider's key again.
TEST(RequestParser, KeyValuesWithControlPicturesReachTheProviderAsControlCharacters) {
    const CimRequest request = parseRequest(call(
        "<IPARAMVALUE NAME=\"InstanceName\"><INSTANCENAME CLASSNAME=\"A\">"
        "<KEYBINDING NAME=\"Name\"><KEYVALUE VALUETYPE=\"string\">vmnic\u2401x</KEYVALUE></KEYBINDING>"
        "</INSTANCENAME></IPARAMVALUE>"));
    const auto& path = std::get<ObjectPathModel>(*request.param("InstanceName"));
    ASSERT_EQ(path.keys.size(), 1U);
    EXPECT_EQ(path.keys[0].value, "vmnic\x01x");
}

TEST(RequestParser, ReadsInstanceWithArrayNullElementsAndNullProperty) {
    const CimRequest request = parseRequest(call(
        "<IPARAMVALUE NAME=\"NewInstance\"><INSTANCE CLASSNAME=\"A\">"
        "<PROPERTY.ARRAY NAME=\"L\" TYPE=\"uint8\"><VALUE.ARRAY><VALUE>1</VALUE><VALUE.NULL/></VALUE.ARRAY>"
        "</PROPERTY.ARRAY><PROPERTY NAME=\"S\" TYPE=\"string\"></PROPERTY></INSTANCE></IPARAMVALUE>",
        "CreateInstance"));
    const InstanceModel& instance = instanceParam(request, "NewInstance");
    ASSERT_EQ(instance.properties.size(), 2U);
    ASSERT_TRUE(instance.properties[0].elements);
    EXPECT_EQ((*instance.properties[0].elements)[0], std::optional<std::string>("1"));
    EXPECT_EQ((*instance.properties[0].elements)[1], std::nullopt);
    EXPECT_FALSE(instance.properties[1].value);
}

TEST(RequestParser, ReadsClassAndQualifierDeclarationParameters) {
    const CimRequest request = parseRequest(call(
        "<IPARAMVALUE NAME=\"NewClass\"><CLASS NAME=\"X_New\" SUPERCLASS=\"X_Base\"><PROPERTY NAME=\"P\" "
        "TYPE=\"uint8\"/><METHOD NAME=\"M\"/></CLASS></IPARAMVALUE>"
        "<IPARAMVALUE NAME=\"QualifierDeclaration\"><QUALIFIER.DECLARATION NAME=\"Q\" TYPE=\"string\" "
        "ISARRAY=\"true\"><SCOPE CLASS=\"true\"/></QUALIFIER.DECLARATION></IPARAMVALUE>",
        "CreateClass"));
    const auto& cls = std::get<ClassParam>(*request.param("NewClass"));
    EXPECT_EQ(cls.name, "X_New");
    EXPECT_EQ(cls.superClass, "X_Base");
    const auto& declaration = std::get<QualifierDeclarationParam>(*request.param("QualifierDeclaration"));
    EXPECT_EQ(declaration.name, "Q");
    EXPECT_EQ(declaration.type, "string");
    EXPECT_TRUE(declaration.isArray);
}

TEST(RequestParser, ReadsReferenceArraysWithNullElements) {
    const CimRequest request = parseRequest(call(
        "<IPARAMVALUE NAME=\"Refs\"><VALUE.REFARRAY><VALUE.NULL/><VALUE.REFERENCE><INSTANCENAME CLASSNAME=\"X\">"
        "<KEYBINDING NAME=\"K\"><KEYVALUE>v</KEYVALUE></KEYBINDING></INSTANCENAME></VALUE.REFERENCE>"
        "</VALUE.REFARRAY></IPARAMVALUE>"));
    const auto& refs = std::get<RefArrayParam>(*request.param("Refs"));
    ASSERT_EQ(refs.items.size(), 2U);
    EXPECT_FALSE(refs.items[0].has_value());
    ASSERT_TRUE(refs.items[1].has_value());
    EXPECT_EQ(refs.items[1]->className, "X");
    EXPECT_EQ(refs.items[1]->keys.at(0).value, "v");
}

TEST(RequestParser, MisshapenClassQualifierAndReferenceArrayAreNotValid) {
    EXPECT_EQ(failureKind(call("<IPARAMVALUE NAME=\"C\"><CLASS/></IPARAMVALUE>")), ProtocolError::Kind::NotValid);
    EXPECT_EQ(failureKind(call("<IPARAMVALUE NAME=\"C\"><CLASS NAME=\"X\"><VALUE/></CLASS></IPARAMVALUE>")),
              ProtocolError::Kind::NotValid);
    EXPECT_EQ(failureKind(call("<IPARAMVALUE NAME=\"Q\"><QUALIFIER.DECLARATION NAME=\"Q\"/></IPARAMVALUE>")),
              ProtocolError::Kind::NotValid);
    EXPECT_EQ(failureKind(call("<IPARAMVALUE NAME=\"Q\"><QUALIFIER.DECLARATION NAME=\"Q\" TYPE=\"string\" "
                               "ISARRAY=\"maybe\"/></IPARAMVALUE>")),
              ProtocolError::Kind::NotValid);
    EXPECT_EQ(failureKind(call("<IPARAMVALUE NAME=\"R\"><VALUE.REFARRAY><VALUE>x</VALUE></VALUE.REFARRAY></IPARAMVALUE>")),
              ProtocolError::Kind::NotValid);
}

TEST(RequestParser, NotWellFormedXmlIsReported) {
    EXPECT_EQ(failureKind("<CIM"), ProtocolError::Kind::NotWellFormed);
}

TEST(RequestParser, EntityDeclarationsAreRefused) {
    EXPECT_EQ(failureKind("<!DOCTYPE CIM [<!ENTITY x \"y\">]><CIM>&x;</CIM>"), ProtocolError::Kind::NotWellFormed);
}

TEST(RequestParser, MissingNamespaceIsNotValid) {
    std::string body = call("");
    body.erase(body.find("<LOCALNAMESPACEPATH>"), body.find("</LOCALNAMESPACEPATH>") + 21 - body.find("<LOCALNAMESPACEPATH>"));
    EXPECT_EQ(failureKind(body), ProtocolError::Kind::NotValid);
}

TEST(RequestParser, VersionsOtherThanTwoAndOneAreUnsupported) {
    std::string cim = call("");
    cim.replace(cim.find("CIMVERSION=\"2.0\""), 16, "CIMVERSION=\"3.0\"");
    EXPECT_EQ(failureKind(cim), ProtocolError::Kind::UnsupportedCimVersion);
    std::string dtd = call("");
    dtd.replace(dtd.find("DTDVERSION=\"2.0\""), 16, "DTDVERSION=\"1.0\"");
    EXPECT_EQ(failureKind(dtd), ProtocolError::Kind::UnsupportedDtdVersion);
}

TEST(RequestParams, WrongKindOfParameterIsInvalidParameter) {
    const CimRequest request = parseRequest(call("<IPARAMVALUE NAME=\"LocalOnly\"><CLASSNAME NAME=\"X\"/></IPARAMVALUE>"));
    try {
        boolParam(request, "LocalOnly", true);
        FAIL() << "accepted a CLASSNAME as a boolean";
    } catch (const CimError& error) {
        EXPECT_EQ(error.code(), static_cast<int>(CimStatus::InvalidParameter));
    }
}

TEST(RequestParams, AbsentBooleanTakesTheDefaultAndCaseIsIgnored) {
    const CimRequest request = parseRequest(call("<IPARAMVALUE NAME=\"LocalOnly\"><VALUE>FaLsE</VALUE></IPARAMVALUE>"));
    EXPECT_FALSE(boolParam(request, "LocalOnly", true));
    EXPECT_TRUE(boolParam(request, "DeepInheritance", true));
}

TEST(RequestParams, UnknownParameterNameIsRefused) {
    const CimRequest request = parseRequest(call("<IPARAMVALUE NAME=\"Bogus\"><VALUE>1</VALUE></IPARAMVALUE>"));
    EXPECT_THROW(checkParameterNames(request, {"InstanceName"}), CimError);
}

}  // namespace
}  // namespace orv::cimxml
