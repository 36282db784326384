// A processor without the listed features has NULL elements in its
// characteristic arrays. Both brokers leave them out (orv-cimhost by default,
// as sfcb does), so wbemcli reads the same Orvane_Processor from each. Runs in
// a private sfcb on a simulated host whose CPUs report an unknown vendor, for
// which no 64-bit, virtualisation or no-execute flag is read.
#include <gtest/gtest.h>
#include <signal.h>

#include <filesystem>
#include <fstream>

#include "broker_answers.hpp"
#include "golden_file.hpp"
#include "two_broker_fixture.hpp"

namespace orv::e2e {
namespace {

// The shipped simulated host with the vendor text of CPUID leaf 0 ("Genu" in EBX) blanked on every CPU.
std::string hostOfUnknownVendor(const std::string& folder) {
    std::string text = readFile(sourceDir() + "/platform/sim/examples/host.json");
    const std::string genu = "\"0x756E6547\"";
    int replaced = 0;
    for (std::size_t at = text.find(genu); at != std::string::npos; at = text.find(genu, at)) {
        text.replace(at, genu.size(), "\"0x00000000\"");
        ++replaced;
    }
    const std::string path = folder + "/host-unknown-vendor.json";
    std::ofstream(path) << text;
    return replaced > 0 ? path : "";
}

TEST(SfcbArrayNullElements, ProcessorLackingFeaturesReadsTheSameInBothBrokers) {
    const std::string folder = buildDir() + "/sfcb/unknown-vendor";
    std::filesystem::create_directories(folder);
    const std::string fixture = hostOfUnknownVendor(folder);
    ASSERT_FALSE(fixture.empty()) << "the shipped host no longer has the CPUID value this test edits";
    SfcbBroker sfcb = SfcbBroker::start(folder + "/run", fixture);
    if (sfcbMissing(sfcb)) {
        GTEST_SKIP() << "sfcb is unavailable: " << sfcb.reason();
    }
    std::unique_ptr<HostProcess> orv = startOrvCimhost(fixture);
    ASSERT_TRUE(orv->waitReady()) << orv->output();

    const std::string orvAnswer = wbemcli(orv->port(), "ei -nl", "Orvane_Processor");
    const std::string sfcbAnswer = wbemcli(sfcb.port(), "ei -nl", "Orvane_Processor");
    // Two of the five characteristics are left: hyperthreading (5) and power control (7).
    EXPECT_NE(orvAnswer.find("-Characteristics=5,7\n"), std::string::npos) << orvAnswer;
    EXPECT_NE(orvAnswer.find("-EnabledProcessorCharacteristics=2,2\n"), std::string::npos) << orvAnswer;
    orv::repository::ClassRepository classes;
    classes.loadFile(sourceDir() + "/cim/mof/orvprovider.mof");
    EXPECT_EQ(compareAnswers(orvAnswer, sfcbAnswer, classes), "");
    EXPECT_EQ(sfcb.healthProblem(), "");
    EXPECT_EQ(orv->stop(SIGTERM), 0);
}

}  // namespace
}  // namespace orv::e2e
