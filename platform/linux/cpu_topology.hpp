// Processor packages, cores and SMT threads of the online CPUs, from sysfs
// (<root>/devices/system/cpu). A core is one group of thread siblings.
#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace orv::linuxhost {

struct CpuCore {
    std::vector<unsigned> cpus;  // ascending; the first is the core's first thread
};

struct CpuPackage {
    unsigned packageId = 0;      // physical_package_id
    std::vector<CpuCore> cores;  // ordered by their first CPU
};

struct CpuTopology {
    std::vector<CpuPackage> packages;  // ordered by package id
    std::vector<unsigned> onlineCpus;

    // Every online CPU, one core's first thread after another package by package,
    // then the remaining SMT threads in ascending order: the position of a
    // package's first CPU is the number of cores of the packages before it.
    std::vector<unsigned> cpuOrder() const;
    std::optional<CpuPackage> package(unsigned packageId) const;
    std::size_t coreCount() const;
};

// "0-3,5,8-9" -> 0 1 2 3 5 8 9. Nothing on malformed text.
std::optional<std::vector<unsigned>> parseCpuList(std::string_view text);
// Throws LinuxCallError when the online list cannot be read.
CpuTopology readCpuTopology(const std::string& sysRoot = "/sys");

}  // namespace orv::linuxhost
