// Requests no well-behaved client sends: each gets the right HTTP or CIM error, and the
// host keeps serving afterwards.
#include <gtest/gtest.h>
#include <httplib.h>
#include <netinet/in.h>
#include <signal.h>
#include <sys/socket.h>
#include <unistd.h>

#include "host_process.hpp"

namespace orv::e2e {
namespace {

const char* kEnumerateClassNames =
    "<?xml version=\"1.0\" encoding=\"utf-8\"?><CIM CIMVERSION=\"2.0\" DTDVERSION=\"2.0\">"
    "<MESSAGE ID=\"7\" PROTOCOLVERSION=\"1.0\"><SIMPLEREQ><IMETHODCALL NAME=\"EnumerateClassNames\">"
    "<LOCALNAMESPACEPATH><NAMESPACE NAME=\"root\"/><NAMESPACE NAME=\"cimv2\"/></LOCALNAMESPACEPATH>"
    "%PARAMS%</IMETHODCALL></SIMPLEREQ></MESSAGE></CIM>";

std::string requestWith(const std::string& params, const std::string& method = "EnumerateClassNames") {
    std::string body = kEnumerateClassNames;
    body.replace(body.find("%PARAMS%"), 8, params);
    body.replace(body.find("EnumerateClassNames"), 19, method);
    return body;
}

// A METHODCALL of Raw_Element.Name="e1" with the given PARAMVALUEs.
std::string methodCall(const std::string& method, const std::string& params) {
    return "<?xml version=\"1.0\" encoding=\"utf-8\"?><CIM CIMVERSION=\"2.0\" DTDVERSION=\"2.0\">"
           "<MESSAGE ID=\"9\" PROTOCOLVERSION=\"1.0\"><SIMPLEREQ><METHODCALL NAME=\"" +
           method +
           "\"><LOCALINSTANCEPATH><LOCALNAMESPACEPATH><NAMESPACE NAME=\"root\"/><NAMESPACE NAME=\"cimv2\"/>"
           "</LOCALNAMESPACEPATH><INSTANCENAME CLASSNAME=\"Raw_Element\"><KEYBINDING NAME=\"Name\">"
           "<KEYVALUE VALUETYPE=\"string\">e1</KEYVALUE></KEYBINDING></INSTANCENAME></LOCALINSTANCEPATH>" +
           params + "</METHODCALL></SIMPLEREQ></MESSAGE></CIM>";
}

class RawHttpTest : public ::testing::Test {
protected:
    static void SetUpTestSuite() {
        auto args = rawProviderArgs();
        args.insert(args.end(), {"--host-name", "testhost", "--max-request-bytes", "65536", "--credentials",
                                 sourceDir() + "/tests/e2e/data/credentials"});
        host_ = new HostProcess(args);
        ASSERT_TRUE(host_->waitReady()) << host_->output();
    }
    static void TearDownTestSuite() {
        EXPECT_EQ(host_->stop(SIGTERM), 0);
        delete host_;
    }
    void TearDown() override {
        // Whatever the test sent, the host still answers a proper request.
        auto result = post(requestWith(""), headers("EnumerateClassNames"));
        ASSERT_TRUE(result) << "host stopped answering";
        EXPECT_EQ(result->status, 200);
    }

