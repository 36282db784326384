// The fixture reader, one section per function. Each throws FixtureError
// naming the JSON path of the first problem.
#pragma once

#include <map>
#include <string>
#include <unordered_map>
#include <vector>

#include "HostModel.h"
#include "JsonFields.h"

namespace orv::platform::sim {

// The NICs in fixture order; index gets each name's position.
std::vector<NicModel> readNics(const JsonNode& node, std::unordered_map<std::string, size_t>& index);
std::map<std::string, StackModel> readTcpipStacks(const JsonNode& node);
CpuModel readCpu(const JsonNode& node);
VersionModel readVersion(const JsonNode& node, std::map<TmkuserStatus_Code, StatusText>& codes);
// The "errno" and "message" of a version-service failure code.
StatusText readStatusText(JsonObject& object);
std::vector<HealthElementModel> readHealth(const JsonNode& node);
SystemIdentity readSystemIdentity(const JsonNode& node);
FaultTable readFaults(const JsonNode& node, std::map<TmkuserStatus_Code, StatusText>& codes);

// Copies text into a fixed field, NUL-padded (the caller checked the length).
template <size_t N>
void copyText(char (&field)[N], const std::string& text)
{
    std::fill(field, field + N, '\0');
    std::copy(text.begin(), text.end(), field);
}

} // namespace orv::platform::sim
