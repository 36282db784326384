// CmpiObjectPath equality: namespace, host name, class name ignoring case,
// and key bindings ignoring key-name case and order.
#include "CoreFixture.h"

#include <cmpi/CmpiObjectPath.h>

namespace {

using orv::bindingtest::CoreFixture;

class ObjectPathEqualityTest : public CoreFixture {
protected:
    static CmpiObjectPath port(const char* ns = "root/cimv2", const char* cls = "Test_Element") {
        CmpiObjectPath p(ns, cls);
        p.setKey("Name", CmpiString("eth0"));
        p.setKey("Slot", CMPIUint32(3));
        return p;
    }
};

TEST_F(ObjectPathEqualityTest, IdenticalPathsAreEqual) {
    EXPECT_TRUE(port() == port());
    EXPECT_FALSE(port() != port());
}

TEST_F(ObjectPathEqualityTest, ClassNameComparesIgnoringCase) { EXPECT_TRUE(port() == port("root/cimv2", "TEST_element")); }

TEST_F(ObjectPathEqualityTest, DifferentNamespaceOrClassIsUnequal) {
    EXPECT_FALSE(port() == port("root/other"));
    EXPECT_FALSE(port() == port("root/cimv2", "Test_SubElement"));
}

TEST_F(ObjectPathEqualityTest, DifferentHostNameIsUnequal) {
    CmpiObjectPath a = port();
    CmpiObjectPath b = port();
    a.setHostname("host-a");
    b.setHostname("host-b");
    EXPECT_FALSE(a == b);
    b.setHostname("host-a");
    EXPECT_TRUE(a == b);
}

TEST_F(ObjectPathEqualityTest, KeyOrderAndKeyNameCaseDoNotMatter) {
    CmpiObjectPath other("root/cimv2", "Test_Element");
    other.setKey("SLOT", CMPIUint32(3));
    other.setKey("name", CmpiString("eth0"));
    EXPECT_TRUE(port() == other);
}

TEST_F(ObjectPathEqualityTest, KeyValuesMustMatch) {
    CmpiObjectPath other = port();
    other.setKey("Name", CmpiString("ETH0"));
    EXPECT_FALSE(port() == other);
}

TEST_F(ObjectPathEqualityTest, ExtraOrMissingKeyIsUnequal) {
    CmpiObjectPath more = port();
    more.setKey("Extra", CmpiString("x"));
    EXPECT_FALSE(port() == more);
    EXPECT_FALSE(more == port());
    CmpiObjectPath fewer("root/cimv2", "Test_Element");
    fewer.setKey("Name", CmpiString("eth0"));
    EXPECT_FALSE(port() == fewer);
}

TEST_F(ObjectPathEqualityTest, TextKeysCompareByCharactersAndIntegersByValue) {
    CmpiObjectPath other("root/cimv2", "Test_Element");
    other.setKey("Name", "eth0");
    other.setKey("Slot", CMPIUint64(3));
    EXPECT_TRUE(port() == other);
}

TEST_F(ObjectPathEqualityTest, ReferenceKeysCompareAsPaths) {
    CmpiObjectPath a("root/cimv2", "Test_Link");
    a.setKey("Left", port());
    CmpiObjectPath b("root/cimv2", "Test_Link");
    b.setKey("Left", port("root/cimv2", "test_ELEMENT"));
    EXPECT_TRUE(a == b);
    CmpiObjectPath c("root/cimv2", "Test_Link");
    c.setKey("Left", port("root/other"));
    EXPECT_FALSE(a == c);
}

TEST_F(ObjectPathEqualityTest, NullPathEqualsOnlyANullPath) {
    EXPECT_TRUE(CmpiObjectPath() == CmpiObjectPath());
    EXPECT_FALSE(CmpiObjectPath() == port());
}

}  // namespace
