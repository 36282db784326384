// Cost of one health pass over N watched elements spread over the twelve
// watched classes, half of them not OK (latched by the first pass, so the
// timed passes find every one of them again and latch nothing new).
//
//   latchedhealth_bench                 passes over 1,000 and 10,000 elements,
//                                       then resident memory across 1,000
//                                       passes over 1,000 elements
//   latchedhealth_bench N PASSES [rss]  one size (each size runs in a process
//                                       of its own: the family's state lasts
//                                       as long as the process)
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <string>

#include "harness/FamilyUnderTest.h"
#include "orv/providertest/SimHost.h"

namespace {

constexpr const char* kWatched[] = {"CIM_Sensor",          "CIM_PhysicalMemory",   "CIM_Processor",
                                    "CIM_PowerSupply",     "Orvane_PortController", "Orvane_Controller",
                                    "Orvane_Battery",      "Orvane_StorageVolume", "Orvane_StorageExtent",
                                    "Orvane_DiskDrive",    "Orvane_SASSATAPort",   "Orvane_StoragePool"};

nlohmann::ordered_json keysFor(const std::string& watchedClass, const std::string& id) {
    if (watchedClass == "Orvane_StoragePool") {
        return {{"InstanceID", id}};
    }
    if (watchedClass == "CIM_PhysicalMemory") {
        return {{"CreationClassName", watchedClass}, {"Tag", id}};
    }
    return {{"CreationClassName", watchedClass},
            {"DeviceID", id},
            {"SystemCreationClassName", "OMC_UnitaryComputerSystem"},
            {"SystemName", "simhost"}};
}

nlohmann::ordered_json hostOf(unsigned elements) {
    nlohmann::ordered_json health = nlohmann::ordered_json::array();
    for (unsigned i = 0; i < elements; ++i) {
        const std::string watchedClass = kWatched[i % std::size(kWatched)];
        health.push_back({{"watchedClass", watchedClass},
                          {"keys", keysFor(watchedClass, "element" + std::to_string(i))},
                          {"healthState", i % 2 == 0 ? 10 : 5}});
    }
    return orv::providertest::SimHost::withHost({{"health", health}});
}

long residentKilobytes() {
    std::ifstream status("/proc/self/status");
    std::string line;
    while (std::getline(status, line)) {
        if (line.rfind("VmRSS:", 0) == 0) {
            return std::strtol(line.c_str() + 6, nullptr, 10);
        }
    }
    return -1;
}

int runOneSize(unsigned elements, unsigned passes, bool rss) {
    ::setenv("ORV_BUILD_DIR", ORV_BENCH_BUILD_DIR, 0);
    ::setenv("ORV_SOURCE_DIR", ORV_BENCH_SOURCE_DIR, 0);
    orv::providertest::SimHost host;
    host.write(hostOf(elements));
    latched::FamilyUnderTest family;
    if (!family.load() || !family.waitForFirstPass()) {
        std::fprintf(stderr, "the family did not start\n");
        return 1;
    }
    family.runPass();  // warm-up: everything latched is found again
    const long rssBefore = residentKilobytes();
    const auto begin = std::chrono::steady_clock::now();
    for (unsigned i = 0; i < passes; ++i) {
        family.runPass();
    }
    const double seconds = std::chrono::duration<double>(std::chrono::steady_clock::now() - begin).count();
    const long rssAfter = residentKilobytes();
    const double perPass = seconds / passes;
    std::printf("%6u elements (%u latched): %8.3f ms per pass, %6.2f us per element over %u passes\n", elements,
                elements / 2, perPass * 1e3, perPass * 1e6 / elements, passes);
    if (rss) {
        std::printf("resident memory across %u passes: %ld kB before, %ld kB after\n", passes, rssBefore, rssAfter);
    }
    std::fflush(stdout);
    return 0;
}

int runChild(const char* self, const std::string& arguments) {
    const std::string command = std::string(self) + " " + arguments;
    const int status = std::system(command.c_str());
    return WIFEXITED(status) ? WEXITSTATUS(status) : 1;
}

}  // namespace

int main(int argc, char** argv) {
    if (argc >= 3) {
        return runOneSize(static_cast<unsigned>(std::strtoul(argv[1], nullptr, 10)),
                          static_cast<unsigned>(std::strtoul(argv[2], nullptr, 10)), argc >= 4);
    }
    int failed = 0;
    failed |= runChild(argv[0], "1000 100");
    failed |= runChild(argv[0], "10000 10");
    failed |= runChild(argv[0], "1000 1000 rss");
    return failed;
}
