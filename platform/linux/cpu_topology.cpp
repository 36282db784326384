#include "cpu_topology.hpp"

#include "linux_call_error.hpp"
#include "text_files.hpp"

#include <algorithm>
#include <cerrno>
#include <map>

namespace orv::linuxhost {

namespace {

std::optional<std::pair<unsigned, unsigned>> parseRange(std::string_view item)
{
    auto dash = item.find('-');
    auto first = parseNumber(item.substr(0, dash));
    if (!first) return std::nullopt;
    if (dash == std::string_view::npos) return std::make_pair(unsigned(*first), unsigned(*first));
    auto last = parseNumber(item.substr(dash + 1));
    if (!last || *last < *first) return std::nullopt;
    return std::make_pair(unsigned(*first), unsigned(*last));
}

std::string cpuDir(const std::string& sysRoot, unsigned cpu)
{
    return sysRoot + "/devices/system/cpu/cpu" + std::to_string(cpu);
}

}  // namespace

std::optional<std::vector<unsigned>> parseCpuList(std::string_view text)
{
    text = trimmed(text);
    std::vector<unsigned> cpus;
    while (!text.empty()) {
        auto comma = text.find(',');
        auto range = parseRange(text.substr(0, comma));
        if (!range) return std::nullopt;
        for (unsigned cpu = range->first; cpu <= range->second; ++cpu) cpus.push_back(cpu);
        text = comma == std::string_view::npos ? std::string_view{} : text.substr(comma + 1);
    }
    return cpus;
}

std::vector<unsigned> CpuTopology::cpuOrder() const
{
    std::vector<unsigned> order;
    for (const auto& pkg : packages) {
        for (const auto& core : pkg.cores) order.push_back(core.cpus.front());
    }
    std::vector<unsigned> rest;
    for (unsigned cpu : onlineCpus) {
        if (std::find(order.begin(), order.end(), cpu) == order.end()) rest.push_back(cpu);
    }
    order.insert(order.end(), rest.begin(), rest.end());
    return order;
}

std::optional<CpuPackage> CpuTopology::package(unsigned packageId) const
{
    for (const auto& pkg : packages) {
        if (pkg.packageId == packageId) return pkg;
    }
    return std::nullopt;
}

std::size_t CpuTopology::coreCount() const
{
    std::size_t count = 0;
    for (const auto& pkg : packages) count += pkg.cores.size();
    return count;
}

CpuTopology readCpuTopology(const std::string& sysRoot)
{
    CpuTopology topology;
    const std::string onlinePath = sysRoot + "/devices/system/cpu/online";
    auto online = parseCpuList(readFileOrThrow(onlinePath));
    if (!online) throw LinuxCallError("parse", onlinePath, EINVAL);
    topology.onlineCpus = *online;

    // package id -> (first sibling -> sibling list)
    std::map<unsigned, std::map<unsigned, std::vector<unsigned>>> grouped;
    for (unsigned cpu : topology.onlineCpus) {
        const std::string dir = cpuDir(sysRoot, cpu) + "/topology/";
        auto packageId = readNumber(dir + "physical_package_id");
        auto siblings = parseCpuList(readFile(dir + "thread_siblings_list").value_or(std::to_string(cpu)));
        if (!packageId) continue;  // went offline while reading
        if (!siblings || siblings->empty()) siblings = std::vector<unsigned>{cpu};
        grouped[unsigned(*packageId)][siblings->front()].push_back(cpu);
    }
    for (auto& [packageId, cores] : grouped) {
        CpuPackage pkg{packageId, {}};
        for (auto& [first, cpus] : cores) pkg.cores.push_back(CpuCore{cpus});
        topology.packages.push_back(std::move(pkg));
    }
    return topology;
}

}  // namespace orv::linuxhost
