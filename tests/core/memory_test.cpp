// Broker-owned memory: objects belong to the scope, invocation or thread that
// made them; clones belong to the caller until released.
#include <cstring>

#include "core_fixture.hpp"

namespace orv::host::test {
namespace {

using MemoryTest = CoreTest;

TEST_F(MemoryTest, ObjectsBelongToTheOpenScopeAndAreFreedWithIt) {
    std::size_t before = scope_->objectCount();
    {
        ObjectScope inner;
        mb()->eft->newString(mb(), "a", nullptr);
        mb()->eft->newArgs(mb(), nullptr);
        EXPECT_EQ(inner.objectCount(), 2U);
    }
    EXPECT_EQ(scope_->objectCount(), before);
    mb()->eft->newString(mb(), "b", nullptr);
    EXPECT_EQ(scope_->objectCount(), before + 1);
}

TEST_F(MemoryTest, CloneIsCallerOwnedAndReleaseTwiceIsAnError) {
    CMPIString* s = mb()->eft->newString(mb(), "x", nullptr);
    std::size_t before = scope_->objectCount();
    CMPIString* copy = s->ft->clone(s, nullptr);
    EXPECT_EQ(scope_->objectCount(), before);  // not the scope's
    EXPECT_EQ(copy->ft->release(copy).rc, CMPI_RC_OK);
    EXPECT_EQ(copy->hdl, nullptr);
    EXPECT_EQ(copy->ft->release(copy).rc, CMPI_RC_ERR_FAILED);
    EXPECT_EQ(s->ft->release(s).rc, CMPI_RC_OK);
    EXPECT_EQ(s->ft->release(s).rc, CMPI_RC_ERR_FAILED);
}

TEST_F(MemoryTest, ReleasedObjectsAnswerInvalidHandle) {
    CMPIInstance* inst = mb()->eft->newInstance(mb(), path("Raw_Element", "r"), nullptr);
    inst->ft->release(inst);
    CMPIStatus rc{};
    inst->ft->getProperty(inst, "Name", &rc);
    EXPECT_EQ(rc.rc, CMPI_RC_ERR_INVALID_HANDLE);
}

TEST_F(MemoryTest, ValuesReadFromAnInstanceStayValidAfterTheyAreReplaced) {
    CMPIInstance* inst = mb()->eft->newInstance(mb(), path("Raw_Element"), nullptr);
    inst->ft->setProperty(inst, "Text", reinterpret_cast<const CMPIValue*>("old"), CMPI_chars);
    CMPIString* old = inst->ft->getProperty(inst, "Text", nullptr).value.string;
    inst->ft->setProperty(inst, "Text", reinterpret_cast<const CMPIValue*>("new"), CMPI_chars);
    EXPECT_EQ(text(old), "old");
    EXPECT_EQ(stringProperty(inst, "Text"), "new");
    EXPECT_EQ(old->ft->release(old).rc, CMPI_RC_OK);
}

TEST_F(MemoryTest, MarkAndReleaseFreeWhatWasMadeInBetween) {
    std::size_t before = scope_->objectCount();
    CMPIGcStat* mark = mb()->mft->mark(mb(), nullptr);
    mb()->eft->newString(mb(), "a", nullptr);
    void* raw = mb()->mft->cmpiMalloc(mb(), 100);
    std::memset(raw, 1, 100);
    char* dup = mb()->mft->cmpiStrDup(mb(), "dup");
    EXPECT_STREQ(dup, "dup");
    raw = mb()->mft->cmpiRealloc(mb(), raw, 200);
    EXPECT_EQ(static_cast<unsigned char*>(raw)[99], 1);
    void* zero = mb()->mft->cmpiCalloc(mb(), 4, 4);
    EXPECT_EQ(static_cast<int*>(zero)[3], 0);
    mb()->mft->cmpiFree(mb(), zero);
    EXPECT_EQ(mb()->mft->release(mb(), mark).rc, CMPI_RC_OK);
    EXPECT_EQ(scope_->objectCount(), before);
    CMPIString* s = mb()->eft->newString(mb(), "b", nullptr);
    mb()->mft->freeString(mb(), s);
    EXPECT_EQ(s->hdl, nullptr);
}

TEST_F(MemoryTest, UpCallResultsBelongToTheCallersScope) {
    std::size_t before = scope_->objectCount();
    CMPIEnumeration* en = mb()->bft->enumerateInstances(mb(), nullptr, path("Raw_SubElement"), nullptr, nullptr);
    ASSERT_NE(en, nullptr);
    EXPECT_EQ(scope_->objectCount(), before + 2);  // the class path made here and the enumeration
}

TEST_F(MemoryTest, RequestLoopKeepsNothingAlive) {
    // Run under AddressSanitizer / valgrind: every reply frees what it returned,
    // and nothing of the requests lands in the caller's scope but its own paths.
    std::size_t before = scope_->objectCount();
    for (int i = 0; i < 200; ++i) {
        Reply reply = core_->enumerateInstances(path("Raw_Base"), as(i % 2 == 0 ? "many" : "upcall"));
        ASSERT_EQ(reply.rc(), CMPI_RC_OK);
        Reply method = core_->invokeMethod(path("Raw_Element", "m"), "StartThread", nullptr);
        ASSERT_EQ(method.rc(), CMPI_RC_OK);
    }
    EXPECT_EQ(scope_->objectCount(), before + 2 * 200);
}

}  // namespace
}  // namespace orv::host::test
