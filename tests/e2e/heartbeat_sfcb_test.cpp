// The heartbeat provider under the stock sfcb: a private sfcbd serving the
// project's library with ORV_ROOT in its environment (sfcb refuses the
// heartbeatInterval key in its own sfcb.cfg, so the provider's file lives under
// ORV_ROOT), a filter and a destination made with wbemcli in root/interop, the
// subscription with a CIM-XML CreateInstance request (wbemcli cannot write the
// reference keys of a subscription in a form sfcb takes), and orv-cimlistener
// receiving the heartbeats. Label slow: it waits one 30 s interval.
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <chrono>
#include <filesystem>
#include <fstream>

#include "heartbeat_lines.hpp"
#include "host_process.hpp"
#include "listener_process.hpp"
#include "sfcb_broker.hpp"
#include "two_broker_fixture.hpp"

namespace orv::e2e {
namespace {

namespace fs = std::filesystem;
using listener::test::ListenerProcess;
using ::testing::HasSubstr;

const std::string kKeys = "SystemCreationClassName=\"CIM_ComputerSystem\",SystemName=\"localhost\"";

// The filter or destination `className` named "heartbeat", as a wbemcli object and its properties.
std::string interopObject(const std::string& className) {
    return className + "." + kKeys + ",CreationClassName=\"" + className + "\",Name=\"heartbeat\"";
}

std::string keyBinding(const std::string& name, const std::string& value) {
    return "<KEYBINDING NAME=\"" + name + "\"><KEYVALUE VALUETYPE=\"string\">" + value + "</KEYVALUE></KEYBINDING>";
}

std::string reference(const std::string& property, const std::string& referenceClass, const std::string& className) {
    return "<PROPERTY.REFERENCE NAME=\"" + property + "\" REFERENCECLASS=\"" + referenceClass +
           "\"><VALUE.REFERENCE><INSTANCENAME CLASSNAME=\"" + className + "\">" +
           keyBinding("CreationClassName", className) + keyBinding("Name", "heartbeat") +
           keyBinding("SystemCreationClassName", "CIM_ComputerSystem") + keyBinding("SystemName", "localhost") +
           "</INSTANCENAME></VALUE.REFERENCE></PROPERTY.REFERENCE>";
}

// CreateInstance of the subscription of filter and destination "heartbeat", posted with curl.
std::string createSubscription(int port, const fs::path& body) {
    std::ofstream(body) << "<?xml version=\"1.0\" encoding=\"utf-8\"?><CIM CIMVERSION=\"2.0\" DTDVERSION=\"2.0\">"
                           "<MESSAGE ID=\"1\" PROTOCOLVERSION=\"1.0\"><SIMPLEREQ><IMETHODCALL NAME=\"CreateInstance\">"
                           "<LOCALNAMESPACEPATH><NAMESPACE NAME=\"root\"/><NAMESPACE NAME=\"interop\"/>"
                           "</LOCALNAMESPACEPATH><IPARAMVALUE NAME=\"NewInstance\">"
                           "<INSTANCE CLASSNAME=\"CIM_IndicationSubscription\">"
                        << reference("Filter", "CIM_IndicationFilter", "CIM_IndicationFilter")
                        << reference("Handler", "CIM_ListenerDestination", "CIM_ListenerDestinationCIMXML")
                        << "</INSTANCE></IPARAMVALUE></IMETHODCALL></SIMPLEREQ></MESSAGE></CIM>";
    return runCommand("curl -s -m 30 -H 'Content-Type: application/xml; charset=\"utf-8\"' "
                      "-H 'CIMOperation: MethodCall' -H 'CIMMethod: CreateInstance' -H 'CIMObject: root%2Finterop' "
                      "--data-binary @" + body.string() + " http://127.0.0.1:" + std::to_string(port) + "/cimom");
}

TEST(HeartbeatSfcbTest, SfcbDeliversIncreasingStampsOneIntervalApartAndStaysUp) {
    const fs::path base = fs::temp_directory_path() / ("i14e-heartbeat-sfcb-" + std::to_string(getpid()));
    fs::remove_all(base);
    fs::create_directories(base / "root/etc/sfcb");
    std::ofstream(base / "root/etc/sfcb/sfcb.cfg") << "heartbeatInterval: 30\n";
    SfcbBroker sfcb = SfcbBroker::start((base / "sfcb").string(), "", (base / "root").string());
    if (sfcbMissing(sfcb)) {
        GTEST_SKIP() << sfcb.reason();
    }
    ListenerProcess listener({"--port", "0"});
    const int listenerPort = listener.waitListening();
    ASSERT_GT(listenerPort, 0) << listener.errorText();

    const std::string filter =
        wbemcli(sfcb.port(), "ci", interopObject("CIM_IndicationFilter") + "' '" + kKeys +
                    ",CreationClassName=\"CIM_IndicationFilter\",Name=\"heartbeat\","
                    "Query=\"SELECT * FROM Orvane_CIMHeartbeat\",QueryLanguage=\"WQL\",SourceNamespace=\"root/cimv2\"",
                "root/interop");
    ASSERT_THAT(filter, HasSubstr("CIM_IndicationFilter.")) << filter;
    const std::string destination =
        wbemcli(sfcb.port(), "ci", interopObject("CIM_ListenerDestinationCIMXML") + "' '" + kKeys +
                    ",CreationClassName=\"CIM_ListenerDestinationCIMXML\",Name=\"heartbeat\","
                    "Destination=\"http://127.0.0.1:" + std::to_string(listenerPort) + "\"",
                "root/interop");
    ASSERT_THAT(destination, HasSubstr("CIM_ListenerDestinationCIMXML.")) << destination;
    const std::string made = createSubscription(sfcb.port(), base / "subscription.xml");
    ASSERT_THAT(made, HasSubstr("<IMETHODRESPONSE NAME=\"CreateInstance\">\n<IRETURNVALUE>")) << made;
    const std::time_t subscribed = std::time(nullptr);

    const std::vector<std::string> lines = listener.waitLines(2, std::chrono::seconds(45));
    ASSERT_GE(lines.size(), 2U) << listener.outputText() << sfcb.syslog();
    expectFirstTwoHeartbeats(lines, subscribed);
    EXPECT_EQ(sfcb.healthProblem(), "");
    sfcb.stop();
    fs::remove_all(base);
}

}  // namespace
}  // namespace orv::e2e
