#include "sfcb_subscription.hpp"

#include <fstream>

#include "host_process.hpp"
#include "two_broker_fixture.hpp"

namespace orv::e2e {

namespace {

const std::string kSystemKeys = "SystemCreationClassName=\"CIM_ComputerSystem\",SystemName=\"localhost\"";

// The keys of the filter or destination `className` named `name`.
std::string interopKeys(const std::string& className, const std::string& name) {
    return kSystemKeys + ",CreationClassName=\"" + className + "\",Name=\"" + name + "\"";
}

// wbemcli ci of the interop object `className` named `name` with `properties`
// besides its keys; empty when the instance was made, else wbemcli's answer.
std::string createInteropObject(int port, const std::string& className, const std::string& name,
                                const std::string& properties) {
    const std::string keys = interopKeys(className, name);
    const std::string made = wbemcli(port, "ci", className + "." + keys + "' '" + keys + "," + properties, "root/interop");
    return made.find(className + ".") != std::string::npos ? "" : made;
}

std::string keyBinding(const std::string& name, const std::string& value) {
    return "<KEYBINDING NAME=\"" + name + "\"><KEYVALUE VALUETYPE=\"string\">" + value + "</KEYVALUE></KEYBINDING>";
}

std::string reference(const std::string& property, const std::string& referenceClass, const std::string& className,
                      const std::string& name) {
    return "<PROPERTY.REFERENCE NAME=\"" + property + "\" REFERENCECLASS=\"" + referenceClass +
           "\"><VALUE.REFERENCE><INSTANCENAME CLASSNAME=\"" + className + "\">" +
           keyBinding("CreationClassName", className) + keyBinding("Name", name) +
           keyBinding("SystemCreationClassName", "CIM_ComputerSystem") + keyBinding("SystemName", "localhost") +
           "</INSTANCENAME></VALUE.REFERENCE></PROPERTY.REFERENCE>";
}

// CreateInstance of the subscription of filter and destination `name`, posted with curl.
std::string createSubscription(int port, const std::string& name, const std::string& bodyFile) {
    std::ofstream(bodyFile) << "<?xml version=\"1.0\" encoding=\"utf-8\"?><CIM CIMVERSION=\"2.0\" DTDVERSION=\"2.0\">"
                               "<MESSAGE ID=\"1\" PROTOCOLVERSION=\"1.0\"><SIMPLEREQ><IMETHODCALL NAME=\"CreateInstance\">"
                               "<LOCALNAMESPACEPATH><NAMESPACE NAME=\"root\"/><NAMESPACE NAME=\"interop\"/>"
                               "</LOCALNAMESPACEPATH><IPARAMVALUE NAME=\"NewInstance\">"
                               "<INSTANCE CLASSNAME=\"CIM_IndicationSubscription\">"
                            << reference("Filter", "CIM_IndicationFilter", "CIM_IndicationFilter", name)
                            << reference("Handler", "CIM_ListenerDestination", "CIM_ListenerDestinationCIMXML", name)
                            << "</INSTANCE></IPARAMVALUE></IMETHODCALL></SIMPLEREQ></MESSAGE></CIM>";
    const std::string answer =
        runCommand("curl -s -m 30 -H 'Content-Type: application/xml; charset=\"utf-8\"' "
                   "-H 'CIMOperation: MethodCall' -H 'CIMMethod: CreateInstance' -H 'CIMObject: root%2Finterop' "
                   "--data-binary @" + bodyFile + " http://127.0.0.1:" + std::to_string(port) + "/cimom");
    return answer.find("<IMETHODRESPONSE NAME=\"CreateInstance\">\n<IRETURNVALUE>") != std::string::npos ? "" : answer;
}

}  // namespace

std::string subscribeOnSfcb(int port, const std::string& name, const std::string& query,
                            const std::string& destination, const std::string& scratchDir) {
    std::string failed = createInteropObject(port, "CIM_IndicationFilter", name,
                                             "Query=\"" + query + "\",QueryLanguage=\"WQL\",SourceNamespace=\"root/cimv2\"");
    if (failed.empty()) {
        failed = createInteropObject(port, "CIM_ListenerDestinationCIMXML", name, "Destination=\"" + destination + "\"");
    }
    if (failed.empty()) {
        failed = createSubscription(port, name, scratchDir + "/" + name + "-subscription.xml");
    }
    return failed;
}

std::string subscribeLocalListenerOnSfcb(int port, int listenerPort, const std::string& name,
                                         const std::string& query, const std::string& scratchDir) {
    if (listenerPort <= 0) {
        return "the listener did not start";
    }
    return subscribeOnSfcb(port, name, query, "http://127.0.0.1:" + std::to_string(listenerPort), scratchDir);
}

}  // namespace orv::e2e
