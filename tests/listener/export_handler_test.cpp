// The listener's answers to export requests, good and bad.
#include "orv/listener/export_handler.hpp"

#include <gtest/gtest.h>

#include "orv/exporter/export_message.hpp"
#include "orv/listener/indication_format.hpp"

namespace orv::listener {
namespace {

const char* const kInstance =
    "<INSTANCE CLASSNAME=\"CIM_AlertIndication\"><PROPERTY NAME=\"AlertType\" TYPE=\"uint16\"><VALUE>2</VALUE>"
    "</PROPERTY></INSTANCE>";

http::Request exportRequest(std::string body) {
    http::Request request;
    request.method = "POST";
    request.path = "/";
    request.headers = {{"CIMExport", "MethodRequest"}, {"CIMExportMethod", "ExportIndication"},
                       {"CIMProtocolVersion", "1.0"}};
    request.body = std::move(body);
    return request;
}

struct Received {
    std::vector<std::string> lines;
    std::optional<std::string> refusal;
    IndicationSink sink() {
        return [this](const cimxml::InstanceModel& instance) -> std::optional<std::string> {
            if (refusal) {
                return refusal;
            }
            lines.push_back(formatText(instance));
            return std::nullopt;
        };
    }
};

std::string cimError(const http::Response& response) {
    for (const auto& [name, value] : response.headers) {
        if (name == "CIMError") {
            return value;
        }
    }
    return "";
}

TEST(ExportHandler, AcceptsAnExportRequestAndAnswersWithAnExportResponse) {
    Received received;
    const http::Response response =
        handleExportRequest(exportRequest(exporter::buildExportRequest(9, kInstance)), received.sink());
    EXPECT_EQ(response.status, 200);
    EXPECT_EQ(response.body, exporter::buildExportResponse("9"));
    EXPECT_EQ(response.headers,
              (std::vector<std::pair<std::string, std::string>>{{"CIMExport", "MethodResponse"},
                                                                {"CIMProtocolVersion", "1.0"}}));
    EXPECT_EQ(received.lines, std::vector<std::string>{"CIM_AlertIndication AlertType=2"});
}

TEST(ExportHandler, ARefusedIndicationAnswersCimErrFailed) {
    Received received;
    received.refusal = "enough";
    const http::Response response =
        handleExportRequest(exportRequest(exporter::buildExportRequest(9, kInstance)), received.sink());
    EXPECT_EQ(response.status, 200);
    EXPECT_EQ(response.body, exporter::buildExportResponse("9", 1, "enough"));
}

TEST(ExportHandler, RequestsWithoutTheExportHeaderAreNotExportRequests) {
    Received received;
    http::Request request = exportRequest(exporter::buildExportRequest(1, kInstance));
    request.headers.erase(request.headers.begin());
    http::Response response = handleExportRequest(request, received.sink());
    EXPECT_EQ(response.status, 400);
    EXPECT_EQ(cimError(response), "unsupported-operation");

    request.headers.emplace_back("CIMExport", "MethodCall");
    response = handleExportRequest(request, received.sink());
    EXPECT_EQ(response.status, 400);
    EXPECT_EQ(cimError(response), "unsupported-operation");
    EXPECT_TRUE(received.lines.empty());
}

TEST(ExportHandler, AMethodHeaderThatDoesNotMatchTheBodyIsAHeaderMismatch) {
    Received received;
    http::Request request = exportRequest(exporter::buildExportRequest(1, kInstance));
    request.headers[1].second = "ExportSomethingElse";
    http::Response response = handleExportRequest(request, received.sink());
    EXPECT_EQ(response.status, 400);
    EXPECT_EQ(cimError(response), "header-mismatch");
    request.headers.erase(request.headers.begin() + 1);
    response = handleExportRequest(request, received.sink());
    EXPECT_EQ(cimError(response), "header-mismatch");
    EXPECT_TRUE(received.lines.empty());
}

TEST(ExportHandler, MalformedBodiesAnswerTheMatchingCimError) {
    const std::pair<std::string, std::pair<int, std::string>> cases[] = {
        {"<CIM><MESSAGE", {400, "request-not-well-formed"}},
        {"<CIM CIMVERSION=\"2.0\" DTDVERSION=\"2.0\"/>", {400, "request-not-valid"}},
        {"<CIM CIMVERSION=\"1.0\" DTDVERSION=\"2.0\"/>", {501, "unsupported-cim-version"}},
        {"<CIM CIMVERSION=\"2.0\" DTDVERSION=\"2.0\"><MESSAGE ID=\"1\" PROTOCOLVERSION=\"1.0\"><MULTIEXPREQ/>"
         "</MESSAGE></CIM>",
         {501, "multiple-requests-unsupported"}},
        // A property without a TYPE inside the indication.
        {exporter::buildExportRequest(1, "<INSTANCE CLASSNAME=\"C\"><PROPERTY NAME=\"P\"/></INSTANCE>"),
         {400, "request-not-valid"}},
    };
    for (const auto& [body, expected] : cases) {
        Received received;
        const http::Response response = handleExportRequest(exportRequest(body), received.sink());
        EXPECT_EQ(response.status, expected.first) << body;
        EXPECT_EQ(cimError(response), expected.second) << body;
        EXPECT_TRUE(received.lines.empty());
    }
}

TEST(ExportHandler, AnUnsupportedProtocolVersionHeaderIsRefused) {
    Received received;
    http::Request request = exportRequest(exporter::buildExportRequest(1, kInstance));
    request.headers[2].second = "2.0";
    const http::Response response = handleExportRequest(request, received.sink());
    EXPECT_EQ(response.status, 501);
    EXPECT_EQ(cimError(response), "unsupported-protocol-version");
}

}  // namespace
}  // namespace orv::listener
