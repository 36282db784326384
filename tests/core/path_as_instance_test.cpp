// A raw C provider that hands object paths to an instance request: the core
// delivers instances made from the paths and warns once per provider.
#include "core_fixture.hpp"

namespace orv::host::test {
namespace {

class PathAsInstanceTest : public CoreTest {
protected:
    void SetUp() override {
        CoreTest::SetUp();
        CoreConfig config = rawConfig();
        config.warningSink = [this](const std::string& line) { warnings_.push_back(line); };
        scope_.reset();
        core_ = std::make_unique<BrokerCore>(config);
        scope_ = std::make_unique<ObjectScope>();
    }

    static std::vector<std::string> names(const Reply& reply, const char* cls) {
        std::vector<std::string> out;
        for (const CMPIInstance* inst : reply.instances()) {
            const CMPIObjectPath* op = inst->ft->getObjectPath(inst, nullptr);
            CMPIData key = op->ft->getKey(op, "Name", nullptr);
            EXPECT_EQ(className(op), cls);
            EXPECT_EQ(stringProperty(inst, "Name"), text(key.value.string));
            out.push_back(stringProperty(inst, "Name"));
        }
        return out;
    }

    std::vector<std::string> warnings_;
};

std::string warning(const char* provider, const char* operation, const char* cls) {
    return std::string("provider ") + provider + " (librawtestprovider.so) returned object paths to " + operation +
           " of " + cls + "; they are delivered as instances made from the paths (logged once per provider)";
}

TEST_F(PathAsInstanceTest, PathsHandedToEnumerateInstancesArriveAsInstancesOnThosePaths) {
    Reply reply = core_->enumerateInstances(path("Raw_SubElement"), as("paths"));
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    EXPECT_TRUE(reply.objectPaths().empty());
    EXPECT_EQ(names(reply, "Raw_SubElement"), (std::vector<std::string>{"path-0", "path-1"}));
    EXPECT_EQ(reply.doneCount(), 1U);
    EXPECT_EQ(warnings_,
              (std::vector<std::string>{warning("RawSubProvider", "enumerateInstances", "Raw_SubElement")}));
}

TEST_F(PathAsInstanceTest, PathHandedToGetInstanceArrivesAsTheInstance) {
    Reply reply = core_->getInstance(path("Raw_Element", "wanted"), as("paths"));
    ASSERT_EQ(reply.rc(), CMPI_RC_OK) << reply.message();
    EXPECT_EQ(names(reply, "Raw_Element"), (std::vector<std::string>{"path-0", "path-1"}));
    EXPECT_EQ(warnings_, (std::vector<std::string>{warning("RawElementProvider", "getInstance", "Raw_Element")}));
}

TEST_F(PathAsInstanceTest, TheWarningIsLoggedOncePerProvider) {
    core_->enumerateInstances(path("Raw_SubElement"), as("paths"));
    core_->enumerateInstances(path("Raw_OtherSub"), as("paths"));  // the same provider
    core_->getInstance(path("Raw_SubElement", "x"), as("paths"));
    // Reaches RawElementProvider and, for Raw_SubElement, RawSubProvider again.
    Reply reply = core_->enumerateInstances(path("Raw_Element"), as("paths"));
    EXPECT_EQ(reply.instances().size(), 4U);
    EXPECT_EQ(warnings_,
              (std::vector<std::string>{warning("RawSubProvider", "enumerateInstances", "Raw_SubElement"),
                                        warning("RawElementProvider", "enumerateInstances", "Raw_Element")}));
}

TEST_F(PathAsInstanceTest, PathsHandedToEnumerateInstanceNamesStayPathsWithoutWarning) {
    Reply reply = core_->enumerateInstanceNames(path("Raw_SubElement"), as("paths"));
    ASSERT_EQ(reply.rc(), CMPI_RC_OK);
    EXPECT_TRUE(reply.instances().empty());
    EXPECT_EQ(reply.objectPaths().size(), 2U);
    EXPECT_TRUE(warnings_.empty());
}

}  // namespace
}  // namespace orv::host::test
