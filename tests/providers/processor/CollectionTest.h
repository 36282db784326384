// getCpuDetails called directly on simulated hosts.
#pragma once

#include <gtest/gtest.h>

#include <vector>

#include "OrvaneProcessor-Collection.h"
#include "ProcessorHost.h"
#include "orv/platform/backend/Selector.h"
#include "orv/providertest/SimHost.h"

namespace processortest {

struct Collected {
    unsigned int result = 0;
    std::vector<OrvaneProcessor::CpuDetails> records;
};

class CollectionTest : public ::testing::Test {
protected:
    Collected collect(const CpuHost& host) {
        sim_.write(fixtureOf(host));
        // The platform library linked into this test chose its substitute when
        // the process started: choose again, now that the simulated host exists.
        orv::platform::reselectBackend();
        Collected collected;
        collected.result = OrvaneProcessor::getCpuDetails(collected.records);
        return collected;
    }

private:
    orv::providertest::SimHost sim_;
};

}  // namespace processortest
