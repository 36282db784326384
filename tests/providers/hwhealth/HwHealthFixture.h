// The companion library (liborvhwhealth.so) beside the project's library in
// the broker core, on a simulated host written by the test: the registrations
// and classes of both, and the test-only Orvane_NumberedSensor.
#pragma once

#include <gtest/gtest.h>

#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "orv/providertest/ProviderCore.h"
#include "orv/providertest/ReturnedValues.h"
#include "orv/providertest/SimHost.h"

namespace hwhealth_test {

using Json = nlohmann::ordered_json;
using orv::providertest::NamedValue;

inline constexpr const char* kSystemClass = "OMC_UnitaryComputerSystem";

// One element of the "health" section.
Json element(const std::string& watchedClass, const std::string& className, const Json& keys,
             std::optional<int> healthState = std::nullopt);

class HwHealthTest : public ::testing::Test {
protected:
    // Writes a host with these health elements, these sections besides, and these fault rules.
    void serve(const std::vector<Json>& elements, const Json& sections = Json::object(),
               const Json& faults = Json::array());

    // The broker core, made on first use (after the first serve()).
    orv::providertest::ProviderCore& provider();

    // Object paths of the reply, as "namespace:Class.key=value,...".
    static std::vector<std::string> pathsOf(const orv::host::Reply& reply);
    // The paths of the returned instances, same form.
    static std::vector<std::string> instancePathsOf(const orv::host::Reply& reply);

private:
    orv::providertest::SimHost host_;  // before the core: it selects the platform
    std::unique_ptr<orv::providertest::ProviderCore> provider_;
};

// "namespace:Class.key=value,..." of a path.
std::string pathText(const CMPIObjectPath* path);

}  // namespace hwhealth_test
