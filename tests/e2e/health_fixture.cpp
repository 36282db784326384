#include "health_fixture.hpp"

#include <nlohmann/json.hpp>
#include <unistd.h>

#include <cstdio>
#include <filesystem>
#include <fstream>
#include <map>
#include <stdexcept>

#include "broker_answers.hpp"
#include "host_process.hpp"

namespace orv::e2e {

const std::array<const char*, 12> kWatchedClasses = {
    "CIM_Sensor",        "CIM_PhysicalMemory", "CIM_Processor",        "CIM_PowerSupply",
    "Orvane_PortController", "Orvane_Controller", "Orvane_Battery",   "Orvane_StorageVolume",
    "Orvane_StorageExtent",  "Orvane_DiskDrive",  "Orvane_SASSATAPort", "Orvane_StoragePool"};

namespace {

using Json = nlohmann::json;

// The fully qualified name of the shipped example host, the SystemName of its devices.
constexpr const char* kSystemName = "orvhost01.lab.example.com";

// The element's key bindings, by name, as the schema gives its class: a
// device is named within its system, a physical element by its tag, a
// storage pool by its InstanceID.
std::map<std::string, std::string> elementKeys(const std::string& watchedClass, Element element) {
    const std::string id = watchedClass + (element == Element::First ? "-first" : "-second");
    if (watchedClass == "Orvane_StoragePool") {
        return {{"InstanceID", id}};
    }
    if (watchedClass == "CIM_PhysicalMemory") {
        return {{"CreationClassName", watchedClass}, {"Tag", id}};
    }
    return {{"CreationClassName", watchedClass},
            {"DeviceID", id},
            {"SystemCreationClassName", "OMC_UnitaryComputerSystem"},
            {"SystemName", kSystemName}};
}

Json elementEntry(const std::string& watchedClass, Element element, int healthState) {
    Json keys = Json::object();
    for (const auto& [name, value] : elementKeys(watchedClass, element)) {
        keys[name] = value;
    }
    return {{"watchedClass", watchedClass}, {"keys", keys}, {"healthState", healthState}};
}

}  // namespace

std::string elementPath(const std::string& watchedClass, Element element) {
    std::string keys;
    for (const auto& [name, value] : elementKeys(watchedClass, element)) {
        keys += (keys.empty() ? "" : ",") + name + "=\"" + value + "\"";
    }
    return canonicalPath("root/cimv2:" + watchedClass + "." + keys);
}

HealthFixture::HealthFixture(const std::string& name)
    : folder_((std::filesystem::temp_directory_path() / ("orv-e2e-" + name + "-" + std::to_string(getpid()))).string()),
      path_(folder_ + "/host.json") {
    std::filesystem::remove_all(folder_);
    std::filesystem::create_directories(folder_);
}

HealthFixture::~HealthFixture() {
    std::error_code ignored;
    std::filesystem::remove_all(folder_, ignored);
}

void HealthFixture::write(int first, int second, const std::string& vif0Address) const {
    Json host = Json::parse(std::ifstream(sourceDir() + "/platform/sim/examples/host.json"));
    Json health = Json::array();
    for (const char* watchedClass : kWatchedClasses) {
        health.push_back(elementEntry(watchedClass, Element::First, first));
        health.push_back(elementEntry(watchedClass, Element::Second, second));
    }
    host["health"] = health;
    Json& vif0 = host["tcpipStacks"]["defaultTcpipStack"]["vnics"][0];
    if (vif0["name"] != "vif0") {
        throw std::runtime_error("the shipped host's first vNIC is no longer vif0");
    }
    vif0["ipv4"]["address"] = vif0Address;
    const std::string next = path_ + ".next";
    std::ofstream(next) << host.dump(1) << "\n";
    if (std::rename(next.c_str(), path_.c_str()) != 0) {
        throw std::runtime_error("cannot replace " + path_);
    }
}

}  // namespace orv::e2e
