// wbemcli against a running orv-cimhost serving the raw test provider; each command's
// output is compared exactly with its golden file (ORV_UPDATE_GOLDEN=1 rewrites them).
#include <gtest/gtest.h>
#include <signal.h>

#include <regex>

#include "golden_file.hpp"
#include "host_process.hpp"

namespace orv::e2e {
namespace {

struct WbemcliCase {
    const char* name;      // golden file name
    const char* user;      // principal the provider sees
    const char* command;   // wbemcli operation
    const char* object;    // after the URL's namespace; may be empty
    const char* extra;     // arguments after the URL
};

class WbemcliTest : public ::testing::TestWithParam<WbemcliCase> {
protected:
    static void SetUpTestSuite() { SharedRawHost::start(); }
    static void TearDownTestSuite() { SharedRawHost::stop(); }
};

TEST_P(WbemcliTest, OutputMatchesGolden) {
    const WbemcliCase& c = GetParam();
    const std::string port = std::to_string(SharedRawHost::host->port());
    const std::string url = std::string("'http://") + c.user + ":secret@localhost:" + port + "/root/" + c.object + "'";
    std::string output = runCommand(std::string("timeout 20 wbemcli ") + c.command + " " + url + " " + c.extra);
    output = std::regex_replace(output, std::regex("localhost:" + port), "localhost:PORT");
    EXPECT_EQ(output, goldenText(sourceDir() + "/tests/e2e/golden/" + c.name + ".txt", output)) << c.name;
}

const WbemcliCase kCases[] = {
    {"ecn", "user", "ecn", "cimv2", ""},
    {"ecn_subclasses", "user", "ecn", "cimv2:Raw_Base", ""},
    {"gc", "user", "gc", "cimv2:Raw_Element", ""},
    {"gc_unknown_class", "user", "gc", "cimv2:No_Such", ""},
    {"ein", "user", "ein", "cimv2:Raw_Element", ""},
    {"ei", "user", "ei", "cimv2:Raw_Element", ""},
    {"ei_property_list", "user", "ei", "cimv2:Raw_Element", "Name,Numbers"},
    {"gi", "user", "gi", "cimv2:Raw_Element.Name=\"e1\"", ""},
    {"ain", "user", "ain", "cimv2:Raw_Element.Name=\"e1\"", ""},
    {"ain_assoc_class", "user", "ain -ac Raw_SubAssoc", "cimv2:Raw_Element.Name=\"e1\"", ""},
    {"ai", "user", "ai", "cimv2:Raw_Element.Name=\"e1\"", ""},
    {"rin", "user", "rin", "cimv2:Raw_Element.Name=\"e1\"", ""},
    {"ri", "user", "ri", "cimv2:Raw_Element.Name=\"e1\"", ""},
    {"cm_echo", "user", "cm", "cimv2:Raw_Element.Name=\"e1\"", "'Echo.Text=hi there,Number=7'"},
    {"cm_unknown_method", "user", "cm", "cimv2:Raw_Element.Name=\"e1\"", "Nope"},
    {"ci_refused", "error", "ci", "cimv2:Raw_Element.Name=\"e1\"", "'Name=\"e1\",Counter=3'"},
    {"mi_refused", "error", "mi", "cimv2:Raw_Element.Name=\"e1\"", "'Counter=4'"},
    {"di_refused", "error", "di", "cimv2:Raw_Element.Name=\"e1\"", ""},
    {"ei_refused_without_message", "errornomsg", "ei", "cimv2:Raw_Element", ""},
    {"ei_unknown_namespace", "user", "ei", "nowhere:Raw_Element", ""},
    {"ei_unknown_class", "user", "ei", "cimv2:No_Such", ""},
    {"gi_unknown_class", "user", "gi", "cimv2:No_Such.Name=\"e1\"", ""},
};

INSTANTIATE_TEST_SUITE_P(Wbemcli, WbemcliTest, ::testing::ValuesIn(kCases),
                         [](const ::testing::TestParamInfo<WbemcliCase>& param) { return param.param.name; });

}  // namespace
}  // namespace orv::e2e
