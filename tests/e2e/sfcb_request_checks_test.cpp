// Checks of requests and error codes that are visible to clients, in both brokers.
// orv-cimhost checks a request's keys against the class and answers each
// operation only with codes DSP0200 lists for it; the stock sfcb 1.3.11 hands
// the keys to the provider as they are and passes other codes through. Each
// broker's answer is pinned: the differences are documented broker conventions
// (README, two-broker tests).
#include <gtest/gtest.h>

#include <chrono>
#include <optional>

#include "raw_connection.hpp"
#include "two_broker_fixture.hpp"

namespace orv::e2e {
namespace {

class RequestChecksInBothBrokers : public TwoBrokerTest {};

const std::string kPort = "Orvane_EthernetPort.DeviceID=\"vmnic0\"";

std::string cimError(int code, const std::string& name, const std::string& message) {
    return "*\n* wbemcli: Cim: (" + std::to_string(code) + ") " + name + ": " + message + "\n*\n";
}

TEST_F(RequestChecksInBothBrokers, UndeclaredKeyIsRefusedHereAndPassedToTheProviderBySfcb) {
    const std::string path = kPort + ",Colour=\"red\"";
    EXPECT_EQ(wbemcli(orvPort(), "gi -nl", path),
              cimError(4, "CIM_ERR_INVALID_PARAMETER", "class Orvane_EthernetPort has no key Colour"));
    EXPECT_EQ(wbemcli(sfcbPort(), "gi -nl", path).rfind("localhost:PORT/root/cimv2:" + path + "\n-", 0), 0U);
}

TEST_F(RequestChecksInBothBrokers, DuplicateKeyIsRefusedHereAndTheLastOneWinsInSfcb) {
    const std::string path = kPort + ",DeviceID=\"vmnic1\"";
    EXPECT_EQ(wbemcli(orvPort(), "gi -nl", path),
              cimError(4, "CIM_ERR_INVALID_PARAMETER", "key DeviceID is given twice"));
    const std::string sfcb = wbemcli(sfcbPort(), "gi -nl", path);
    EXPECT_NE(sfcb.find("\n-DeviceID=\"vmnic1\"\n"), std::string::npos) << sfcb;
}

TEST_F(RequestChecksInBothBrokers, NumericValueOfAStringKeyIsRefusedHereAndNotFoundInSfcb) {
    const std::string path = "Orvane_EthernetPort.DeviceID=5";
    EXPECT_EQ(wbemcli(orvPort(), "gi -nl", path),
              cimError(4, "CIM_ERR_INVALID_PARAMETER", "key DeviceID of class Orvane_EthernetPort is a string, not numeric"));
    EXPECT_EQ(wbemcli(sfcbPort(), "gi -nl", path),
              cimError(6, "CIM_ERR_NOT_FOUND", "Specified DeviceID is not found"));
}

TEST_F(RequestChecksInBothBrokers, AssociationOfAnUnknownClassIsAnInvalidParameterHereOnly) {
    EXPECT_EQ(wbemcli(orvPort(), "ai -nl", "No_Such.Name=\"x\""),
              cimError(4, "CIM_ERR_INVALID_PARAMETER", "class No_Such does not exist"));
    // sfcb answers nothing, or (seen after other requests) CIM_ERR_NOT_FOUND.
    const std::string sfcb = wbemcli(sfcbPort(), "ai -nl", "No_Such.Name=\"x\"");
    EXPECT_TRUE(sfcb.empty() || sfcb == cimError(6, "CIM_ERR_NOT_FOUND", "The requested object could not be found"))
        << sfcb;
}

TEST_F(RequestChecksInBothBrokers, KeysFoundByTheProviderAnswerTheSameInBothBrokers) {
    // Only DeviceID of the four keys: the provider finds its port by it in both.
    expectSameAnswer("gi", kPort);
}

// The KEYVALUE elements of an EnumerateInstanceNames answer of the broker on `port`.
std::string keyValueElements(int port) {
    RawConnection connection(port);
    const std::string body =
        "<?xml version=\"1.0\" encoding=\"utf-8\"?><CIM CIMVERSION=\"2.0\" DTDVERSION=\"2.0\"><MESSAGE ID=\"3\" "
        "PROTOCOLVERSION=\"1.0\"><SIMPLEREQ><IMETHODCALL NAME=\"EnumerateInstanceNames\"><LOCALNAMESPACEPATH>"
        "<NAMESPACE NAME=\"root\"/><NAMESPACE NAME=\"cimv2\"/></LOCALNAMESPACEPATH><IPARAMVALUE NAME=\"ClassName\">"
        "<CLASSNAME NAME=\"Orvane_EthernetPort\"/></IPARAMVALUE></IMETHODCALL></SIMPLEREQ></MESSAGE></CIM>";
    if (!connection.send(cimPost(body, "EnumerateInstanceNames"))) {
        return "no connection";
    }
    const std::optional<RawResponse> response = connection.readResponse(std::chrono::seconds(30));
    if (!response) {
        return "no response";
    }
    const std::size_t at = response->body.find("<KEYVALUE");
    return at == std::string::npos ? "no KEYVALUE" : response->body.substr(at, response->body.find('>', at) - at + 1);
}

TEST_F(RequestChecksInBothBrokers, KeyValuesCarryTheirTypeHereOnly) {
    EXPECT_EQ(keyValueElements(orvPort()), "<KEYVALUE VALUETYPE=\"string\" TYPE=\"string\">");
    EXPECT_EQ(keyValueElements(sfcbPort()), "<KEYVALUE VALUETYPE=\"string\">");
}

}  // namespace
}  // namespace orv::e2e
