// Test helper: the error a fixture text is rejected with (the test fails when
// it is accepted).
#pragma once

#include <gtest/gtest.h>

#include <string>

#include "FixtureReader.h"
#include "SimHost.h"

namespace orv::platform::test {

inline std::string rejection(const Json& fixture)
{
    sim::FixtureResult result = sim::parseFixture(fixture.dump(), "host.json");
    EXPECT_EQ(result.host, nullptr);
    return result.error;
}

} // namespace orv::platform::test
