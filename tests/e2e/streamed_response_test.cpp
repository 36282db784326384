// A large answer (EnumerateInstances of the Ethernet ports of a generated 64-NIC simulated
// host) leaves while the provider runs, with the chunked transfer coding, and is the same
// document an HTTP/1.0 client gets whole; keep-alive and pipelining work behind it.
#include <gtest/gtest.h>
#include <signal.h>
#include <stdlib.h>

#include <chrono>
#include <filesystem>
#include <optional>

#include "host_process.hpp"
#include "raw_connection.hpp"

namespace orv::e2e {
namespace {

using namespace std::chrono_literals;

const std::string kEnumeratePorts =
    "<?xml version=\"1.0\" encoding=\"utf-8\"?><CIM CIMVERSION=\"2.0\" DTDVERSION=\"2.0\">"
    "<MESSAGE ID=\"5\" PROTOCOLVERSION=\"1.0\"><SIMPLEREQ><IMETHODCALL NAME=\"EnumerateInstances\">"
    "<LOCALNAMESPACEPATH><NAMESPACE NAME=\"root\"/><NAMESPACE NAME=\"cimv2\"/></LOCALNAMESPACEPATH>"
    "<IPARAMVALUE NAME=\"ClassName\"><CLASSNAME NAME=\"Orvane_EthernetPort\"/></IPARAMVALUE>"
    "</IMETHODCALL></SIMPLEREQ></MESSAGE></CIM>";

class StreamedResponseTest : public ::testing::Test {
protected:
    static void SetUpTestSuite() {
        fixture_ = std::filesystem::temp_directory_path() / ("orv-streamed-" + std::to_string(getpid()) + ".json");
        const std::string generate = buildDir() + "/bin/orv-simgen --nics 64 -o " + fixture_.string();
        ASSERT_EQ(std::system(generate.c_str()), 0) << generate;
        host_ = new HostProcess({"--provider-dir", buildDir() + "/lib", "--platform", "sim", "--fixture",
                                 fixture_.string(), "--host-name", "testhost"});
        ASSERT_TRUE(host_->waitReady()) << host_->output();
    }
    static void TearDownTestSuite() {
        EXPECT_EQ(host_->stop(SIGTERM), 0) << host_->output();
        delete host_;
        std::filesystem::remove(fixture_);
    }

    static std::string http10(const std::string& request) {
        std::string head = request;
        head.replace(head.find("HTTP/1.1"), 8, "HTTP/1.0");
        return head;
    }

    // An EnumerateInstances of the ports on a connection of its own, answered chunked.
    static RawResponse streamedEnumeration() {
        RawConnection connection(host_->port());
        EXPECT_TRUE(connection.send(cimPost(kEnumeratePorts, "EnumerateInstances")));
        std::optional<RawResponse> response = connection.readResponse(20s);
        if (!response) {
            ADD_FAILURE() << "no answer";
            return {};
        }
        EXPECT_EQ(response->status, 200);
        EXPECT_TRUE(response->chunked);
        EXPECT_EQ(response->headers.count("content-length"), 0U);
        return *response;
    }

    static HostProcess* host_;
    static std::filesystem::path fixture_;
};

HostProcess* StreamedResponseTest::host_ = nullptr;
std::filesystem::path StreamedResponseTest::fixture_;

TEST_F(StreamedResponseTest, LargeEnumerationArrivesChunkedAndEqualsTheWholeAnswerOfHttp10) {
    RawResponse chunked = streamedEnumeration();
    EXPECT_EQ(chunked.headers["cimoperation"], "MethodResponse");

    RawConnection whole(host_->port());
    ASSERT_TRUE(whole.send(http10(cimPost(kEnumeratePorts, "EnumerateInstances"))));
    auto plain = whole.readResponse(20s);
    ASSERT_TRUE(plain);
    EXPECT_FALSE(plain->chunked);
    EXPECT_EQ(plain->headers["content-length"], std::to_string(plain->body.size()));
    EXPECT_EQ(chunked.body, plain->body);
    std::size_t instances = 0;
    for (auto at = plain->body.find("<VALUE.NAMEDINSTANCE>"); at != std::string::npos;
         at = plain->body.find("<VALUE.NAMEDINSTANCE>", at + 1)) {
        ++instances;
    }
    EXPECT_EQ(instances, 64U);
    EXPECT_NE(plain->body.find("</IRETURNVALUE></IMETHODRESPONSE></SIMPLERSP></MESSAGE></CIM>"), std::string::npos);
}

TEST_F(StreamedResponseTest, PipelinedRequestsBehindStreamedAnswersAreAnsweredInOrderOnTheSameConnection) {
    RawConnection connection(host_->port());
    ASSERT_TRUE(connection.send(cimPost(kEnumeratePorts, "EnumerateInstances") +
                                cimPost(kEnumeratePorts, "EnumerateInstances") +
                                cimPost(enumerateClassNamesBody(8), "EnumerateClassNames")));
    auto first = connection.readResponse(20s);
    auto second = connection.readResponse(20s);
    auto third = connection.readResponse(20s);
    ASSERT_TRUE(first && second && third);
    EXPECT_TRUE(first->chunked);
    EXPECT_TRUE(second->chunked);
    EXPECT_EQ(first->body, second->body);
    EXPECT_FALSE(third->chunked);
    EXPECT_EQ(third->status, 200);
    EXPECT_NE(third->body.find("MESSAGE ID=\"8\""), std::string::npos);
}

TEST_F(StreamedResponseTest, SmallAnswersKeepTheirContentLength) {
    RawConnection connection(host_->port());
    ASSERT_TRUE(connection.send(cimPost(enumerateClassNamesBody(3), "EnumerateClassNames")));
    auto response = connection.readResponse(20s);
    ASSERT_TRUE(response);
    EXPECT_FALSE(response->chunked);
    EXPECT_EQ(response->headers["content-length"], std::to_string(response->body.size()));
}

TEST_F(StreamedResponseTest, AClientLeavingInTheMiddleOfAStreamedAnswerLeavesTheHostServing) {
    for (int i = 0; i < 5; ++i) {
        RawConnection leaving(host_->port());
        ASSERT_TRUE(leaving.send(cimPost(kEnumeratePorts, "EnumerateInstances")));
    }  // closed at once, the answers still on their way
    EXPECT_NE(streamedEnumeration().body.find("</CIM>"), std::string::npos);
}

}  // namespace
}  // namespace orv::e2e
