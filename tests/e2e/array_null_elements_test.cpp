// NULL elements of array values (the raw provider's Raw_Element "gaps" has
// Numbers = 0, NULL, 20): left out by default, as sfcb sends them and wbemcli
// reads them; sent as VALUE.NULL with --array-null-elements value-null.
#include <gtest/gtest.h>
#include <httplib.h>
#include <signal.h>

#include "host_process.hpp"

namespace orv::e2e {
namespace {

const char* kGetGaps =
    "<?xml version=\"1.0\" encoding=\"utf-8\"?><CIM CIMVERSION=\"2.0\" DTDVERSION=\"2.0\">"
    "<MESSAGE ID=\"3\" PROTOCOLVERSION=\"1.0\"><SIMPLEREQ><IMETHODCALL NAME=\"GetInstance\">"
    "<LOCALNAMESPACEPATH><NAMESPACE NAME=\"root\"/><NAMESPACE NAME=\"cimv2\"/></LOCALNAMESPACEPATH>"
    "<IPARAMVALUE NAME=\"InstanceName\"><INSTANCENAME CLASSNAME=\"Raw_Element\"><KEYBINDING NAME=\"Name\">"
    "<KEYVALUE VALUETYPE=\"string\">gaps</KEYVALUE></KEYBINDING></INSTANCENAME></IPARAMVALUE>"
    "</IMETHODCALL></SIMPLEREQ></MESSAGE></CIM>";

std::string numbersOfGaps(const std::vector<std::string>& options) {
    std::vector<std::string> args = rawProviderArgs();
    args.insert(args.end(), options.begin(), options.end());
    HostProcess host(args);
    if (!host.waitReady()) {
        return "host did not start: " + host.output();
    }
    httplib::Client client("127.0.0.1", host.port());
    auto reply = client.Post("/cimom",
                             {{"CIMOperation", "MethodCall"}, {"CIMMethod", "GetInstance"}, {"CIMObject", "root%2Fcimv2"}},
                             kGetGaps, "application/xml; charset=utf-8");
    host.stop(SIGTERM);
    if (!reply) {
        return "no answer";
    }
    const std::size_t start = reply->body.find("<PROPERTY.ARRAY NAME=\"Numbers\"");
    const std::size_t end = reply->body.find("</PROPERTY.ARRAY>", start);
    return start == std::string::npos ? reply->body : reply->body.substr(start, end - start);
}

TEST(ArrayNullElements, LeftOutByDefault) {
    EXPECT_EQ(numbersOfGaps({}),
              "<PROPERTY.ARRAY NAME=\"Numbers\" TYPE=\"uint16\"><VALUE.ARRAY><VALUE>0</VALUE><VALUE>20</VALUE>"
              "</VALUE.ARRAY>");
}

TEST(ArrayNullElements, ValueNullOnRequest) {
    EXPECT_EQ(numbersOfGaps({"--array-null-elements", "value-null"}),
              "<PROPERTY.ARRAY NAME=\"Numbers\" TYPE=\"uint16\"><VALUE.ARRAY><VALUE>0</VALUE>"
              "<VALUE.NULL></VALUE.NULL><VALUE>20</VALUE></VALUE.ARRAY>");
}

TEST(ArrayNullElements, WbemcliReadsTheDefaultForm) {
    HostProcess host(rawProviderArgs());
    ASSERT_TRUE(host.waitReady()) << host.output();
    const std::string output = runCommand("timeout 20 wbemcli gi 'http://localhost:" + std::to_string(host.port()) +
                                          "/root/cimv2:Raw_Element.Name=\"gaps\"' Numbers");
    EXPECT_EQ(host.stop(SIGTERM), 0);
    EXPECT_NE(output.find("Numbers=0,20"), std::string::npos) << output;
}

TEST(ArrayNullElements, UnknownFormExitsTwoWithOneLine) {
    HostProcess host({"--array-null-elements", "holes"}, false);
    EXPECT_EQ(host.waitExit(), 2);
    EXPECT_EQ(host.output(), "orv-cimhost: arrayNullElements: 'holes' is not drop or value-null\n");
}

}  // namespace
}  // namespace orv::e2e
