// libFuzzer target: MOF text into a fresh class repository. Malformed input
// must end in MofError; anything else (a crash, another exception) is a bug.
#include <algorithm>
#include <cctype>
#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

#include "orv/repository/class_repository.hpp"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const std::string_view text(reinterpret_cast<const char*>(data), size);
    // Includes would read whatever file the input names; keep the fuzzer in memory.
    std::string lowered(text);
    std::transform(lowered.begin(), lowered.end(), lowered.begin(),
                   [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
    if (lowered.find("include") != std::string::npos) {
        return 0;
    }
    orv::repository::ClassRepository repo;
    try {
        repo.loadText(text, "fuzz.mof");
    } catch (const orv::repository::MofError&) {
        return 0;
    }
    for (const auto& name : repo.classNames("root/cimv2", "", true)) {
        (void)repo.keyNames("root/cimv2", name);
        (void)repo.superclassChain("root/cimv2", name);
    }
    return 0;
}
