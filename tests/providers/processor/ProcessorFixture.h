// The processor provider through the broker core on a simulated host.
#pragma once

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "ProcessorHost.h"
#include "orv/providertest/ProviderCore.h"
#include "orv/providertest/ReturnedValues.h"
#include "orv/providertest/SimHost.h"

namespace processortest {

using orv::providertest::NamedValue;
using orv::providertest::StringKeys;

inline constexpr const char* kProcessorClass = "Orvane_Processor";

// The five keys of a package's path, in order.
StringKeys processorKeys(const std::string& deviceId);
std::vector<NamedValue> processorKeyValues(const std::string& deviceId);

// Every property of a package of uniformHost() with `cores` cores, in order:
// an idle Intel package with every feature and dynamic power control.
std::vector<NamedValue> uniformPackageProperties(const std::string& deviceId, unsigned cores);

// The DeviceID of every returned instance, in order.
std::vector<std::string> deviceIdsOf(const orv::host::Reply& reply);

// The text of one property of an instance ("<absent>" when it has none).
std::string textOf(const CMPIInstance* instance, const char* name);

class ProcessorTest : public ::testing::Test {
protected:
    void serve(const CpuHost& host) { sim_.write(fixtureOf(host)); }
    orv::providertest::ProviderCore& provider() { return provider_; }

    orv::host::Reply getPackage(const std::string& deviceId,
                                const orv::providertest::PropertyList& properties = std::nullopt) {
        return provider_.getInstance(kProcessorClass, processorKeys(deviceId), properties);
    }

private:
    orv::providertest::SimHost sim_;  // before the core: it selects the platform
    orv::providertest::ProviderCore provider_;
};

}  // namespace processortest
