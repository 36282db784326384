#include "ip_change_lines.hpp"

#include <gtest/gtest.h>

#include <chrono>
#include <iostream>
#include <regex>

namespace orv::e2e {

namespace {

// The text of the embedded instance `property` (between its braces), or "".
std::string embeddedInstance(const std::string& line, const std::string& property) {
    const std::regex instance("(?:^| )" + property + "=Orvane_KernelIPv4ProtocolEndpoint\\{([^}]*)\\}");
    std::smatch match;
    return std::regex_search(line, match, instance) ? match[1].str() : "";
}

// How often the kernel IP monitor looks for replaced addresses.
constexpr std::chrono::seconds kIpCheckPeriod{30};

}  // namespace

std::vector<std::string> waitForIpChange(listener::test::ListenerProcess& listener) {
    const auto started = std::chrono::steady_clock::now();
    std::vector<std::string> lines = listener.waitLines(1, kIpCheckPeriod + std::chrono::seconds(20));
    std::cout << "indication after "
              << std::chrono::duration_cast<std::chrono::seconds>(std::chrono::steady_clock::now() - started).count()
              << " s" << std::endl;
    return lines;
}

void expectVif0Replaced(const std::string& line, const std::string& previous, const std::string& current) {
    EXPECT_EQ(line.rfind("Orvane_KernelIPChangedIndication ", 0), 0U) << line;
    EXPECT_NE(line.find(" IndicationIdentifier=\"Orvane:vif0\""), std::string::npos) << line;
    EXPECT_NE(line.find(" PerceivedSeverity=3"), std::string::npos) << line;
    EXPECT_NE(line.find(" SourceInstanceHost=\"" + current + "\""), std::string::npos) << line;
    EXPECT_NE(line.find(" SourceInstanceModelPath=\"root/cimv2:Orvane_KernelIPv4ProtocolEndpoint."
                        "SystemCreationClassName=\\\"OMC_UnitaryComputerSystem\\\","
                        "SystemName=\\\"orvhost01.lab.example.com\\\","
                        "CreationClassName=\\\"Orvane_KernelIPv4ProtocolEndpoint\\\",Name=\\\"vif0\\\"\""),
              std::string::npos)
        << line;
    const std::string source = embeddedInstance(line, "SourceInstance");
    const std::string before = embeddedInstance(line, "PreviousInstance");
    EXPECT_NE(source.find("Name=\"vif0\" "), std::string::npos) << line;
    EXPECT_NE(source.find("IPv4Address=\"" + current + "\""), std::string::npos) << line;
    EXPECT_NE(before.find("Name=\"vif0\" "), std::string::npos) << line;
    EXPECT_NE(before.find("IPv4Address=\"" + previous + "\""), std::string::npos) << line;
}

}  // namespace orv::e2e
