// ExecQuery requests sent as raw CIM-XML to a broker, and their answers read back
// as text that does not depend on the broker's way of writing CIM-XML.
#pragma once

#include <string>

namespace orv::e2e {

// The request body of an ExecQuery of root/cimv2 (the query is escaped here).
std::string execQueryBody(const std::string& language, const std::string& query);

// The answer of the broker on `port` to an ExecQuery: "ERROR <code>" for an error,
// else one line per returned instance, sorted:
//   Class key=value,key=value | property=value;property=value
// keys and properties in name order, array values joined with ','; NULL properties
// are left out (sfcb sends every property of the class, orv-cimhost those the
// provider set, a documented broker convention). A reply that is
// not an ExecQuery answer comes back as "BAD: " and what arrived.
std::string execQueryAnswer(int port, const std::string& language, const std::string& query);

}  // namespace orv::e2e
