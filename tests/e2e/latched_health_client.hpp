// What wbemcli reads of the latched health classes from a broker: the latched
// records in the order served, the roll-up, one record by its event number,
// and the element a record's association leads to.
#pragma once

#include <optional>
#include <ostream>
#include <string>
#include <vector>

namespace orv::e2e {

struct LatchedRecord {
    unsigned eventId = 0;
    std::string className;  // LatchedClassName
    std::string nameSpace;  // LatchedNamespace
    int healthState = -1;
    std::string timestamp;  // the CIM datetime as served

    bool operator==(const LatchedRecord& other) const {
        return eventId == other.eventId && className == other.className && nameSpace == other.nameSpace &&
               healthState == other.healthState && timestamp == other.timestamp;
    }
};
std::ostream& operator<<(std::ostream& os, const LatchedRecord& record);

// The latched records of a wbemcli answer in "-nl" form, in the order printed.
std::vector<LatchedRecord> recordsIn(const std::string& answer);
// EnumerateInstances of Orvane_LatchedHealthState on the broker at `port`.
std::vector<LatchedRecord> latchedRecords(int port);
// The HealthState of the one Orvane_RollupHealthState instance; nullopt when
// none was served.
std::optional<int> rollUpHealthState(int port);
// wbemcli's answer to GetInstance of the latched record `eventId`, in "-nl" form.
std::string getLatched(int port, unsigned eventId);
// The paths AssociatorNames through Orvane_LatchedHealthAssociation gives for
// the record `eventId`, without their host and with their keys sorted
// (canonicalPath); wbemcli's error text instead when it reports one.
std::vector<std::string> associatedElements(int port, unsigned eventId);

}  // namespace orv::e2e
