#include "edac_memory.hpp"

#include "../text_files.hpp"
#include "health_state.hpp"
#include "sysfs_dir.hpp"

namespace orv::linuxhost::health {

namespace {

bool present(const std::optional<std::string>& text) { return text && !text->empty(); }

MemoryModule readDimm(const std::string& dir, const std::string& location)
{
    MemoryModule module;
    module.location = location;
    module.label = readLine(dir + "/dimm_label");
    if (!present(module.label)) module.label.reset();
    module.slot = readLine(dir + "/dimm_location");
    module.sizeMb = readNumber(dir + "/size");
    module.memoryType = readLine(dir + "/dimm_mem_type");
    module.corrected = readNumber(dir + "/dimm_ce_count");
    module.uncorrected = readNumber(dir + "/dimm_ue_count");
    return module;
}

MemoryModule readCsrow(const std::string& dir, const std::string& location)
{
    MemoryModule module;
    module.location = location;
    std::string labels;
    for (const std::string& name : directoryEntries(dir)) {
        if (name.rfind("ch", 0) != 0 || name.size() < 12 || name.compare(name.size() - 11, 11, "_dimm_label") != 0) continue;
        std::optional<std::string> label = readLine(dir + "/" + name);
        if (!present(label)) continue;
        labels += (labels.empty() ? "" : ", ") + *label;
    }
    if (!labels.empty()) module.label = labels;
    module.sizeMb = readNumber(dir + "/size_mb");
    module.memoryType = readLine(dir + "/mem_type");
    module.corrected = readNumber(dir + "/ce_count");
    module.uncorrected = readNumber(dir + "/ue_count");
    return module;
}

void readController(const std::string& dir, const std::string& mc, std::vector<MemoryModule>& out)
{
    std::vector<std::string> modules = entriesStartingWith(dir, "dimm");
    if (modules.empty()) modules = entriesStartingWith(dir, "rank");
    for (const std::string& name : modules) out.push_back(readDimm(dir + "/" + name, mc + "/" + name));
    if (!modules.empty()) return;
    for (const std::string& name : entriesStartingWith(dir, "csrow")) {
        out.push_back(readCsrow(dir + "/" + name, mc + "/" + name));
    }
}

}  // namespace

std::vector<MemoryModule> readMemoryModules(const std::string& sysRoot)
{
    std::vector<MemoryModule> modules;
    const std::string base = sysRoot + "/devices/system/edac/mc";
    for (const std::string& mc : entriesStartingWith(base, "mc")) {
        if (mc.find_first_not_of("0123456789", 2) != std::string::npos) continue;
        readController(base + "/" + mc, mc, modules);
    }
    return modules;
}

std::optional<std::uint16_t> memoryHealth(const MemoryModule& module)
{
    if (module.uncorrected.value_or(0) > 0) return kMajorFailure;
    if (module.corrected.value_or(0) > 0) return kDegraded;
    if (module.corrected || module.uncorrected) return kOk;
    return std::nullopt;
}

}  // namespace orv::linuxhost::health
