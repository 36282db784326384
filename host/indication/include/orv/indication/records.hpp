// The host's indication objects (filters, listener destinations, subscriptions)
// as plain values, and their stored text form.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace orv::indication {

struct FilterRecord {
    std::string name;
    std::string creationClassName = "CIM_IndicationFilter";
    std::string systemCreationClassName;
    std::string systemName;
    std::string query;
    std::string queryLanguage = "WQL";
    std::string sourceNamespace = "root/cimv2";
};

// CIM_ListenerDestinationCIMXML or CIM_IndicationHandlerCIMXML.
struct DestinationRecord {
    std::string name;
    std::string creationClassName = "CIM_ListenerDestinationCIMXML";
    std::string systemCreationClassName;
    std::string systemName;
    std::string destination;            // the listener's URL
    std::uint16_t persistenceType = 2;  // 2 Permanent, 3 Transient
    std::uint16_t protocol = 2;         // 2 CIM-XML
};

struct SubscriptionRecord {
    std::string filterName;
    std::string handlerName;
    std::string handlerClass = "CIM_ListenerDestinationCIMXML";
    std::uint16_t state = 2;               // SubscriptionState: 2 Enabled, 4 Disabled
    std::uint16_t onFatalErrorPolicy = 2;  // 2 Ignore, 3 Disable, 4 Remove
    std::string startTime;                 // SubscriptionStartTime, CIM date-time text

    // How logs, counts and the export client name the subscription.
    std::string id() const { return filterName + " -> " + handlerName; }
};

// Text form: a kind line ("filter", "destination", "subscription") followed by
// "Property=value" lines, values with '\' and line ends escaped.
std::string storedText(const FilterRecord& filter);
std::string storedText(const DestinationRecord& destination);
std::string storedText(const SubscriptionRecord& subscription);

// The store ids of the records (kind and names, names without regard to case).
std::string storeId(const FilterRecord& filter);
std::string storeId(const DestinationRecord& destination);
std::string storeId(const SubscriptionRecord& subscription);

// One stored record read back; std::nullopt when the text is not a record of that
// kind or misses a required property (`error` says which).
struct ParsedRecord {
    std::optional<FilterRecord> filter;
    std::optional<DestinationRecord> destination;
    std::optional<SubscriptionRecord> subscription;
};
ParsedRecord parseStored(std::string_view text, std::string* error);

}  // namespace orv::indication
