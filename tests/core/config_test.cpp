// Bad registration or MOF input stops the core from starting, with the file,
// the line and what was expected.
#include <fstream>

#include "core_fixture.hpp"

namespace orv::host::test {
namespace {

using ::testing::HasSubstr;

std::filesystem::path writeFile(const std::string& name, const std::string& content) {
    std::filesystem::path file = std::filesystem::temp_directory_path() / (std::to_string(::getpid()) + name);
    std::ofstream(file) << content;
    return file;
}

std::string startupError(const CoreConfig& config) {
    try {
        BrokerCore core(config);
    } catch (const std::runtime_error& error) {
        return error.what();
    }
    return "started";
}

TEST(CoreConfigTest, MalformedMofStopsTheCoreWithFileAndLine) {
    std::filesystem::path mof = writeFile("bad.mof", "class Broken {\n  string Name\n};\n");
    CoreConfig config = rawConfig();
    config.mofPaths = {mof};
    std::string error = startupError(config);
    EXPECT_THAT(error, HasSubstr(mof.string() + ":2: expected ';'"));
    std::filesystem::remove(mof);
}

TEST(CoreConfigTest, MalformedRegistrationStopsTheCoreWithFileAndLine) {
    std::filesystem::path reg = writeFile("bad.reg", "[Raw_Element]\n   provider: X\n   nonsense line\n");
    CoreConfig config = rawConfig();
    config.registrationFiles = {reg};
    std::string error = startupError(config);
    EXPECT_THAT(error, HasSubstr(reg.string() + ":3"));
    std::filesystem::remove(reg);
}

TEST(CoreConfigTest, MofWarningsGoToTheWarningSinkAtStart) {
    std::filesystem::path mof =
        writeFile("typechange.mof", "class P {\n  boolean Flag;\n};\nclass C : P {\n  uint16 Flag;\n};\n");
    CoreConfig config = rawConfig();
    config.mofPaths.push_back(mof);
    std::vector<std::string> warnings;
    config.warningSink = [&warnings](const std::string& line) { warnings.push_back(line); };
    { BrokerCore core(config); }
    EXPECT_EQ(warnings, (std::vector<std::string>{
                            mof.string() + ":5: property C.Flag is uint16 but overrides Flag of P, which is "
                                           "boolean; an inherited property cannot change its type"}));
    std::filesystem::remove(mof);
}

TEST(CoreConfigTest, GoodInputStarts) { EXPECT_EQ(startupError(rawConfig()), "started"); }

}  // namespace
}  // namespace orv::host::test
