// Linux software RAID arrays (<sys>/block/md*/md) with their member devices.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace orv::linuxhost::health {

struct MdMember {
    std::string entry;      // "dev-sda1"
    std::string blockName;  // "sda1", from the member's `block` link
    std::optional<std::uint64_t> slot;  // its role in the array; nothing for a spare
    std::string state;      // "in_sync", "faulty", "spare,write_error", ...
    std::optional<std::uint64_t> errors;  // read errors the array corrected on it
    std::optional<std::uint64_t> sectors;  // size of its block device
};

struct MdArray {
    std::string name;  // "md0"
    std::optional<std::string> uuid;  // md/uuid on kernels that show it
    std::string level;  // "raid1", "raid5", "linear", ...
    std::string arrayState;  // "clean", "active", "inactive", "broken", ...
    std::optional<std::uint64_t> raidDisks, degraded;
    std::optional<std::string> syncAction;
    std::optional<std::uint64_t> sectors;
    std::vector<MdMember> members;  // by slot, then spares
};

// Every array that is set up ("clear" ones and metadata containers are left
// out), in name order; empty without software RAID.
std::vector<MdArray> readMdArrays(const std::string& sysRoot);

// The array's own id for keys: "md:<uuid>", else "md:<name>".
std::string mdArrayId(const MdArray& array);

// Failed (array_state "broken" or "inactive", or more members missing than the
// level can lose): 25. Degraded: 10. Otherwise 5.
std::uint16_t mdArrayHealth(const MdArray& array);
// Members missing that the level survives: raid1 and multipath all but one,
// raid4/5 one, raid6 two, raid10 one (at least), others none.
std::uint64_t redundancyOf(const std::string& level, std::uint64_t raidDisks);
// "faulty": 20; "write_error", "want_replacement", "blocked" or corrected read
// errors: 10; otherwise 5.
std::uint16_t mdMemberHealth(const MdMember& member);

}  // namespace orv::linuxhost::health
