// The platform library with the Linux substitute linked in: it is the default,
// and the declared entry points answer this machine.
#include "orv/platform/backend/Selector.h"
#include "tmkctl/network/NetworkInfoImpl.h"
#include "tmkctl/util/AutoVector.h"
#include "tool_output.hpp"

#include <cstdlib>
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

TEST(Selection, LinuxIsTheDefaultSubstitute)
{
    ::unsetenv("ORV_PLATFORM");
    orv::platform::reselectBackend();
    EXPECT_STREQ(orv::platform::activeBackend().name(), "linux") << orv::platform::selectionError();
}

TEST(Selection, NetworkInfoListsThisMachinesNics)
{
    ::unsetenv("ORV_PLATFORM");
    orv::platform::reselectBackend();
    std::vector<std::string> expected;
    auto links = nlohmann::json::parse(orv::linuxtest::toolOutput("ip -d -j link show").value_or("[]"));
    for (const auto& link : links) {
        if (link.contains("parentbus")) expected.push_back(link["ifname"]);
    }
    TmkCtl::Network::NetworkInfoImpl info;
    TmkCtl::Util::AutoVector<NodeMgr::Network::Pnic> pnics(info.GetPnics());
    std::vector<std::string> names;
    for (auto* pnic : pnics) names.push_back(pnic->GetName());
    EXPECT_EQ(names, expected);
    EXPECT_EQ(info.GetPnicByName("no-such-nic0"), nullptr);
}
