// CMPIInstance.getObjectPath: the path follows every change of the instance,
// a change made to a path handed out earlier stays in that path, and other
// threads may read the instance's path at the same time.
#include <thread>
#include <vector>

#include "core_fixture.hpp"

namespace orv::host::test {
namespace {

using InstancePathTest = CoreTest;

std::string nameKey(const CMPIObjectPath* op) { return text(op->ft->getKey(op, "Name", nullptr).value.string); }

std::string nameSpace(const CMPIObjectPath* op) { return text(op->ft->getNameSpace(op, nullptr)); }

TEST_F(InstancePathTest, PathFollowsTheInstanceAndKeepsChangesMadeToAnEarlierPath) {
    CMPIInstance* inst = mb()->eft->newInstance(mb(), path("Raw_Element", "a"), nullptr);
    CMPIObjectPath* first = inst->ft->getObjectPath(inst, nullptr);
    inst->ft->setProperty(inst, "Name", reinterpret_cast<const CMPIValue*>("b"), CMPI_chars);
    CMPIObjectPath* second = inst->ft->getObjectPath(inst, nullptr);
    EXPECT_EQ(nameKey(first), "a");
    EXPECT_EQ(nameKey(second), "b");
    second->ft->setNameSpace(second, "root/other");
    CMPIObjectPath* third = inst->ft->getObjectPath(inst, nullptr);
    EXPECT_EQ(nameSpace(second), "root/other");
    EXPECT_EQ(nameSpace(third), "root/cimv2");
    EXPECT_EQ(nameKey(third), "b");
    EXPECT_EQ(third->ft->release(third).rc, CMPI_RC_OK);
    CMPIObjectPath* fourth = inst->ft->getObjectPath(inst, nullptr);
    EXPECT_EQ(nameKey(fourth), "b");
    EXPECT_EQ(inst->ft->release(inst).rc, CMPI_RC_OK);
    EXPECT_EQ(nameKey(fourth), "b");
    EXPECT_EQ(className(fourth), "Raw_Element");
}

TEST_F(InstancePathTest, PathOfAReferenceKeyIsMadeAfreshEachTime) {
    CMPIObjectPath* assoc = path("Raw_Assoc");
    CMPIObjectPath* left = path("Raw_Element", "left");
    assoc->ft->addKey(assoc, "Left", reinterpret_cast<const CMPIValue*>(&left), CMPI_ref);
    CMPIInstance* inst = mb()->eft->newInstance(mb(), assoc, nullptr);
    CMPIObjectPath* first = inst->ft->getObjectPath(inst, nullptr);
    // The reference held by the instance changes in place, without a setter of the instance.
    CMPIObjectPath* held = inst->ft->getProperty(inst, "Left", nullptr).value.ref;
    held->ft->addKey(held, "Name", reinterpret_cast<const CMPIValue*>("moved"), CMPI_chars);
    CMPIObjectPath* second = inst->ft->getObjectPath(inst, nullptr);
    EXPECT_EQ(nameKey(first->ft->getKey(first, "Left", nullptr).value.ref), "left");
    EXPECT_EQ(nameKey(second->ft->getKey(second, "Left", nullptr).value.ref), "moved");
}

TEST_F(InstancePathTest, OtherThreadsReadTheInstancesPathAtTheSameTime) {
    // Run under ThreadSanitizer.
    CMPIInstance* inst = mb()->eft->newInstance(mb(), path("Raw_Element", "shared"), nullptr);
    std::vector<std::thread> readers;
    std::vector<int> wrong(3, 0);
    for (int t = 0; t < 3; ++t) {
        readers.emplace_back([inst, t, &wrong] {
            ObjectScope scope;
            for (int n = 0; n < 300; ++n) {
                CMPIObjectPath* op = inst->ft->getObjectPath(inst, nullptr);
                wrong[t] += nameKey(op) == "shared" ? 0 : 1;
            }
        });
    }
    for (int n = 0; n < 300; ++n) {
        EXPECT_EQ(nameKey(inst->ft->getObjectPath(inst, nullptr)), "shared");
    }
    for (std::thread& reader : readers) {
        reader.join();
    }
    EXPECT_EQ(wrong, (std::vector<int>{0, 0, 0}));
}

}  // namespace
}  // namespace orv::host::test
