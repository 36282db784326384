#include "latched_health_client.hpp"

#include <regex>
#include <sstream>

#include "broker_answers.hpp"
#include "two_broker_fixture.hpp"

namespace orv::e2e {

namespace {

std::string recordPath(unsigned eventId) {
    return "Orvane_LatchedHealthState.EventId=\"" + std::to_string(eventId) + "\"";
}

const std::string* propertyOf(const WbemcliObject& object, const std::string& name) {
    for (const auto& [property, value] : object.properties) {
        if (property == name) {
            return &value;
        }
    }
    return nullptr;
}

std::string unquoted(const std::string* value) {
    if (value == nullptr) {
        return "";
    }
    if (value->size() >= 2 && value->front() == '"' && value->back() == '"') {
        return value->substr(1, value->size() - 2);
    }
    return *value;
}

int numberOf(const std::string* value) {
    const std::string text = unquoted(value);
    return text.empty() ? -1 : std::stoi(text);
}

}  // namespace

std::ostream& operator<<(std::ostream& os, const LatchedRecord& record) {
    return os << "{" << record.eventId << ", " << record.className << ", " << record.nameSpace << ", "
              << record.healthState << ", " << record.timestamp << "}";
}

std::vector<LatchedRecord> recordsIn(const std::string& answer) {
    std::vector<LatchedRecord> records;
    for (const WbemcliObject& object : parseWbemcliAnswer(answer)) {
        LatchedRecord record;
        record.eventId = static_cast<unsigned>(numberOf(propertyOf(object, "EventId")));
        record.className = unquoted(propertyOf(object, "LatchedClassName"));
        record.nameSpace = unquoted(propertyOf(object, "LatchedNamespace"));
        record.healthState = numberOf(propertyOf(object, "HealthState"));
        record.timestamp = unquoted(propertyOf(object, "Timestamp"));
        records.push_back(record);
    }
    return records;
}

std::vector<LatchedRecord> latchedRecords(int port) {
    return recordsIn(wbemcli(port, "ei -nl", "Orvane_LatchedHealthState"));
}

std::optional<int> rollUpHealthState(int port) {
    const std::vector<WbemcliObject> objects =
        parseWbemcliAnswer(wbemcli(port, "ei -nl", "Orvane_RollupHealthState"));
    if (objects.size() != 1 || propertyOf(objects[0], "HealthState") == nullptr) {
        return std::nullopt;
    }
    return numberOf(propertyOf(objects[0], "HealthState"));
}

std::string getLatched(int port, unsigned eventId) { return wbemcli(port, "gi -nl", recordPath(eventId)); }

std::vector<std::string> associatedElements(int port, unsigned eventId) {
    static const std::regex kHostedPath(R"(^[^/ ]*/([A-Za-z0-9_/]+:.*)$)");
    const std::string answer = wbemcli(port, "ain -ac Orvane_LatchedHealthAssociation", recordPath(eventId));
    std::vector<std::string> paths;
    std::istringstream lines(answer);
    for (std::string line; std::getline(lines, line);) {
        std::smatch match;
        if (std::regex_match(line, match, kHostedPath)) {
            paths.push_back(canonicalPath(match[1]));
        } else if (!line.empty() && line != "*") {
            paths.push_back(line);
        }
    }
    return paths;
}

}  // namespace orv::e2e
