#include "SimHost.h"

#include <gtest/gtest.h>

#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <unistd.h>

#include "orv/platform/backend/Selector.h"

namespace orv::platform::test {

void writeFileAtomically(const std::string& path, const std::string& text)
{
    const std::string temporary = path + ".tmp";
    {
        std::ofstream out(temporary, std::ios::binary | std::ios::trunc);
        out << text;
    }
    ASSERT_EQ(std::rename(temporary.c_str(), path.c_str()), 0);
}

SimHost::SimHost(const Json& fixture) : SimHost(fixture.dump(2)) {}

SimHost::SimHost(const std::string& fixtureText)
{
    char pattern[] = "/tmp/orv-simhost-XXXXXX";
    const char* dir = mkdtemp(pattern);
    EXPECT_NE(dir, nullptr);
    dir_ = dir != nullptr ? dir : "/tmp";
    path_ = dir_ + "/host.json";
    writeFileAtomically(path_, fixtureText);
    setenv("ORV_PLATFORM", "sim", 1);
    setenv("ORV_SIM_FIXTURE", path_.c_str(), 1);
    reselectBackend();
}

SimHost::~SimHost()
{
    std::remove(path_.c_str());
    rmdir(dir_.c_str());
}

void SimHost::rewrite(const Json& fixture)
{
    rewriteText(fixture.dump(2));
}

void SimHost::rewriteText(const std::string& text)
{
    writeFileAtomically(path_, text);
}

Json defaultHost()
{
    return simgen::generateHost(simgen::HostShape{});
}

void addFault(Json& fixture, Json rule)
{
    fixture["faults"].push_back(std::move(rule));
}

} // namespace orv::platform::test
