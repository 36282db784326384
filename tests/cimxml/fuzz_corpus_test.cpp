// Replays the fuzz target's seed corpus through the target in the normal build, so a
// regression the corpus catches fails here without a libFuzzer build.
#include <gtest/gtest.h>

#include <cstdint>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size);

namespace {

TEST(CimXmlFuzzCorpus, EverySeedRunsThroughTheTarget) {
    const char* source = std::getenv("ORV_SOURCE_DIR");
    ASSERT_NE(source, nullptr);
    const std::filesystem::path corpus = std::filesystem::path(source) / "fuzz/cimxml/corpus";
    int seeds = 0;
    for (const auto& entry : std::filesystem::directory_iterator(corpus)) {
        std::ifstream in(entry.path(), std::ios::binary);
        std::stringstream bytes;
        bytes << in.rdbuf();
        const std::string data = bytes.str();
        EXPECT_EQ(LLVMFuzzerTestOneInput(reinterpret_cast<const std::uint8_t*>(data.data()), data.size()), 0);
        // Every prefix too: truncated requests are the commonest malformed input.
        for (std::size_t cut = 0; cut < data.size(); cut += 7) {
            LLVMFuzzerTestOneInput(reinterpret_cast<const std::uint8_t*>(data.data()), cut);
        }
        ++seeds;
    }
    EXPECT_GE(seeds, 5);
}

}  // namespace