    static httplib::Headers headers(const std::string& method, const std::string& object = "root%2Fcimv2") {
        return {{"CIMOperation", "MethodCall"}, {"CIMMethod", method}, {"CIMObject", object},
                {"CIMProtocolVersion", "1.0"}};
    }
    static httplib::Result post(const std::string& body, const httplib::Headers& hdrs, bool authenticate = true) {
        httplib::Client client("127.0.0.1", host_->port());
        client.set_read_timeout(10);
        if (authenticate) {
            client.set_basic_auth("user", "secret");
        }
        return client.Post("/cimom", hdrs, body, "application/xml; charset=\"utf-8\"");
    }
    static std::string cimError(const httplib::Result& result) {
        return result ? result->get_header_value("CIMError") : "no response";
    }
    static HostProcess* host_;
};

HostProcess* RawHttpTest::host_ = nullptr;

TEST_F(RawHttpTest, ValidRequestAnswersMethodResponse) {
    auto result = post(requestWith(""), headers("EnumerateClassNames"));
    ASSERT_TRUE(result);
    EXPECT_EQ(result->status, 200);
    EXPECT_EQ(result->get_header_value("CIMOperation"), "MethodResponse");
    EXPECT_NE(result->body.find("<CLASSNAME NAME=\"Raw_Base\"></CLASSNAME>"), std::string::npos) << result->body;
}

TEST_F(RawHttpTest, MissingCimOperationHeaderAnswers400UnsupportedOperation) {
    auto hdrs = headers("EnumerateClassNames");
    hdrs.erase("CIMOperation");
    auto result = post(requestWith(""), hdrs);
    ASSERT_TRUE(result);
    EXPECT_EQ(result->status, 400);
    EXPECT_EQ(cimError(result), "unsupported-operation");
}

TEST_F(RawHttpTest, WrongCimOperationValueAnswers400UnsupportedOperation) {
    auto hdrs = headers("EnumerateClassNames");
    hdrs.erase("CIMOperation");
    hdrs.emplace("CIMOperation", "MethodResponse");
    auto result = post(requestWith(""), hdrs);
    ASSERT_TRUE(result);
    EXPECT_EQ(result->status, 400);
    EXPECT_EQ(cimError(result), "unsupported-operation");
}

TEST_F(RawHttpTest, MissingCimMethodHeaderAnswers400HeaderMismatch) {
    auto hdrs = headers("EnumerateClassNames");
    hdrs.erase("CIMMethod");
    auto result = post(requestWith(""), hdrs);
    ASSERT_TRUE(result);
    EXPECT_EQ(result->status, 400);
    EXPECT_EQ(cimError(result), "header-mismatch");
}

TEST_F(RawHttpTest, CimObjectOfAnotherNamespaceAnswers400HeaderMismatch) {
    auto result = post(requestWith(""), headers("EnumerateClassNames", "root%2Finterop"));
    ASSERT_TRUE(result);
    EXPECT_EQ(result->status, 400);
    EXPECT_EQ(cimError(result), "header-mismatch");
}

TEST_F(RawHttpTest, MalformedXmlAnswers400RequestNotWellFormed) {
    auto result = post("<CIM CIMVERSION=\"2.0\"><MESSAGE>", headers("EnumerateClassNames"));
    ASSERT_TRUE(result);
    EXPECT_EQ(result->status, 400);
    EXPECT_EQ(cimError(result), "request-not-well-formed");
}

TEST_F(RawHttpTest, EmptyBodyAnswers400RequestNotWellFormed) {
    auto result = post("", headers("EnumerateClassNames"));
    ASSERT_TRUE(result);
    EXPECT_EQ(result->status, 400);
    EXPECT_EQ(cimError(result), "request-not-well-formed");
}

TEST_F(RawHttpTest, EntityExpansionIsRejectedAsNotWellFormed) {
    const std::string bomb =
        "<?xml version=\"1.0\"?><!DOCTYPE CIM [<!ENTITY a \"aaaaaaaaaa\"><!ENTITY b \"&a;&a;&a;&a;&a;&a;\">]>"
        "<CIM CIMVERSION=\"2.0\" DTDVERSION=\"2.0\">&b;</CIM>";
    auto result = post(bomb, headers("EnumerateClassNames"));
    ASSERT_TRUE(result);
    EXPECT_EQ(result->status, 400);
    EXPECT_EQ(cimError(result), "request-not-well-formed");
}

TEST_F(RawHttpTest, DeeplyNestedXmlAnswers400RequestNotWellFormed) {
    std::string deep;
    for (int i = 0; i < 1000; ++i) {
        deep += "<A>";
    }
    auto result = post(deep, headers("EnumerateClassNames"));
    ASSERT_TRUE(result);
    EXPECT_EQ(result->status, 400);
    EXPECT_EQ(cimError(result), "request-not-well-formed");
}

TEST_F(RawHttpTest, WellFormedButInvalidCimXmlAnswers400RequestNotValid) {
    auto result = post("<CIM CIMVERSION=\"2.0\" DTDVERSION=\"2.0\"><FOO/></CIM>", headers("EnumerateClassNames"));
    ASSERT_TRUE(result);
    EXPECT_EQ(result->status, 400);
    EXPECT_EQ(cimError(result), "request-not-valid");
}

TEST_F(RawHttpTest, OversizedBodyAnswers413) {
    std::string body = requestWith(std::string(70000, ' '));
    auto result = post(body, headers("EnumerateClassNames"));
    ASSERT_TRUE(result);
    EXPECT_EQ(result->status, 413);
}

TEST_F(RawHttpTest, UnsupportedProtocolVersionAnswers501) {
    std::string body = requestWith("");
    body.replace(body.find("PROTOCOLVERSION=\"1.0\""), 21, "PROTOCOLVERSION=\"2.0\"");
    auto result = post(body, headers("EnumerateClassNames"));
    ASSERT_TRUE(result);
    EXPECT_EQ(result->status, 501);
    EXPECT_EQ(cimError(result), "unsupported-protocol-version");
}

TEST_F(RawHttpTest, MultipleRequestsAnswer501) {
    const std::string body =
        "<CIM CIMVERSION=\"2.0\" DTDVERSION=\"2.0\"><MESSAGE ID=\"1\" PROTOCOLVERSION=\"1.0\"><MULTIREQ/></MESSAGE></CIM>";
    auto result = post(body, headers("EnumerateClassNames"));
    ASSERT_TRUE(result);
    EXPECT_EQ(result->status, 501);
    EXPECT_EQ(cimError(result), "multiple-requests-unsupported");
}

TEST_F(RawHttpTest, UnknownOperationAnswersCimErrNotSupported) {
    auto result = post(requestWith("", "FrobnicateInstances"), headers("FrobnicateInstances"));
    ASSERT_TRUE(result);
    EXPECT_EQ(result->status, 200);
    EXPECT_NE(result->body.find("<ERROR CODE=\"7\""), std::string::npos) << result->body;
}

TEST_F(RawHttpTest, WrongParameterTypeAnswersCimErrInvalidParameter) {
    auto result = post(requestWith("<IPARAMVALUE NAME=\"DeepInheritance\"><CLASSNAME NAME=\"X\"/></IPARAMVALUE>"),
                       headers("EnumerateClassNames"));
    ASSERT_TRUE(result);
    EXPECT_EQ(result->status, 200);
    EXPECT_NE(result->body.find("<ERROR CODE=\"4\""), std::string::npos) << result->body;
}

TEST_F(RawHttpTest, NonBooleanValueAnswersCimErrInvalidParameter) {
    auto result = post(requestWith("<IPARAMVALUE NAME=\"DeepInheritance\"><VALUE>maybe</VALUE></IPARAMVALUE>"),
                       headers("EnumerateClassNames"));
    ASSERT_TRUE(result);
    EXPECT_NE(result->body.find("<ERROR CODE=\"4\""), std::string::npos) << result->body;
}

TEST_F(RawHttpTest, UnknownParameterAnswersCimErrInvalidParameter) {
    auto result = post(requestWith("<IPARAMVALUE NAME=\"Colour\"><VALUE>red</VALUE></IPARAMVALUE>"),
                       headers("EnumerateClassNames"));
    ASSERT_TRUE(result);
    EXPECT_NE(result->body.find("<ERROR CODE=\"4\""), std::string::npos) << result->body;
}

TEST_F(RawHttpTest, KeyValueOfWrongTypeAnswersCimErrInvalidParameter) {
    const std::string params =
        "<IPARAMVALUE NAME=\"InstanceName\"><INSTANCENAME CLASSNAME=\"Raw_Assoc\"><KEYBINDING NAME=\"Left\">"
        "<KEYVALUE VALUETYPE=\"string\">not a path</KEYVALUE></KEYBINDING></INSTANCENAME></IPARAMVALUE>";
    auto result = post(requestWith(params, "GetInstance"), headers("GetInstance"));
    ASSERT_TRUE(result);
    EXPECT_NE(result->body.find("<ERROR CODE=\"4\""), std::string::npos) << result->body;
}

TEST_F(RawHttpTest, MethodCallAnswersReturnValueAndOutputParameters) {
    const std::string params = "<PARAMVALUE NAME=\"Number\" PARAMTYPE=\"uint32\"><VALUE>7</VALUE></PARAMVALUE>"
                               "<PARAMVALUE NAME=\"text\"><VALUE>a &amp; b</VALUE></PARAMVALUE>";
    auto result = post(methodCall("Echo", params), headers("Echo", "root%2Fcimv2%3ARaw_Element.Name%3D%22e1%22"));
    ASSERT_TRUE(result);
    EXPECT_EQ(result->status, 200);
    EXPECT_NE(result->body.find("<METHODRESPONSE NAME=\"Echo\"><RETURNVALUE PARAMTYPE=\"uint32\"><VALUE>42</VALUE>"
                                "</RETURNVALUE><PARAMVALUE NAME=\"Number\" PARAMTYPE=\"uint32\"><VALUE>7</VALUE>"
                                "</PARAMVALUE><PARAMVALUE NAME=\"Text\" PARAMTYPE=\"string\"><VALUE>a &amp; b"
                                "</VALUE></PARAMVALUE></METHODRESPONSE>"),
              std::string::npos)
        << result->body;
}

TEST_F(RawHttpTest, MethodCallOfUndeclaredMethodAnswersCimErrMethodNotFound) {
    auto result = post(methodCall("Frobnicate", ""), headers("Frobnicate", "root%2Fcimv2%3ARaw_Element"));
    ASSERT_TRUE(result);
    EXPECT_NE(result->body.find("<METHODRESPONSE NAME=\"Frobnicate\"><ERROR CODE=\"17\" "
                                "DESCRIPTION=\"class Raw_Element has no method Frobnicate\""),
              std::string::npos)
        << result->body;
}

TEST_F(RawHttpTest, MethodCallWithUnknownParameterAnswersCimErrInvalidParameter) {
    const std::string params = "<PARAMVALUE NAME=\"Colour\"><VALUE>red</VALUE></PARAMVALUE>";
    auto result = post(methodCall("Echo", params), headers("Echo", "root%2Fcimv2%3ARaw_Element"));
    ASSERT_TRUE(result);
    EXPECT_NE(result->body.find("DESCRIPTION=\"method Echo has no input parameter Colour\""), std::string::npos)
        << result->body;
}

TEST_F(RawHttpTest, MethodCallWithArrayForScalarParameterAnswersCimErrInvalidParameter) {
    const std::string params = "<PARAMVALUE NAME=\"Number\"><VALUE.ARRAY><VALUE>1</VALUE></VALUE.ARRAY></PARAMVALUE>";
    auto result = post(methodCall("Echo", params), headers("Echo", "root%2Fcimv2%3ARaw_Element"));
    ASSERT_TRUE(result);
    EXPECT_NE(result->body.find("<ERROR CODE=\"4\" DESCRIPTION=\"parameter Number must be a single value\""),
              std::string::npos)
        << result->body;
}

TEST_F(RawHttpTest, MethodCallWithNonNumberAnswersCimErrInvalidParameter) {
    const std::string params = "<PARAMVALUE NAME=\"Number\"><VALUE>seven</VALUE></PARAMVALUE>";
    auto result = post(methodCall("Echo", params), headers("Echo", "root%2Fcimv2%3ARaw_Element"));
    ASSERT_TRUE(result);
    EXPECT_NE(result->body.find("<ERROR CODE=\"4\""), std::string::npos) << result->body;
}

// An association operation on the class Raw_SubElement, with more parameters after ObjectName.
std::string classAssociationRequest(const std::string& method, const std::string& params = "") {
    return requestWith("<IPARAMVALUE NAME=\"ObjectName\"><CLASSNAME NAME=\"raw_subelement\"/></IPARAMVALUE>" + params,
                       method);
}

std::string classPathOf(const std::string& className) {
    return "<CLASSPATH><NAMESPACEPATH><HOST>testhost</HOST><LOCALNAMESPACEPATH><NAMESPACE NAME=\"root\"></NAMESPACE>"
           "<NAMESPACE NAME=\"cimv2\"></NAMESPACE></LOCALNAMESPACEPATH></NAMESPACEPATH><CLASSNAME NAME=\"" +
           className + "\"></CLASSNAME></CLASSPATH>";
}

std::string returnedValue(const httplib::Result& result) {
    const std::string& body = result->body;
    const std::size_t start = body.find("<IRETURNVALUE>");
    const std::size_t end = body.find("</IRETURNVALUE>");
    if (start == std::string::npos || end == std::string::npos) {
        return body;
    }
    return body.substr(start + 14, end - start - 14);
}

TEST_F(RawHttpTest, AssociatorNamesOfClassAnswersTheFarClassesFromTheRepository) {
    auto result = post(classAssociationRequest("AssociatorNames"), headers("AssociatorNames"));
    ASSERT_TRUE(result);
    EXPECT_EQ(returnedValue(result), "<OBJECTPATH>" + classPathOf("Raw_Element") + "</OBJECTPATH>");
}

TEST_F(RawHttpTest, ReferenceNamesOfClassAnswersEveryAssociationClassReferringToIt) {
    auto result = post(classAssociationRequest("ReferenceNames"), headers("ReferenceNames"));
    ASSERT_TRUE(result);
    EXPECT_EQ(returnedValue(result), "<OBJECTPATH>" + classPathOf("Raw_Assoc") + "</OBJECTPATH><OBJECTPATH>" +
                                         classPathOf("Raw_SubAssoc") + "</OBJECTPATH>");
}

TEST_F(RawHttpTest, ReferenceNamesOfClassKeepsOnlyTheResultClassAndItsSubclasses) {
    const std::string params = "<IPARAMVALUE NAME=\"ResultClass\"><CLASSNAME NAME=\"Raw_SubAssoc\"/></IPARAMVALUE>";
    auto result = post(classAssociationRequest("ReferenceNames", params), headers("ReferenceNames"));
    ASSERT_TRUE(result);
    EXPECT_EQ(returnedValue(result), "<OBJECTPATH>" + classPathOf("Raw_SubAssoc") + "</OBJECTPATH>");
}

TEST_F(RawHttpTest, AssociatorNamesOfClassWithUnknownRoleAnswersNothing) {
    const std::string params = "<IPARAMVALUE NAME=\"Role\"><VALUE>Middle</VALUE></IPARAMVALUE>";
    auto result = post(classAssociationRequest("AssociatorNames", params), headers("AssociatorNames"));
    ASSERT_TRUE(result);
    EXPECT_EQ(returnedValue(result), "");
}

TEST_F(RawHttpTest, AssociatorsOfClassAnswersClassPathsWithTheirClasses) {
    auto result = post(classAssociationRequest("Associators"), headers("Associators"));
    ASSERT_TRUE(result);
    const std::string value = returnedValue(result);
    EXPECT_EQ(value.rfind("<VALUE.OBJECTWITHPATH>" + classPathOf("Raw_Element") + "<CLASS NAME=\"Raw_Element\" "
                          "SUPERCLASS=\"Raw_Base\">", 0), 0U) << value;
    EXPECT_NE(value.find("<PROPERTY NAME=\"Name\""), std::string::npos) << "inherited properties are included";
}

TEST_F(RawHttpTest, ReferencesOfClassAnswersTheAssociationClasses) {
    auto result = post(classAssociationRequest("References"), headers("References"));
    ASSERT_TRUE(result);
    const std::string value = returnedValue(result);
    EXPECT_NE(value.find(classPathOf("Raw_Assoc") + "<CLASS NAME=\"Raw_Assoc\""), std::string::npos) << value;
    EXPECT_NE(value.find(classPathOf("Raw_SubAssoc") + "<CLASS NAME=\"Raw_SubAssoc\""), std::string::npos) << value;
}

std::string getInstanceWithLocalOnly(const std::string& localOnly) {
    return requestWith("<IPARAMVALUE NAME=\"InstanceName\"><INSTANCENAME CLASSNAME=\"Raw_Element\"><KEYBINDING "
                       "NAME=\"Name\"><KEYVALUE VALUETYPE=\"string\">e1</KEYVALUE></KEYBINDING></INSTANCENAME>"
                       "</IPARAMVALUE><IPARAMVALUE NAME=\"LocalOnly\"><VALUE>" +
                           localOnly + "</VALUE></IPARAMVALUE>",
                       "GetInstance");
}

TEST_F(RawHttpTest, DeprecatedLocalOnlyIsTreatedAsFalseForInstances) {
    auto result = post(getInstanceWithLocalOnly("true"), headers("GetInstance"));
    ASSERT_TRUE(result);
    const std::string value = returnedValue(result);
    EXPECT_NE(value.find("<PROPERTY NAME=\"Name\" TYPE=\"string\"><VALUE>e1</VALUE>"), std::string::npos)
        << "the inherited key stays: " << value;
    EXPECT_NE(value.find("<PROPERTY NAME=\"Text\" TYPE=\"string\">"), std::string::npos) << value;
    auto asFalse = post(getInstanceWithLocalOnly("false"), headers("GetInstance"));
    ASSERT_TRUE(asFalse);
    EXPECT_EQ(returnedValue(asFalse), value);
}

TEST_F(RawHttpTest, NonBooleanLocalOnlyAnswersCimErrInvalidParameter) {
    auto result = post(getInstanceWithLocalOnly("maybe"), headers("GetInstance"));
    ASSERT_TRUE(result);
    EXPECT_NE(result->body.find("<ERROR CODE=\"4\""), std::string::npos) << result->body;
}

TEST_F(RawHttpTest, GetAnswers405) {
    httplib::Client client("127.0.0.1", host_->port());
    auto result = client.Get("/cimom");
    ASSERT_TRUE(result);
    EXPECT_EQ(result->status, 405);
}

TEST_F(RawHttpTest, MissingCredentialsAnswer401WithChallenge) {
    auto result = post(requestWith(""), headers("EnumerateClassNames"), false);
    ASSERT_TRUE(result);
    EXPECT_EQ(result->status, 401);
    EXPECT_EQ(result->get_header_value("WWW-Authenticate"), "Basic realm=\"orv-cimhost\"");
}

TEST_F(RawHttpTest, WrongPasswordAnswers401) {
    httplib::Client client("127.0.0.1", host_->port());
    client.set_basic_auth("user", "wrong");
    auto result = client.Post("/cimom", headers("EnumerateClassNames"), requestWith(""), "application/xml");
    ASSERT_TRUE(result);
    EXPECT_EQ(result->status, 401);
}

TEST_F(RawHttpTest, MalformedHttpRequestLineAnswers400) {
    const int fd = socket(AF_INET, SOCK_STREAM, 0);
    sockaddr_in address{};
    address.sin_family = AF_INET;
    address.sin_port = htons(static_cast<uint16_t>(host_->port()));
    address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    ASSERT_EQ(connect(fd, reinterpret_cast<sockaddr*>(&address), sizeof address), 0);
    const std::string garbage = "THIS IS NOT HTTP\r\n\r\n";
    ASSERT_EQ(write(fd, garbage.data(), garbage.size()), static_cast<ssize_t>(garbage.size()));
    char buffer[256] = {};
    timeval timeout{5, 0};
    setsockopt(fd, SOL_SOCKET, SO_RCVTIMEO, &timeout, sizeof timeout);
    const ssize_t n = read(fd, buffer, sizeof buffer - 1);
    close(fd);
    ASSERT_GT(n, 0);
    EXPECT_EQ(std::string(buffer).substr(0, 12), "HTTP/1.1 400");
}

TEST_F(RawHttpTest, CreateClassWithAClassParameterAnswersCimErrNotSupported) {
    const std::string params =
        "<IPARAMVALUE NAME=\"NewClass\"><CLASS NAME=\"Raw_New\" SUPERCLASS=\"Raw_Base\"><PROPERTY NAME=\"Size\" "
        "TYPE=\"uint32\"/></CLASS></IPARAMVALUE>";
    auto result = post(requestWith(params, "CreateClass"), headers("CreateClass"));
    ASSERT_TRUE(result);
    EXPECT_EQ(result->status, 200);
    EXPECT_NE(result->body.find("<ERROR CODE=\"7\" DESCRIPTION=\"operation CreateClass is not supported\""),
              std::string::npos)
        << result->body;
}

TEST_F(RawHttpTest, SetQualifierWithADeclarationAnswersCimErrNotSupported) {
    const std::string params =
        "<IPARAMVALUE NAME=\"QualifierDeclaration\"><QUALIFIER.DECLARATION NAME=\"Colour\" TYPE=\"string\">"
        "<SCOPE CLASS=\"true\"/><VALUE>blue</VALUE></QUALIFIER.DECLARATION></IPARAMVALUE>";
    auto result = post(requestWith(params, "SetQualifier"), headers("SetQualifier"));
    ASSERT_TRUE(result);
    EXPECT_EQ(result->status, 200);
    EXPECT_NE(result->body.find("<ERROR CODE=\"7\""), std::string::npos) << result->body;
}

TEST_F(RawHttpTest, MethodCallWithAReferenceArrayReachesTheProvider) {
    const std::string params =
        "<PARAMVALUE NAME=\"Elements\" PARAMTYPE=\"reference\"><VALUE.REFARRAY><VALUE.REFERENCE>"
        "<INSTANCENAME CLASSNAME=\"Raw_Element\"><KEYBINDING NAME=\"Name\"><KEYVALUE>a</KEYVALUE></KEYBINDING>"
        "</INSTANCENAME></VALUE.REFERENCE><VALUE.REFERENCE><INSTANCENAME CLASSNAME=\"Raw_Element\"><KEYBINDING "
        "NAME=\"Name\"><KEYVALUE>b</KEYVALUE></KEYBINDING></INSTANCENAME></VALUE.REFERENCE></VALUE.REFARRAY>"
        "</PARAMVALUE>";
    auto result = post(methodCall("JoinNames", params), headers("JoinNames", "root%2Fcimv2%3ARaw_Element"));
    ASSERT_TRUE(result);
    EXPECT_EQ(result->status, 200);
    EXPECT_NE(result->body.find("<RETURNVALUE PARAMTYPE=\"string\"><VALUE>a,b</VALUE></RETURNVALUE>"),
              std::string::npos)
        << result->body;
}

}  // namespace
}  // namespace orv::e2e
