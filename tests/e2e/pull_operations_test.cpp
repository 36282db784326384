// The pull operations over HTTP: Open*, Pull*, CloseEnumeration and
// EnumerationCount against the raw test provider, each answer checked for the
// DSP0201 shape (IRETURNVALUE, then the EndOfSequence and EnumerationContext
// PARAMVALUEs) and compared with what the classic operations return.
#include <gtest/gtest.h>
#include <httplib.h>
#include <signal.h>

#include <thread>

#include "host_process.hpp"
#include "orv/cimxml/xml_tree.hpp"

namespace orv::e2e {
namespace {

using cimxml::XmlElement;

std::string param(const std::string& name, const std::string& value) {
    return "<IPARAMVALUE NAME=\"" + name + "\"><VALUE>" + value + "</VALUE></IPARAMVALUE>";
}

std::string className(const std::string& name) {
    return "<IPARAMVALUE NAME=\"ClassName\"><CLASSNAME NAME=\"" + name + "\"/></IPARAMVALUE>";
}

std::string elementName(const std::string& name, const std::string& parameter = "InstanceName") {
    return "<IPARAMVALUE NAME=\"" + parameter + "\"><INSTANCENAME CLASSNAME=\"Raw_Element\"><KEYBINDING NAME=\"Name\">"
           "<KEYVALUE VALUETYPE=\"string\">" + name + "</KEYVALUE></KEYBINDING></INSTANCENAME></IPARAMVALUE>";
}

// One answer, read into its parts.
struct Answer {
    std::unique_ptr<XmlElement> root;
    int error = 0;
    std::string description;
    std::vector<const XmlElement*> objects;  // the children of IRETURNVALUE
    std::optional<bool> endOfSequence;
    std::optional<std::string> context;
    std::string body;
};

class PullOperationsTest : public ::testing::Test {
protected:
    static void SetUpTestSuite() { SharedRawHost::start(); }
    static void TearDownTestSuite() { SharedRawHost::stop(); }

    static Answer call(const std::string& method, const std::string& params, const std::string& user = "user") {
        const std::string body =
            "<?xml version=\"1.0\" encoding=\"utf-8\"?><CIM CIMVERSION=\"2.0\" DTDVERSION=\"2.0\">"
            "<MESSAGE ID=\"5\" PROTOCOLVERSION=\"1.0\"><SIMPLEREQ><IMETHODCALL NAME=\"" + method +
            "\"><LOCALNAMESPACEPATH><NAMESPACE NAME=\"root\"/><NAMESPACE NAME=\"cimv2\"/></LOCALNAMESPACEPATH>" +
            params + "</IMETHODCALL></SIMPLEREQ></MESSAGE></CIM>";
        httplib::Client client("127.0.0.1", SharedRawHost::host->port());
        client.set_read_timeout(20);
        client.set_basic_auth(user, "secret");
        auto result = client.Post("/cimom",
                                  {{"CIMOperation", "MethodCall"}, {"CIMMethod", method}, {"CIMObject", "root%2Fcimv2"}},
                                  body, "application/xml; charset=\"utf-8\"");
        Answer answer;
        if (!result || result->status != 200) {
            ADD_FAILURE() << method << ": no 200 answer";
            return answer;
        }
        answer.body = result->body;
        answer.root = cimxml::parseXmlDocument(result->body);
        const XmlElement* response =
            answer.root->child("MESSAGE")->child("SIMPLERSP")->child("IMETHODRESPONSE");
        EXPECT_EQ(*response->attribute("NAME"), method);
        readResponse(*response, answer);
        return answer;
    }

