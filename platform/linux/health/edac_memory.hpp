// Memory modules as the EDAC memory controllers report them
// (<sys>/devices/system/edac/mc/mc<N>): one module per dimm<M> (or rank<M>)
// folder, or on kernels that show only chip-select rows, one per csrow<M>;
// with their labels, sizes and corrected / uncorrected error counts.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace orv::linuxhost::health {

struct MemoryModule {
    std::string location;  // "mc0/dimm3", "mc1/csrow0": the controller's and the module's own numbers
    std::optional<std::string> label;     // dimm_label, or the csrow's channel labels joined by ", "
    std::optional<std::string> slot;      // dimm_location: "channel 0 slot 1"
    std::optional<std::uint64_t> sizeMb;
    std::optional<std::string> memoryType;  // "Registered-DDR4"
    std::optional<std::uint64_t> corrected, uncorrected;
};

// Every module of every controller, controllers and modules in number order;
// empty without EDAC.
std::vector<MemoryModule> readMemoryModules(const std::string& sysRoot);

// Uncorrected errors: 20; corrected errors only: 10; counts that are zero: 5;
// no count readable: nothing.
std::optional<std::uint16_t> memoryHealth(const MemoryModule& module);

}  // namespace orv::linuxhost::health
