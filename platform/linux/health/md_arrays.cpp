#include "md_arrays.hpp"

#include "../text_files.hpp"
#include "health_state.hpp"
#include "sysfs_dir.hpp"

#include <algorithm>
#include <filesystem>

namespace orv::linuxhost::health {

namespace {

// Whether the comma-separated list holds word.
bool hasWord(const std::string& list, const std::string& word)
{
    std::size_t start = 0;
    while (start <= list.size()) {
        std::size_t end = list.find(',', start);
        if (end == std::string::npos) end = list.size();
        if (list.compare(start, end - start, word) == 0) return true;
        start = end + 1;
    }
    return false;
}

MdMember readMember(const std::string& dir, const std::string& entry)
{
    MdMember member;
    member.entry = entry;
    std::error_code ec;
    const std::filesystem::path block = std::filesystem::read_symlink(dir + "/block", ec);
    member.blockName = ec ? entry.substr(4) : block.filename().string();
    member.slot = readNumber(dir + "/slot");
    member.state = readLine(dir + "/state").value_or("");
    member.errors = readNumber(dir + "/errors");
    member.sectors = readNumber(dir + "/block/size");
    return member;
}

std::optional<MdArray> readArray(const std::string& blockDir, const std::string& name)
{
    const std::string md = blockDir + "/md";
    MdArray array;
    array.name = name;
    array.level = readLine(md + "/level").value_or("");
    array.arrayState = readLine(md + "/array_state").value_or("");
    if (array.arrayState.empty() || array.arrayState == "clear" || array.level == "container") return std::nullopt;
    array.uuid = readLine(md + "/uuid");
    array.raidDisks = readNumber(md + "/raid_disks");
    array.degraded = readNumber(md + "/degraded");
    array.syncAction = readLine(md + "/sync_action");
    array.sectors = readNumber(blockDir + "/size");
    for (const std::string& entry : entriesStartingWith(md, "dev-")) array.members.push_back(readMember(md + "/" + entry, entry));
    std::stable_sort(array.members.begin(), array.members.end(), [](const MdMember& a, const MdMember& b) {
        return a.slot.value_or(UINT64_MAX) < b.slot.value_or(UINT64_MAX);
    });
    return array;
}

}  // namespace

std::vector<MdArray> readMdArrays(const std::string& sysRoot)
{
    std::vector<MdArray> arrays;
    const std::string base = sysRoot + "/block";
    for (const std::string& name : entriesStartingWith(base, "md")) {
        if (!exists(base + "/" + name + "/md")) continue;
        if (std::optional<MdArray> array = readArray(base + "/" + name, name)) arrays.push_back(std::move(*array));
    }
    return arrays;
}

std::string mdArrayId(const MdArray& array)
{
    return "md:" + (array.uuid && !array.uuid->empty() ? *array.uuid : array.name);
}

std::uint64_t redundancyOf(const std::string& level, std::uint64_t raidDisks)
{
    if (level == "raid1" || level == "multipath") return raidDisks > 0 ? raidDisks - 1 : 0;
    if (level == "raid4" || level == "raid5" || level == "raid10") return 1;
    if (level == "raid6") return 2;
    return 0;
}

std::uint16_t mdArrayHealth(const MdArray& array)
{
    if (array.arrayState == "broken" || array.arrayState == "inactive") return kCriticalFailure;
    const std::uint64_t missing = array.degraded.value_or(0);
    if (missing == 0) return kOk;
    return missing > redundancyOf(array.level, array.raidDisks.value_or(0)) ? kCriticalFailure : kDegraded;
}

std::uint16_t mdMemberHealth(const MdMember& member)
{
    if (hasWord(member.state, "faulty")) return kMajorFailure;
    if (hasWord(member.state, "write_error") || hasWord(member.state, "want_replacement") ||
        hasWord(member.state, "blocked") || member.errors.value_or(0) > 0) {
        return kDegraded;
    }
    return kOk;
}

}  // namespace orv::linuxhost::health
