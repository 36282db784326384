// The hardware health of this machine through the platform library's entry
// point: every watched class answers without error, with complete and unique
// keys that do not change between requests.
#include "orv/platform/HealthElements.h"
#include "orv/platform/backend/Selector.h"

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <gtest/gtest.h>
#include <set>

namespace {

const char* const kWatched[] = {"CIM_Sensor",          "CIM_PhysicalMemory",   "CIM_Processor",
                                "CIM_PowerSupply",     "Orvane_PortController", "Orvane_Controller",
                                "Orvane_Battery",      "Orvane_StorageVolume", "Orvane_StorageExtent",
                                "Orvane_DiskDrive",    "Orvane_SASSATAPort",   "Orvane_StoragePool"};

std::vector<std::string> keyTexts(const std::vector<orv::platform::HealthElement>& elements)
{
    std::vector<std::string> texts;
    for (const auto& element : elements) {
        std::string text = element.className;
        for (const auto& key : element.keys) text += "|" + key.name + "=" + key.text.value_or("");
        texts.push_back(text);
    }
    return texts;
}

class MachineHealth : public ::testing::Test {
protected:
    void SetUp() override
    {
        ::unsetenv("ORV_PLATFORM");
        orv::platform::reselectBackend();
        ASSERT_STREQ(orv::platform::activeBackend().name(), "linux") << orv::platform::selectionError();
    }
};

TEST_F(MachineHealth, EveryWatchedClassAnswersWithCompleteUniqueStableKeys)
{
    for (const char* watched : kWatched) {
        std::vector<orv::platform::HealthElement> elements;
        ASSERT_NO_THROW(elements = orv::platform::healthElementsOf(watched)) << watched;
        std::set<std::string> seen;
        for (const auto& element : elements) {
            EXPECT_FALSE(element.className.empty()) << watched;
            ASSERT_FALSE(element.keys.empty()) << watched;
            for (const auto& key : element.keys) {
                ASSERT_TRUE(key.text) << watched << " " << key.name;
                EXPECT_FALSE(key.text->empty()) << watched << " " << key.name;
                if (key.name == "CreationClassName") {
                    EXPECT_EQ(*key.text, element.className);
                }
            }
            if (element.healthState) {
                ASSERT_TRUE(*element.healthState) << watched;
                EXPECT_TRUE(**element.healthState == 5 || **element.healthState >= 10) << watched;
            }
        }
        auto texts = keyTexts(elements);
        EXPECT_EQ(std::set<std::string>(texts.begin(), texts.end()).size(), texts.size()) << watched;
        EXPECT_EQ(keyTexts(orv::platform::healthElementsOf(watched)), texts) << watched;
        RecordProperty(watched, static_cast<int>(elements.size()));
    }
}

TEST_F(MachineHealth, ProcessorsAreLeftToTheProcessorProvider)
{
    EXPECT_TRUE(orv::platform::healthElementsOf("CIM_Processor").empty());
}

TEST_F(MachineHealth, PortControllersAreThisMachinesPciNetworkFunctions)
{
    std::size_t network = 0;
    std::error_code ec;
    for (std::filesystem::directory_iterator it("/sys/bus/pci/devices", ec), end; !ec && it != end; it.increment(ec)) {
        std::string classCode;
        std::ifstream(it->path() / "class") >> classCode;
        if (classCode.rfind("0x02", 0) == 0) ++network;
    }
    EXPECT_EQ(orv::platform::healthElementsOf("Orvane_PortController").size(), network);
}

}  // namespace