    // IMETHODRESPONSE holds ERROR, or IRETURNVALUE? followed by PARAMVALUE*.
    static void readResponse(const XmlElement& response, Answer& answer) {
        bool seenParam = false;
        for (const auto& child : response.children) {
            if (child->name == "ERROR") {
                EXPECT_EQ(response.children.size(), 1u);
                answer.error = std::stoi(std::string(*child->attribute("CODE")));
                const std::string_view* description = child->attribute("DESCRIPTION");
                answer.description = description != nullptr ? std::string(*description) : "";
            } else if (child->name == "IRETURNVALUE") {
                EXPECT_FALSE(seenParam) << "IRETURNVALUE after a PARAMVALUE";
                for (const auto& object : child->children) {
                    answer.objects.push_back(object);
                }
            } else {
                ASSERT_EQ(child->name, "PARAMVALUE");
                seenParam = true;
                const std::string_view name = *child->attribute("NAME");
                const XmlElement* value = child->child("VALUE");
                ASSERT_NE(value, nullptr);
                if (name == "EndOfSequence") {
                    EXPECT_TRUE(value->text == "TRUE" || value->text == "FALSE") << value->text;
                    answer.endOfSequence = value->text == "TRUE";
                } else {
                    ASSERT_EQ(name, "EnumerationContext");
                    answer.context = value->text;
                }
            }
        }
        if (answer.error == 0 && (response.child("PARAMVALUE") != nullptr)) {
            // The context is empty exactly when the sequence ended.
            EXPECT_TRUE(answer.endOfSequence.has_value());
            EXPECT_EQ(answer.context.value_or("?").empty(), answer.endOfSequence.value_or(false)) << answer.body;
        }
    }

    static Answer pull(const std::string& method, const std::string& context, unsigned max,
                       const std::string& user = "user") {
        return call(method, param("EnumerationContext", context) + param("MaxObjectCount", std::to_string(max)), user);
    }

    // An element and everything in it, as one line.
    static std::string flat(const XmlElement* element) {
        std::string out = "<" + std::string(element->name);
        for (const auto& [name, value] : element->attributes) {
            out += " " + std::string(name) + "=" + std::string(value);
        }
        out += ">" + std::string(element->text);
        for (const auto& child : element->children) {
            out += flat(child);
        }
        return out + "</>";
    }

    // The INSTANCENAME inside an object of any answer form, flattened; for an
    // INSTANCE alone, its Name property.
    static std::string nameOf(const XmlElement* object) {
        if (object->name == "INSTANCENAME") {
            return flat(object);
        }
        if (object->name == "INSTANCE") {
            for (const auto& property : object->children) {
                if (*property->attribute("NAME") == "Name") {
                    return std::string(property->child("VALUE")->text);
                }
            }
            return "";
        }
        for (const auto& child : object->children) {
            if (std::string name = nameOf(child); !name.empty()) {
                return name;
            }
        }
        return "";
    }

    // The first string key in a flattened INSTANCENAME.
    static std::string keyOf(const std::string& name) {
        const auto at = name.find("<KEYVALUE VALUETYPE=string");
        if (at == std::string::npos) {
            return name;
        }
        const auto start = name.find('>', at) + 1;
        return name.substr(start, name.find('<', start) - start);
    }

    // Every object of an enumeration, pulled `max` at a time after an open of `openMax`.
    static std::vector<std::string> drain(const std::string& open, const std::string& params,
                                          const std::string& pullMethod, unsigned openMax, unsigned max,
                                          const std::string& user = "user", unsigned* pulls = nullptr) {
        Answer answer = call(open, params + param("MaxObjectCount", std::to_string(openMax)), user);
        EXPECT_EQ(answer.error, 0) << answer.description;
        std::vector<std::string> names;
        unsigned count = 0;
        for (;;) {
            EXPECT_LE(answer.objects.size(), count == 0 ? openMax : max);
            for (const XmlElement* object : answer.objects) {
                names.push_back(nameOf(object));
            }
            if (answer.error != 0 || answer.endOfSequence.value_or(true)) {
                break;
            }
            answer = pull(pullMethod, *answer.context, max, user);
            ++count;
        }
        if (pulls != nullptr) {
            *pulls = count;
        }
        return names;
    }

