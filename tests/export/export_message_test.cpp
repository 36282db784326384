// Export request and response documents, and destination URLs.
#include "orv/exporter/export_message.hpp"

#include <gtest/gtest.h>

#include "orv/cimxml/request_parser.hpp"
#include "orv/exporter/destination_url.hpp"
#include "orv/exporter/exporter.hpp"

namespace orv::exporter {
namespace {

using cimxml::ProtocolError;

const char* const kInstance = "<INSTANCE CLASSNAME=\"CIM_AlertIndication\"/>";

ProtocolError::Kind failureOf(const std::string& body) {
    try {
        parseExportRequest(body);
    } catch (const ProtocolError& error) {
        return error.kind();
    }
    ADD_FAILURE() << "accepted: " << body;
    return ProtocolError::Kind::NotValid;
}

std::string request(const std::string& cimAttributes, const std::string& messageAttributes, const std::string& inner) {
    return "<CIM " + cimAttributes + "><MESSAGE " + messageAttributes + ">" + inner + "</MESSAGE></CIM>";
}

const std::string kVersions = R"(CIMVERSION="2.0" DTDVERSION="2.0")";
const std::string kMessage = R"(ID="4" PROTOCOLVERSION="1.0")";

TEST(ExportMessage, ARequestReadsBackWithItsIdAndIndication) {
    const std::string body = buildExportRequest(42, kInstance);
    EXPECT_EQ(body,
              "<?xml version=\"1.0\" encoding=\"utf-8\"?>\n"
              "<CIM CIMVERSION=\"2.0\" DTDVERSION=\"2.0\"><MESSAGE ID=\"42\" PROTOCOLVERSION=\"1.0\">"
              "<SIMPLEEXPREQ><EXPMETHODCALL NAME=\"ExportIndication\"><EXPPARAMVALUE NAME=\"NewIndication\">"
              "<INSTANCE CLASSNAME=\"CIM_AlertIndication\"/></EXPPARAMVALUE></EXPMETHODCALL></SIMPLEEXPREQ>"
              "</MESSAGE></CIM>");
    const ExportRequest parsed = parseExportRequest(body);
    EXPECT_EQ(parsed.messageId, "42");
    EXPECT_EQ(parsed.methodName, "ExportIndication");
    ASSERT_NE(parsed.indication, nullptr);
    EXPECT_EQ(*parsed.indication->attribute("CLASSNAME"), "CIM_AlertIndication");
}

TEST(ExportMessage, ResponsesCarryTheRequestIdAndAnErrorWhenThereIsOne) {
    EXPECT_EQ(buildExportResponse("42"),
              "<?xml version=\"1.0\" encoding=\"utf-8\"?>\n"
              "<CIM CIMVERSION=\"2.0\" DTDVERSION=\"2.0\"><MESSAGE ID=\"42\" PROTOCOLVERSION=\"1.0\">"
              "<SIMPLEEXPRSP><EXPMETHODRESPONSE NAME=\"ExportIndication\"></EXPMETHODRESPONSE></SIMPLEEXPRSP>"
              "</MESSAGE></CIM>");
    EXPECT_EQ(exportResponseError(buildExportResponse("42")), std::nullopt);
    EXPECT_EQ(exportResponseError(buildExportResponse("42", 1, "full")), "listener answered error 1: full");
    EXPECT_EQ(exportResponseError("<CIM/>"), "response has no EXPMETHODRESPONSE");
    EXPECT_EQ(exportResponseError("<CIM").value().rfind("response is not well formed", 0), 0U);
}

TEST(ExportMessage, MalformedRequestsAreRejectedWithTheirKind) {
    const std::string call =
        R"(<SIMPLEEXPREQ><EXPMETHODCALL NAME="ExportIndication"><EXPPARAMVALUE NAME="NewIndication">)" +
        std::string(kInstance) + "</EXPPARAMVALUE></EXPMETHODCALL></SIMPLEEXPREQ>";
    EXPECT_EQ(failureOf("<CIM"), ProtocolError::Kind::NotWellFormed);
    EXPECT_EQ(failureOf("<NOTCIM/>"), ProtocolError::Kind::NotValid);
    EXPECT_EQ(failureOf(request(R"(CIMVERSION="3.0" DTDVERSION="2.0")", kMessage, call)),
              ProtocolError::Kind::UnsupportedCimVersion);
    EXPECT_EQ(failureOf(request(R"(CIMVERSION="2.0" DTDVERSION="3.1")", kMessage, call)),
              ProtocolError::Kind::UnsupportedDtdVersion);
    EXPECT_EQ(failureOf(request(kVersions, R"(ID="4" PROTOCOLVERSION="2.0")", call)),
              ProtocolError::Kind::UnsupportedProtocolVersion);
    EXPECT_EQ(failureOf(request(kVersions, kMessage, "<MULTIEXPREQ>" + call + "</MULTIEXPREQ>")),
              ProtocolError::Kind::MultipleRequestsUnsupported);
    EXPECT_EQ(failureOf(request(kVersions, R"(PROTOCOLVERSION="1.0")", call)), ProtocolError::Kind::NotValid);
    EXPECT_EQ(failureOf(request(kVersions, kMessage, "<SIMPLEREQ/>")), ProtocolError::Kind::NotValid);
    EXPECT_EQ(failureOf(request(kVersions, kMessage,
                                R"(<SIMPLEEXPREQ><EXPMETHODCALL NAME="ExportSomething"/></SIMPLEEXPREQ>)")),
              ProtocolError::Kind::NotValid);
    EXPECT_EQ(failureOf(request(kVersions, kMessage,
                                R"(<SIMPLEEXPREQ><EXPMETHODCALL NAME="ExportIndication"/></SIMPLEEXPREQ>)")),
              ProtocolError::Kind::NotValid);
    EXPECT_EQ(failureOf(request(kVersions, kMessage,
                                R"(<SIMPLEEXPREQ><EXPMETHODCALL NAME="ExportIndication">)"
                                R"(<EXPPARAMVALUE NAME="NewIndication"/></EXPMETHODCALL></SIMPLEEXPREQ>)")),
              ProtocolError::Kind::NotValid);
    EXPECT_EQ(failureOf(request(kVersions, kMessage,
                                R"(<SIMPLEEXPREQ><EXPMETHODCALL NAME="ExportIndication">)"
                                R"(<EXPPARAMVALUE NAME="NewIndication"><INSTANCE/></EXPPARAMVALUE>)"
                                R"(</EXPMETHODCALL></SIMPLEEXPREQ>)")),
              ProtocolError::Kind::NotValid);
}

TEST(DestinationUrl, NamesSchemeHostPortAndPath) {
    auto url = parseDestinationUrl("http://127.0.0.1:5990/cimlistener/x");
    ASSERT_TRUE(url);
    EXPECT_FALSE(url->https);
    EXPECT_EQ(url->host, "127.0.0.1");
    EXPECT_EQ(url->port, 5990);
    EXPECT_EQ(url->path, "/cimlistener/x");

    url = parseDestinationUrl("HTTPS://[::1]");
    ASSERT_TRUE(url);
    EXPECT_TRUE(url->https);
    EXPECT_EQ(url->host, "::1");
    EXPECT_EQ(url->port, 443);
    EXPECT_EQ(url->path, "/");

    url = parseDestinationUrl("http://listener.example");
    ASSERT_TRUE(url);
    EXPECT_EQ(url->port, 80);
}

TEST(DestinationUrl, RejectsWhatIsNotAListenerUrl) {
    const std::pair<const char*, const char*> cases[] = {
        {"localhost:5990", "the URL does not start with http:// or https://"},
        {"http://", "the URL has no host"},
        {"http://:5990/", "the URL has no host"},
        {"http://host:/", "empty port"},
        {"http://host:99999/", "bad port '99999'"},
        {"http://host:12a/", "bad port '12a'"},
        {"http://user@host/", "user information in the URL is not supported"},
        {"http://[::1/", "unterminated IPv6 address"},
        {"http://[::1]x/", "unexpected text after the IPv6 address"},
    };
    for (const auto& [text, reason] : cases) {
        std::string why;
        EXPECT_FALSE(parseDestinationUrl(text, &why)) << text;
        EXPECT_EQ(why, reason) << text;
        EXPECT_FALSE(validDestinationUrl(text));
    }
    EXPECT_TRUE(validDestinationUrl("http://127.0.0.1:5990"));
    EXPECT_EQ(validDestinationUrl("https://127.0.0.1:5990"), tlsSupported());
}

}  // namespace
}  // namespace orv::exporter
