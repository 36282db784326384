// Properties of instances whose class the repository knows: the names are
// shared by the class's instances, looked up by the place they were set in last
// time, and still behave as every property name does (any case, first spelling,
// names the class does not declare, filters, threads).
#include <thread>
#include <vector>

#include "context.hpp"
#include "core_fixture.hpp"

namespace orv::host::test {
namespace {

class PropertyNamesTest : public CoreTest {
protected:
    CMPIInstance* element(const char* name = "e") { return mb()->eft->newInstance(mb(), path("Raw_Element", name), nullptr); }

    static void setText(CMPIInstance* inst, const char* name, const char* value) {
        ASSERT_EQ(inst->ft->setProperty(inst, name, reinterpret_cast<const CMPIValue*>(value), CMPI_chars).rc, CMPI_RC_OK);
    }

    static void setCounter(CMPIInstance* inst, const char* name, CMPIUint32 value) {
        ASSERT_EQ(inst->ft->setProperty(inst, name, reinterpret_cast<const CMPIValue*>(&value), CMPI_uint32).rc,
                  CMPI_RC_OK);
    }
};

TEST_F(PropertyNamesTest, FirstSpellingStaysOnEachInstanceWhateverOtherInstancesUsed) {
    CMPIInstance* first = element("a");
    setText(first, "text", "lower");
    setText(first, "TEXT", "upper");
    CMPIInstance* second = element("b");
    setText(second, "Text", "declared");
    EXPECT_EQ(propertyNames(first), (std::vector<std::string>{"Name", "text"}));
    EXPECT_EQ(stringProperty(first, "Text"), "upper");
    EXPECT_EQ(propertyNames(second), (std::vector<std::string>{"Name", "Text"}));
    EXPECT_EQ(stringProperty(second, "tExT"), "declared");
}

TEST_F(PropertyNamesTest, NamesTheClassDoesNotDeclareAreKeptInOrderBesideDeclaredOnes) {
    CMPIInstance* inst = element();
    setText(inst, "Undeclared", "u");
    setText(inst, "Text", "t");
    setText(inst, "undeclared", "again");
    EXPECT_EQ(propertyNames(inst), (std::vector<std::string>{"Name", "Undeclared", "Text"}));
    EXPECT_EQ(stringProperty(inst, "UNDECLARED"), "again");
    EXPECT_EQ(stringProperty(inst, "text"), "t");
}

TEST_F(PropertyNamesTest, EveryOrderOfSettingFindsEachProperty) {
    const char* order[] = {"Text", "Counter", "Extra", "Flag"};
    for (int round = 0; round < 4; ++round) {
        CMPIInstance* inst = mb()->eft->newInstance(mb(), path("Raw_SubElement", "s"), nullptr);
        for (int i = 0; i < 4; ++i) {
            const char* name = order[(i + round) % 4];
            if (std::string(name) == "Counter") {
                setCounter(inst, name, static_cast<CMPIUint32>(round));
            } else if (std::string(name) == "Flag") {
                CMPIBoolean flag = 1;
                inst->ft->setProperty(inst, name, reinterpret_cast<const CMPIValue*>(&flag), CMPI_boolean);
            } else {
                setText(inst, name, name);
            }
        }
        setText(inst, round % 2 == 0 ? "Text" : "Extra", "replaced");
        EXPECT_EQ(inst->ft->getPropertyCount(inst, nullptr), 5U);
        EXPECT_EQ(inst->ft->getProperty(inst, "counter", nullptr).value.uint32, static_cast<CMPIUint32>(round));
        EXPECT_EQ(stringProperty(inst, "Extra"), round % 2 == 1 ? "replaced" : "Extra");
        EXPECT_EQ(stringProperty(inst, "TEXT"), round % 2 == 0 ? "replaced" : "Text");
        EXPECT_EQ(propertyNames(inst)[0], "Name");
    }
}

TEST_F(PropertyNamesTest, AReleasedPropertyNameStillNamesTheProperty) {
    CMPIInstance* inst = element();
    setText(inst, "Text", "t");
    CMPIString* name = nullptr;
    inst->ft->getPropertyAt(inst, 1, &name, nullptr);
    EXPECT_EQ(name->ft->release(name).rc, CMPI_RC_OK);
    EXPECT_EQ(propertyNames(inst), (std::vector<std::string>{"Name", "Text"}));
    EXPECT_EQ(text(name), "Text");
}

TEST_F(PropertyNamesTest, FilterSetAfterPropertiesKeepsLookupsRight) {
    CMPIInstance* inst = element("f");
    setText(inst, "Text", "t");
    setCounter(inst, "Counter", 7);
    const char* keep[] = {"Counter", nullptr};
    const char* keys[] = {"Name", nullptr};
    ASSERT_EQ(inst->ft->setPropertyFilter(inst, keep, keys).rc, CMPI_RC_OK);
    setText(inst, "Text", "dropped");
    setCounter(inst, "Counter", 8);
    EXPECT_EQ(propertyNames(inst), (std::vector<std::string>{"Name", "Counter"}));
    EXPECT_EQ(inst->ft->getProperty(inst, "Counter", nullptr).value.uint32, 8U);
    CMPIObjectPath* op = inst->ft->getObjectPath(inst, nullptr);
    EXPECT_EQ(text(op->ft->getKey(op, "name", nullptr).value.string), "f");
}

TEST_F(PropertyNamesTest, ValueSetAfterAMarkOnAnOlderInstanceOutlivesTheMarksRelease) {
    CMPIInstance* inst = element();
    CMPIGcStat* mark = mb()->mft->mark(mb(), nullptr);
    setText(inst, "Text", "after the mark");
    CMPIArray* array = mb()->eft->newArray(mb(), 2, CMPI_string, nullptr);
    array->ft->setElementAt(array, 1, reinterpret_cast<const CMPIValue*>("element"), CMPI_chars);
    inst->ft->setProperty(inst, "Numbers", reinterpret_cast<const CMPIValue*>(&array), CMPI_stringA);
    ASSERT_EQ(mb()->mft->release(mb(), mark).rc, CMPI_RC_OK);
    EXPECT_EQ(stringProperty(inst, "Text"), "after the mark");
    CMPIArray* kept = inst->ft->getProperty(inst, "Numbers", nullptr).value.array;
    EXPECT_EQ(text(kept->ft->getElementAt(kept, 1, nullptr).value.string), "element");
}

TEST_F(PropertyNamesTest, CloneOfAScopesInstanceOutlivesTheScope) {
    CMPIInstance* copy = nullptr;
    {
        ObjectScope inner;
        CMPIInstance* inst = element("c");
        CMPIArray* texts = mb()->eft->newArray(mb(), 1, CMPI_string, nullptr);
        CMPIString* s = mb()->eft->newString(mb(), "in the array", nullptr);
        texts->ft->setElementAt(texts, 0, reinterpret_cast<const CMPIValue*>(&s), CMPI_string);
        inst->ft->setProperty(inst, "Numbers", reinterpret_cast<const CMPIValue*>(&texts), CMPI_stringA);
        CMPIObjectPath* ref = path("Raw_Element", "r");
        inst->ft->setProperty(inst, "Other", reinterpret_cast<const CMPIValue*>(&ref), CMPI_ref);
        copy = inst->ft->clone(inst, nullptr);
        s->ft->release(s);
        texts->ft->release(texts);
    }
    EXPECT_EQ(propertyNames(copy), (std::vector<std::string>{"Name", "Numbers", "Other"}));
    CMPIArray* texts = copy->ft->getProperty(copy, "numbers", nullptr).value.array;
    EXPECT_EQ(text(texts->ft->getElementAt(texts, 0, nullptr).value.string), "in the array");
    CMPIObjectPath* ref = copy->ft->getProperty(copy, "Other", nullptr).value.ref;
    EXPECT_EQ(text(ref->ft->getKey(ref, "Name", nullptr).value.string), "r");
    EXPECT_EQ(copy->ft->release(copy).rc, CMPI_RC_OK);
}

TEST_F(PropertyNamesTest, ValuesCopiedFromAnInstanceOutliveItsRelease) {
    CMPIInstance* inst = element("kept");
    CMPIArray* texts = mb()->eft->newArray(mb(), 1, CMPI_string, nullptr);
    texts->ft->setElementAt(texts, 0, reinterpret_cast<const CMPIValue*>("first"), CMPI_chars);
    inst->ft->setProperty(inst, "Numbers", reinterpret_cast<const CMPIValue*>(&texts), CMPI_stringA);
    texts->ft->setElementAt(texts, 0, reinterpret_cast<const CMPIValue*>("changed"), CMPI_chars);
    EXPECT_EQ(texts->ft->release(texts).rc, CMPI_RC_OK);
    CMPIArray* held = inst->ft->getProperty(inst, "Numbers", nullptr).value.array;
    EXPECT_EQ(text(held->ft->getElementAt(held, 0, nullptr).value.string), "first");
    CMPIObjectPath* op = inst->ft->getObjectPath(inst, nullptr);
    CMPIInstance* other = element("other");
    CMPIData copied = inst->ft->getProperty(inst, "Numbers", nullptr);
    other->ft->setProperty(other, "Numbers", &copied.value, copied.type);
    EXPECT_EQ(inst->ft->release(inst).rc, CMPI_RC_OK);
    EXPECT_EQ(text(op->ft->getKey(op, "Name", nullptr).value.string), "kept");
    CMPIArray* again = other->ft->getProperty(other, "Numbers", nullptr).value.array;
    EXPECT_EQ(text(again->ft->getElementAt(again, 0, nullptr).value.string), "first");
}

TEST_F(PropertyNamesTest, InstancesOfOneClassBuiltOnSeveralThreadsAtOnce) {
    // Run under ThreadSanitizer: the threads share the class's name table and
    // teach it different orders.
    std::vector<std::thread> threads;
    std::vector<int> failures(4, 0);
    for (int t = 0; t < 4; ++t) {
        threads.emplace_back([this, t, &failures] {
            ObjectScope scope;
            const char* order[] = {"Text", "Counter", "Extra", "Undeclared"};
            for (int n = 0; n < 200; ++n) {
                CMPIInstance* inst = mb()->eft->newInstance(mb(), path("Raw_SubElement", "t"), nullptr);
                for (int i = 0; i < 4; ++i) {
                    const char* name = order[(i + t + n) % 4];
                    CMPIUint32 value = static_cast<CMPIUint32>(t * 1000 + n);
                    inst->ft->setProperty(inst, name, reinterpret_cast<const CMPIValue*>(&value), CMPI_uint32);
                }
                for (const char* name : order) {
                    CMPIData d = inst->ft->getProperty(inst, name, nullptr);
                    if (d.type != CMPI_uint32 || d.value.uint32 != static_cast<CMPIUint32>(t * 1000 + n)) {
                        ++failures[t];
                    }
                }
                if (inst->ft->getPropertyCount(inst, nullptr) != 5) {
                    ++failures[t];
                }
            }
        });
    }
    for (std::thread& thread : threads) {
        thread.join();
    }
    EXPECT_EQ(failures, (std::vector<int>{0, 0, 0, 0}));
}

TEST_F(PropertyNamesTest, ReleaseEntryFreesEachUnitOfWorkOfAnAttachedThread) {
    // Run under AddressSanitizer / valgrind: every unit's pool goes back at the
    // release entry and the next unit builds in reused chunks.
    CMPIContext* invocation = detail::newContext(detail::Owner::Caller);
    CMPIContext* ctx = mb()->bft->prepareAttachThread(mb(), invocation);
    invocation->ft->release(invocation);
    ASSERT_NE(ctx, nullptr);
    int failures = 0;
    std::thread worker([this, ctx, &failures] {
        mb()->bft->attachThread(mb(), ctx);
        for (int unit = 0; unit < 50; ++unit) {
            CMPIInstance* inst = element("unit");
            const std::string value = "value of unit " + std::to_string(unit);
            for (const char* name : {"Text", "Extra", "Undeclared"}) {
                setText(inst, name, value.c_str());
            }
            CMPIArray* texts = mb()->eft->newArray(mb(), 300, CMPI_string, nullptr);
            for (CMPICount i = 0; i < 300; ++i) {
                texts->ft->setElementAt(texts, i, reinterpret_cast<const CMPIValue*>(value.c_str()), CMPI_chars);
            }
            inst->ft->setProperty(inst, "Numbers", reinterpret_cast<const CMPIValue*>(&texts), CMPI_stringA);
            CMPIArray* held = inst->ft->getProperty(inst, "Numbers", nullptr).value.array;
            if (stringProperty(inst, "undeclared") != value ||
                text(held->ft->getElementAt(held, 299, nullptr).value.string) != value) {
                ++failures;
            }
            if (CMReleaseThreadMemory(ctx).rc != CMPI_RC_OK) {
                ++failures;
            }
        }
        mb()->bft->detachThread(mb(), ctx);
    });
    worker.join();
    EXPECT_EQ(failures, 0);
}

}  // namespace
}  // namespace orv::host::test