    // The names a classic operation answers, in order.
    static std::vector<std::string> classic(const std::string& method, const std::string& params,
                                            const std::string& user = "user") {
        Answer answer = call(method, params, user);
        std::vector<std::string> names;
        for (const XmlElement* object : answer.objects) {
            names.push_back(nameOf(object));
        }
        return names;
    }

};

constexpr int kInvalidEnumerationContext = 21;

TEST_F(PullOperationsTest, OpenWithMaxObjectCountZeroAnswersNoObjectsAndAnOpenContext) {
    Answer answer = call("OpenEnumerateInstances", className("Raw_Element") + param("MaxObjectCount", "0"));
    ASSERT_EQ(answer.error, 0) << answer.description;
    EXPECT_TRUE(answer.objects.empty());
    EXPECT_EQ(answer.endOfSequence, false);
    ASSERT_TRUE(answer.context);
    EXPECT_EQ(answer.context->size(), 32u);
    EXPECT_EQ(call("CloseEnumeration", param("EnumerationContext", *answer.context)).error, 0);
}

TEST_F(PullOperationsTest, PulledInstancesAreThoseOfEnumerateInstancesInOrder) {
    const auto expected = classic("EnumerateInstances", className("Raw_Element"), "many");
    ASSERT_GE(expected.size(), 5u);
    unsigned pulls = 0;
    EXPECT_EQ(drain("OpenEnumerateInstances", className("Raw_Element"), "PullInstancesWithPath", 1, 2, "many", &pulls),
              expected);
    EXPECT_GE(pulls, (expected.size() - 1 + 1) / 2);
}

TEST_F(PullOperationsTest, InstancesComeWithPathAndInstance) {
    Answer answer = call("OpenEnumerateInstances", className("Raw_Element") + param("MaxObjectCount", "1"));
    ASSERT_EQ(answer.objects.size(), 1u);
    const XmlElement* object = answer.objects.front();
    EXPECT_EQ(object->name, "VALUE.INSTANCEWITHPATH");
    ASSERT_NE(object->child("INSTANCEPATH"), nullptr);
    EXPECT_NE(object->child("INSTANCEPATH")->child("NAMESPACEPATH"), nullptr);
    EXPECT_NE(object->child("INSTANCE"), nullptr);
    call("CloseEnumeration", param("EnumerationContext", *answer.context));
}

TEST_F(PullOperationsTest, PulledPathsAreThoseOfEnumerateInstanceNames) {
    const auto expected = classic("EnumerateInstanceNames", className("Raw_Element"));
    ASSERT_FALSE(expected.empty());
    EXPECT_EQ(drain("OpenEnumerateInstancePaths", className("Raw_Element"), "PullInstancePaths", 0, 1), expected);
}

TEST_F(PullOperationsTest, AnOpenThatTakesEverythingEndsTheSequenceAndLeavesNoContext) {
    Answer answer = call("OpenEnumerateInstancePaths", className("Raw_Element") + param("MaxObjectCount", "100"));
    ASSERT_EQ(answer.error, 0);
    EXPECT_EQ(answer.endOfSequence, true);
    EXPECT_EQ(answer.context, std::optional<std::string>(""));
    EXPECT_EQ(answer.objects.size(), classic("EnumerateInstanceNames", className("Raw_Element")).size());
}

TEST_F(PullOperationsTest, AnEndedContextIsInvalidAfterwards) {
    Answer open = call("OpenEnumerateInstancePaths", className("Raw_Element") + param("MaxObjectCount", "0"));
    Answer all = pull("PullInstancePaths", *open.context, 1000);
    EXPECT_EQ(all.endOfSequence, true);
    EXPECT_EQ(pull("PullInstancePaths", *open.context, 1).error, kInvalidEnumerationContext);
}

TEST_F(PullOperationsTest, UnknownAndForeignContextsAreInvalid) {
    EXPECT_EQ(pull("PullInstancesWithPath", "00112233445566778899aabbccddeeff", 1).error, kInvalidEnumerationContext);
    Answer open = call("OpenEnumerateInstances", className("Raw_Element") + param("MaxObjectCount", "0"), "many");
    EXPECT_EQ(pull("PullInstancesWithPath", *open.context, 1, "user").error, kInvalidEnumerationContext);
    EXPECT_EQ(call("CloseEnumeration", param("EnumerationContext", *open.context), "user").error,
              kInvalidEnumerationContext);
    EXPECT_EQ(call("CloseEnumeration", param("EnumerationContext", *open.context), "many").error, 0);
}

TEST_F(PullOperationsTest, APullOfTheWrongKindIsRefusedAndKeepsTheContext) {
    Answer open = call("OpenEnumerateInstances", className("Raw_Element") + param("MaxObjectCount", "0"));
    Answer wrong = pull("PullInstancePaths", *open.context, 1);
    EXPECT_EQ(wrong.error, kInvalidEnumerationContext);
    EXPECT_EQ(pull("PullInstances", *open.context, 1).error, kInvalidEnumerationContext);
    Answer right = pull("PullInstancesWithPath", *open.context, 1);
    EXPECT_EQ(right.error, 0) << right.description;
    EXPECT_EQ(right.objects.size(), 1u);
    call("CloseEnumeration", param("EnumerationContext", *open.context));
}

TEST_F(PullOperationsTest, CloseEnumerationFreesTheContext) {
    Answer open = call("OpenEnumerateInstances", className("Raw_Element") + param("MaxObjectCount", "0"));
    Answer closed = call("CloseEnumeration", param("EnumerationContext", *open.context));
    EXPECT_EQ(closed.error, 0);
    EXPECT_TRUE(closed.objects.empty());
    EXPECT_EQ(pull("PullInstancesWithPath", *open.context, 1).error, kInvalidEnumerationContext);
    EXPECT_EQ(call("CloseEnumeration", param("EnumerationContext", *open.context)).error, kInvalidEnumerationContext);
}

TEST_F(PullOperationsTest, EnumerationCountIsWhatIsLeftOnceTheProviderEnded) {
    Answer open = call("OpenEnumerateInstancePaths", className("Raw_Element") + param("MaxObjectCount", "1"));
    const std::size_t total = classic("EnumerateInstanceNames", className("Raw_Element")).size();
    Answer count;
    for (int i = 0; i < 100; ++i) {  // the provider runs on the enumeration's own thread
        count = call("EnumerationCount", param("EnumerationContext", *open.context));
        if (!count.objects.empty()) {
            break;
        }
        std::this_thread::sleep_for(std::chrono::milliseconds(20));
    }
    ASSERT_EQ(count.error, 0);
    ASSERT_EQ(count.objects.size(), 1u);
    EXPECT_EQ(count.objects.front()->name, "VALUE");
    EXPECT_EQ(count.objects.front()->text, std::to_string(total - 1));
    call("CloseEnumeration", param("EnumerationContext", *open.context));
}

TEST_F(PullOperationsTest, ContinueOnErrorIsNotSupported) {
    Answer answer = call("OpenEnumerateInstances", className("Raw_Element") + param("ContinueOnError", "TRUE"));
    EXPECT_EQ(answer.error, 26);
    EXPECT_EQ(call("OpenEnumerateInstances", className("Raw_Element") + param("ContinueOnError", "FALSE") +
                                                 param("MaxObjectCount", "100"))
                  .error,
              0);
}

TEST_F(PullOperationsTest, OperationTimeoutOfZeroOrAboveTheMaximumIsRefused) {
    EXPECT_EQ(call("OpenEnumerateInstances", className("Raw_Element") + param("OperationTimeout", "0")).error, 22);
    EXPECT_EQ(call("OpenEnumerateInstances", className("Raw_Element") + param("OperationTimeout", "601")).error, 22);
    EXPECT_EQ(call("OpenEnumerateInstances", className("Raw_Element") + param("OperationTimeout", "ten")).error, 4);
    Answer ok = call("OpenEnumerateInstances", className("Raw_Element") + param("OperationTimeout", "600") +
                                                   param("MaxObjectCount", "100"));
    EXPECT_EQ(ok.error, 0);
}

TEST_F(PullOperationsTest, AContextExpiresAfterItsOperationTimeout) {
    Answer open = call("OpenEnumerateInstances",
                       className("Raw_Element") + param("OperationTimeout", "1") + param("MaxObjectCount", "0"));
    ASSERT_EQ(open.error, 0);
    std::this_thread::sleep_for(std::chrono::milliseconds(2600));
    EXPECT_EQ(pull("PullInstancesWithPath", *open.context, 1).error, kInvalidEnumerationContext);
}

TEST_F(PullOperationsTest, PullsKeepAContextAlive) {
    Answer open = call("OpenEnumerateInstances",
                       className("Raw_Element") + param("OperationTimeout", "2") + param("MaxObjectCount", "0"), "many");
    for (int i = 0; i < 3; ++i) {
        std::this_thread::sleep_for(std::chrono::milliseconds(1000));
        Answer next = pull("PullInstancesWithPath", *open.context, 0, "many");  // 0: only restarts the timer
        ASSERT_EQ(next.error, 0) << next.description;
        EXPECT_TRUE(next.objects.empty());
    }
    call("CloseEnumeration", param("EnumerationContext", *open.context), "many");
}

TEST_F(PullOperationsTest, AClientMayHoldABoundedNumberOfOpenContexts) {
    std::vector<std::string> contexts;
    Answer answer;
    for (int i = 0; i < 40; ++i) {
        answer = call("OpenEnumerateInstancePaths", className("Raw_Element") + param("MaxObjectCount", "0"), "many");
        if (answer.error != 0) {
            break;
        }
        contexts.push_back(*answer.context);
    }
    EXPECT_EQ(answer.error, 27);  // CIM_ERR_SERVER_LIMITS_EXCEEDED
    EXPECT_EQ(contexts.size(), 32u);
    // Another client is not held back by this one.
    EXPECT_EQ(call("OpenEnumerateInstancePaths", className("Raw_Element") + param("MaxObjectCount", "100")).error, 0);
    for (const std::string& context : contexts) {
        EXPECT_EQ(call("CloseEnumeration", param("EnumerationContext", context), "many").error, 0);
    }
    EXPECT_EQ(call("OpenEnumerateInstancePaths", className("Raw_Element") + param("MaxObjectCount", "100"), "many").error,
              0);
}

TEST_F(PullOperationsTest, AProviderErrorIsTheAnswerOfTheOpen) {
    Answer answer = call("OpenEnumerateInstances", className("Raw_Element") + param("MaxObjectCount", "1"), "error");
    EXPECT_EQ(answer.error, 2);
    EXPECT_EQ(answer.description, "denied by raw provider");
}

TEST_F(PullOperationsTest, FilterQueryKeepsTheInstancesItSelects) {
    const auto all = classic("EnumerateInstances", className("Raw_Element"), "many");
    ASSERT_GE(all.size(), 3u);
    const std::string wanted = all[2];
    const std::string key = keyOf(wanted);
    const std::string filter = param("FilterQueryLanguage", "WQL") +
                               param("FilterQuery", "SELECT * FROM Raw_Element WHERE Name = '" + key + "'");
    EXPECT_EQ(drain("OpenEnumerateInstances", className("Raw_Element") + filter, "PullInstancesWithPath", 0, 10, "many"),
              std::vector<std::string>{wanted});
    EXPECT_EQ(drain("OpenEnumerateInstancePaths", className("Raw_Element") + filter, "PullInstancePaths", 0, 10, "many"),
              std::vector<std::string>{wanted});
}

TEST_F(PullOperationsTest, FilterQueryLanguageAndQueryAreChecked) {
    const std::string cls = className("Raw_Element");
    EXPECT_EQ(call("OpenEnumerateInstances", cls + param("FilterQueryLanguage", "DMTF:FQL") +
                                                 param("FilterQuery", "Name = 'x'"))
                  .error,
              14);  // CIM_ERR_QUERY_LANGUAGE_NOT_SUPPORTED
    EXPECT_EQ(call("OpenEnumerateInstances", cls + param("FilterQueryLanguage", "WQL") +
                                                 param("FilterQuery", "SELECT FROM WHERE"))
                  .error,
              15);  // CIM_ERR_INVALID_QUERY
    EXPECT_EQ(call("OpenEnumerateInstances", cls + param("FilterQuery", "SELECT * FROM Raw_Element")).error, 4);
}

TEST_F(PullOperationsTest, OpenQueryInstancesAnswersTheSelectedInstancesWithTheirSelectedProperties) {
    const auto all = classic("EnumerateInstances", className("Raw_Element"), "many");
    const std::string query =
        "SELECT Name FROM Raw_Element WHERE Name = '" + keyOf(all[1]) + "' OR Name = '" + keyOf(all[3]) + "'";
    Answer answer = call("OpenQueryInstances", param("FilterQueryLanguage", "WQL") + param("FilterQuery", query) +
                                                   param("MaxObjectCount", "1"),
                         "many");
    ASSERT_EQ(answer.error, 0) << answer.description;
    ASSERT_EQ(answer.objects.size(), 1u);
    EXPECT_EQ(answer.objects.front()->name, "INSTANCE");
    EXPECT_EQ(answer.objects.front()->children.size(), 1u);  // only Name
    std::vector<std::string> names{nameOf(answer.objects.front())};
    Answer rest = pull("PullInstances", *answer.context, 10, "many");
    ASSERT_EQ(rest.error, 0);
    for (const XmlElement* object : rest.objects) {
        names.push_back(nameOf(object));
    }
    EXPECT_EQ(rest.endOfSequence, true);
    EXPECT_EQ(names, (std::vector<std::string>{keyOf(all[1]), keyOf(all[3])}));
}

TEST_F(PullOperationsTest, AssociationOpensAnswerWhatTheClassicOperationsAnswer) {
    const std::string source = elementName("Raw_Element-0");
    const std::string object = elementName("Raw_Element-0", "ObjectName");
    const auto referenceNames = classic("ReferenceNames", object);
    ASSERT_FALSE(referenceNames.empty());
    EXPECT_EQ(drain("OpenReferenceInstancePaths", source, "PullInstancePaths", 0, 1), referenceNames);
    EXPECT_EQ(drain("OpenReferenceInstances", source, "PullInstancesWithPath", 1, 1), classic("References", object));
    const auto associatorNames = classic("AssociatorNames", object);
    ASSERT_FALSE(associatorNames.empty());
    EXPECT_EQ(drain("OpenAssociatorInstancePaths", source, "PullInstancePaths", 0, 1), associatorNames);
    EXPECT_EQ(drain("OpenAssociatorInstances", source, "PullInstancesWithPath", 0, 2), classic("Associators", object));
}

TEST_F(PullOperationsTest, PullNeedsItsParameters) {
    EXPECT_EQ(call("PullInstancesWithPath", param("MaxObjectCount", "1")).error, 4);
    EXPECT_EQ(call("PullInstancesWithPath", param("EnumerationContext", "x")).error, 4);
    EXPECT_EQ(call("EnumerationCount", "").error, 4);
}

}  // namespace
}  // namespace orv::e2e

