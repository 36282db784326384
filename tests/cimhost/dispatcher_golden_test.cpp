// CIM-XML requests answered by the dispatcher over the raw C test provider: every
// request and every answer is checked against the CIM-XML DTD, and the answer must be
// its golden file (tests/cimhost/golden/<name>.xml; ORV_UPDATE_GOLDEN=1 rewrites them).
#include <gtest/gtest.h>

#include <cstdlib>
#include <fstream>
#include <memory>
#include <ostream>

#include "cimxml_exchange.hpp"

namespace orv::cimhost::test {
namespace {

struct Case {
    const char* name;       // golden file
    const char* request;    // request file
    const char* principal;  // steers the raw provider
    bool validRequest = true;  // false: a request the DTD refuses, sent on purpose
};

std::ostream& operator<<(std::ostream& out, const Case& c) { return out << c.name; }

const Case kCases[] = {
    // Status codes: each operation answers only codes its list has, with the provider's message.
    {"gi_no_such_property_is_invalid_parameter", "gi_element", "nosuchproperty"},
    {"gi_not_found_without_message", "gi_element", "errornomsg"},
    {"gi_failure_after_the_instance_answers_only_the_error", "gi_element", "lateerror"},
    {"ei_not_found_without_message_is_invalid_parameter", "ei_element", "errornomsg"},
    {"ei_invalid_class_from_provider_kept", "ei_element", "invalidclass"},
    {"ai_invalid_class_from_provider_is_invalid_parameter", "ai_element", "invalidclass"},
    {"ai_unknown_class_is_invalid_parameter", "ai_unknown_class", "user"},
    {"cm_unknown_class_is_not_found", "cm_unknown_class", "user"},
    // ExecQuery of a provider that refuses it: answered from its enumeration, with paths.
    {"eq_where_filters_the_enumeration", "eq_where", "noquery"},
    {"eq_select_list_gives_its_properties_and_keys_in_the_path", "eq_select_list", "noquery"},
    {"eq_cql_of_the_wql_subset", "eq_cql", "noquery"},
    {"eq_unknown_language_is_not_supported", "eq_unknown_language", "noquery"},
    {"eq_malformed_query_is_invalid", "eq_malformed", "noquery"},
    {"eq_unknown_class_is_invalid_query", "eq_unknown_class", "noquery"},
    // Every parameter form the DTD allows is read; operations the host does not serve
    // answer CIM_ERR_NOT_SUPPORTED, a form an operation does not take INVALID_PARAMETER.
    {"cc_class_parameter_is_not_supported", "cc_class", "user"},
    {"mc_class_parameter_is_not_supported", "mc_class", "user"},
    {"sq_qualifier_declaration_is_not_supported", "sq_qualifier_declaration", "user"},
    {"gi_class_as_instance_name_is_invalid_parameter", "gi_class_as_instance_name", "user"},
    {"cc_class_with_an_instance_inside_is_not_valid", "cc_class_with_instance_inside", "user", false},
    {"cm_reference_array_reaches_the_provider", "cm_reference_array", "user"},
    {"cm_reference_array_sent_as_values_is_invalid_parameter", "cm_reference_array_as_values", "user"},
    // Request paths: keys are checked against the class; those that pass reach the provider.
    {"gi_undeclared_key_is_invalid_parameter", "gi_undeclared_key", "user"},
    {"gi_non_key_property_as_key_is_invalid_parameter", "gi_non_key_property", "user"},
    {"gi_duplicate_key_is_invalid_parameter", "gi_duplicate_key", "user"},
    {"gi_numeric_valuetype_holding_text_is_invalid_parameter", "gi_numeric_valuetype_text", "user"},
    {"gi_type_attribute_of_another_type_is_invalid_parameter", "gi_wrong_type_attribute", "user"},
    {"gi_unnamed_key_value_of_a_single_key_class", "gi_unnamed_key_value", "user"},
    {"gi_keys_reach_the_provider_as_sent", "gi_element", "user"},
    {"ai_instance_name_without_keys_is_invalid_parameter", "ai_instance_without_keys", "user"},
    {"ain_class_name_is_answered_for_the_class", "ain_class_name", "user"},
    // Key values carry their CIM type.
    {"ein_keyvalues_carry_type", "ein_element", "user"},
};

class DispatcherGoldenTest : public ::testing::TestWithParam<Case> {
protected:
    static void SetUpTestSuite() { exchange_ = std::make_unique<Exchange>(); }
    static void TearDownTestSuite() { exchange_.reset(); }

    static std::unique_ptr<Exchange> exchange_;
};

std::unique_ptr<Exchange> DispatcherGoldenTest::exchange_;

TEST_P(DispatcherGoldenTest, AnswersAsTheGoldenFileAndTheDtdSay) {
    const Case& c = GetParam();
    const std::string request = readText(sourcePath(std::string("tests/cimhost/requests/") + c.request + ".xml"));
    ASSERT_FALSE(request.empty()) << "no request file " << c.request;
    EXPECT_EQ(dtdErrors(request).empty(), c.validRequest) << "the request " << c.request;
    const std::string answer = exchange_->answer(request, c.principal);
    const std::string goldenPath = sourcePath(std::string("tests/cimhost/golden/") + c.name + ".xml");
    if (std::getenv("ORV_UPDATE_GOLDEN") != nullptr) {
        std::ofstream(goldenPath) << answer;
    }
    EXPECT_EQ(answer, readText(goldenPath));
    if (answer.rfind("HTTP ", 0) != 0) {
        EXPECT_EQ(dtdErrors(answer), "") << answer;
    }
}

INSTANTIATE_TEST_SUITE_P(Requests, DispatcherGoldenTest, ::testing::ValuesIn(kCases),
                         [](const ::testing::TestParamInfo<Case>& param) { return std::string(param.param.name); });

}  // namespace
}  // namespace orv::cimhost::test