namespace orv::e2e {
namespace {

// SIGTERM with enumerations open: they are closed, their producers joined, and
// the host exits 0 as always.
TEST(PullOperationsLifecycle, TheHostStopsCleanlyWithEnumerationsOpen) {
    HostProcess host(rawProviderArgs());
    ASSERT_TRUE(host.waitReady()) << host.output();
    httplib::Client client("127.0.0.1", host.port());
    for (int i = 0; i < 3; ++i) {
        const std::string body =
            "<?xml version=\"1.0\" encoding=\"utf-8\"?><CIM CIMVERSION=\"2.0\" DTDVERSION=\"2.0\">"
            "<MESSAGE ID=\"5\" PROTOCOLVERSION=\"1.0\"><SIMPLEREQ><IMETHODCALL NAME=\"OpenEnumerateInstances\">"
            "<LOCALNAMESPACEPATH><NAMESPACE NAME=\"root\"/><NAMESPACE NAME=\"cimv2\"/></LOCALNAMESPACEPATH>"
            "<IPARAMVALUE NAME=\"ClassName\"><CLASSNAME NAME=\"Raw_Element\"/></IPARAMVALUE></IMETHODCALL>"
            "</SIMPLEREQ></MESSAGE></CIM>";
        auto result = client.Post(
            "/cimom",
            {{"CIMOperation", "MethodCall"}, {"CIMMethod", "OpenEnumerateInstances"}, {"CIMObject", "root%2Fcimv2"}},
            body, "application/xml; charset=\"utf-8\"");
        ASSERT_TRUE(result);
        EXPECT_NE(result->body.find("<PARAMVALUE NAME=\"EndOfSequence\"><VALUE>FALSE</VALUE>"), std::string::npos);
    }
    EXPECT_EQ(host.stop(SIGTERM), 0) << host.output();
}

}  // namespace
}  // namespace orv::e2e
