// The project's CIM parent classes (cim/mof/cim): they load, have the expected
// chains, keys and kinds, and agree with the published 2.28 schema where that
// reference is present on the machine.
#include <gtest/gtest.h>

#include "test_support.hpp"
#include "text.hpp"

namespace orv::repository {
namespace {

using Names = std::vector<std::string>;
constexpr std::string_view kNs = "root/cimv2";

const ClassRepository& parents() {
    static const ClassRepository repo = [] {
        ClassRepository r;
        r.loadFile(testing::sourceDir() / "cim/mof/cim/cim_base.mof");
        return r;
    }();
    return repo;
}

const Names kNeeded = {
    "CIM_ManagedElement", "CIM_ManagedSystemElement", "CIM_LogicalElement", "CIM_EnabledLogicalElement",
    "CIM_System", "CIM_ComputerSystem", "CIM_UnitaryComputerSystem", "CIM_ServiceAccessPoint",
    "CIM_ProtocolEndpoint", "CIM_IPProtocolEndpoint", "CIM_LogicalDevice", "CIM_LogicalPort",
    "CIM_NetworkPort", "CIM_EthernetPort", "CIM_Processor", "CIM_SoftwareIdentity",
    "CIM_StatisticalInformation", "CIM_StatisticalData", "CIM_NetworkPortStatistics",
    "CIM_EthernetPortStatistics", "CIM_SettingData", "CIM_Dependency", "CIM_ElementSoftwareIdentity",
    "CIM_Statistics", "CIM_ElementStatisticalData", "CIM_ElementSettingData",
    "CIM_InstalledSoftwareIdentity", "CIM_Indication", "CIM_ProcessIndication", "CIM_AlertIndication",
    "CIM_InstIndication", "CIM_InstModification", "CIM_LogicalIdentity", "CIM_Sensor",
    "CIM_NumericSensor", "CIM_PowerSupply", "CIM_PhysicalMemory", "CIM_PhysicalElement",
    "CIM_PhysicalComponent", "CIM_Chip", "CIM_StorageExtent", "CIM_StoragePool", "CIM_StorageVolume",
    "CIM_DiskDrive", "CIM_MediaAccessDevice", "CIM_Controller", "CIM_PortController", "CIM_Battery",
    "CIM_LogicalDisk"};

TEST(CimParentClasses, EveryNeededClassIsDeclared) {
    for (const auto& name : kNeeded) {
        EXPECT_NE(parents().getClass(kNs, name), nullptr) << name;
    }
}

TEST(CimParentClasses, SampleChains) {
    EXPECT_EQ(parents().superclassChain(kNs, "CIM_EthernetPort"),
              (Names{"CIM_NetworkPort", "CIM_LogicalPort", "CIM_LogicalDevice", "CIM_EnabledLogicalElement",
                     "CIM_LogicalElement", "CIM_ManagedSystemElement", "CIM_ManagedElement"}));
    EXPECT_EQ(parents().superclassChain(kNs, "CIM_IPProtocolEndpoint"),
              (Names{"CIM_ProtocolEndpoint", "CIM_ServiceAccessPoint", "CIM_EnabledLogicalElement",
                     "CIM_LogicalElement", "CIM_ManagedSystemElement", "CIM_ManagedElement"}));
    EXPECT_EQ(parents().superclassChain(kNs, "CIM_EthernetPortStatistics"),
              (Names{"CIM_NetworkPortStatistics", "CIM_StatisticalData", "CIM_ManagedElement"}));
    EXPECT_EQ(parents().superclassChain(kNs, "CIM_InstModification"),
              (Names{"CIM_InstIndication", "CIM_Indication"}));
    EXPECT_EQ(parents().superclassChain(kNs, "CIM_ElementStatisticalData"), Names{});
    EXPECT_TRUE(parents().isA(kNs, "cim_unitarycomputersystem", "CIM_System"));
    EXPECT_TRUE(parents().isA(kNs, "CIM_PhysicalMemory", "CIM_PhysicalElement"));
    EXPECT_TRUE(parents().isA(kNs, "CIM_LogicalDisk", "CIM_StorageExtent"));
}

TEST(CimParentClasses, SampleKeys) {
    EXPECT_EQ(parents().keyNames(kNs, "CIM_EthernetPort"),
              (Names{"SystemCreationClassName", "SystemName", "CreationClassName", "DeviceID"}));
    EXPECT_EQ(parents().keyNames(kNs, "CIM_ComputerSystem"), (Names{"Name", "CreationClassName"}));
    EXPECT_EQ(parents().keyNames(kNs, "CIM_SoftwareIdentity"), Names{"InstanceID"});
    EXPECT_EQ(parents().keyNames(kNs, "CIM_ElementStatisticalData"), (Names{"ManagedElement", "Stats"}));
    // Name is declared (without Key) by CIM_ManagedSystemElement and made a key by
    // CIM_ServiceAccessPoint's override, so it keeps the inherited first place.
    EXPECT_EQ(parents().keyNames(kNs, "CIM_IPProtocolEndpoint"),
              (Names{"Name", "SystemCreationClassName", "SystemName", "CreationClassName"}));
}

TEST(CimParentClasses, KindsAndTypes) {
    EXPECT_TRUE(parents().isAssociation(kNs, "CIM_ElementSoftwareIdentity"));
    EXPECT_TRUE(parents().isAssociation(kNs, "CIM_InstalledSoftwareIdentity"));
    EXPECT_TRUE(parents().isIndication(kNs, "CIM_AlertIndication"));
    EXPECT_TRUE(parents().isIndication(kNs, "CIM_InstModification"));
    EXPECT_FALSE(parents().isAssociation(kNs, "CIM_EthernetPort"));
    const ClassDecl* port = parents().getClass(kNs, "CIM_EthernetPort");
    EXPECT_EQ(port->findProperty("Speed")->type.type, CimType::Uint64);
    EXPECT_EQ(port->findProperty("PermanentAddress")->type.type, CimType::String);
    EXPECT_TRUE(port->findProperty("NetworkAddresses")->type.isArray);
    EXPECT_EQ(port->findProperty("EnabledState")->type.type, CimType::Uint16);
    const ClassDecl* mod = parents().getClass(kNs, "CIM_InstModification");
    EXPECT_TRUE(mod->findProperty("PreviousInstance")->qualifiers.isTrue("EmbeddedObject"));
    EXPECT_TRUE(mod->findProperty("SourceInstance")->qualifiers.isTrue("EmbeddedObject"));
    const auto ends = parents().referenceProperties(kNs, "CIM_ElementStatisticalData");
    ASSERT_EQ(ends.size(), 2U);
    EXPECT_EQ(ends[1]->type.referenceClass, "CIM_StatisticalData");
}

void expectSameType(const DataType& ours, const DataType& theirs, const std::string& where) {
    EXPECT_EQ(ours.type, theirs.type) << where;
    EXPECT_EQ(ours.isArray, theirs.isArray) << where;
    EXPECT_EQ(ours.arraySize, theirs.arraySize) << where;
    EXPECT_TRUE(text::iequals(ours.referenceClass, theirs.referenceClass)) << where;
}

void expectSameClass(const ClassDecl& ours, const ClassDecl& theirs) {
    EXPECT_EQ(ours.name, theirs.name);
    EXPECT_EQ(ours.superClass, theirs.superClass) << ours.name;
    EXPECT_EQ(ours.isAssociation, theirs.isAssociation) << ours.name;
    EXPECT_EQ(ours.isIndication, theirs.isIndication) << ours.name;
    EXPECT_EQ(ours.isAbstract, theirs.isAbstract) << ours.name;
    EXPECT_EQ(ours.keyNames(), theirs.keyNames()) << ours.name;
    ASSERT_EQ(ours.properties.size(), theirs.properties.size()) << ours.name;
    for (std::size_t i = 0; i < ours.properties.size(); ++i) {
        const auto& a = ours.properties[i];
        const auto& b = theirs.properties[i];
        const std::string where = ours.name + "." + b.name;
        EXPECT_EQ(a.name, b.name) << where;
        EXPECT_EQ(a.classOrigin, b.classOrigin) << where;
        expectSameType(a.type, b.type, where);
        EXPECT_EQ(a.defaultValue, b.defaultValue) << where;
    }
    ASSERT_EQ(ours.methods.size(), theirs.methods.size()) << ours.name;
    for (std::size_t i = 0; i < ours.methods.size(); ++i) {
        const auto& a = ours.methods[i];
        const auto& b = theirs.methods[i];
        EXPECT_EQ(a.name, b.name) << ours.name;
        expectSameType(a.returnType, b.returnType, ours.name + "." + b.name);
        ASSERT_EQ(a.parameters.size(), b.parameters.size()) << ours.name << "." << b.name;
        for (std::size_t p = 0; p < a.parameters.size(); ++p) {
            const std::string where = ours.name + "." + b.name + "(" + b.parameters[p].name + ")";
            EXPECT_EQ(a.parameters[p].name, b.parameters[p].name) << where;
            expectSameType(a.parameters[p].type, b.parameters[p].type, where);
            EXPECT_EQ(a.parameters[p].isIn(), b.parameters[p].isIn()) << where;
            EXPECT_EQ(a.parameters[p].isOut(), b.parameters[p].isOut()) << where;
        }
    }
}

TEST(CimParentClasses, AgreeWithThePublishedSchema) {
    const auto reference = testing::sourceDir() / "../shared/reference/cim-schema-2.28";
    if (!std::filesystem::exists(reference / "cim_schema_2.28.0.mof")) {
        GTEST_SKIP() << "reference schema not present at " << reference;
    }
    ClassRepository published;
    published.loadFile(reference / "cim_schema_2.28.0.mof");
    const auto ours = parents().classNames(kNs, "", true);
    EXPECT_GE(ours.size(), kNeeded.size());
    for (const auto& name : ours) {
        const ClassDecl* theirs = published.getClass(kNs, name);
        ASSERT_NE(theirs, nullptr) << name << " is not a 2.28 class";
        expectSameClass(*parents().getClass(kNs, name), *theirs);
    }
}

const ClassRepository& interop() {
    static const ClassRepository repo = [] {
        ClassRepository r;
        r.loadFile(testing::sourceDir() / "cim/mof/interop/interop.mof");
        return r;
    }();
    return repo;
}

constexpr std::string_view kInterop = "root/interop";

TEST(InteropClasses, LoadIntoTheInteropNamespaceWithTheirKeys) {
    EXPECT_FALSE(interop().hasNamespace(kNs));
    EXPECT_EQ(interop().keyNames(kInterop, "CIM_IndicationFilter"),
              (Names{"SystemCreationClassName", "SystemName", "CreationClassName", "Name"}));
    EXPECT_EQ(interop().keyNames(kInterop, "CIM_IndicationSubscription"), (Names{"Filter", "Handler"}));
    EXPECT_EQ(interop().keyNames(kInterop, "CIM_IndicationHandlerCIMXML"),
              (Names{"SystemCreationClassName", "SystemName", "CreationClassName", "Name"}));
    EXPECT_TRUE(interop().isA(kInterop, "CIM_IndicationHandlerCIMXML", "CIM_ListenerDestination"));
    EXPECT_TRUE(interop().isA(kInterop, "CIM_ObjectManager", "CIM_Service"));
    EXPECT_TRUE(interop().isAssociation(kInterop, "CIM_IndicationSubscription"));
}

TEST(InteropClasses, AgreeWithThePublishedSchema) {
    const auto reference = testing::sourceDir() / "../shared/reference/cim-schema-2.28";
    if (!std::filesystem::exists(reference / "cim_schema_2.28.0.mof")) {
        GTEST_SKIP() << "reference schema not present at " << reference;
    }
    ClassRepository published;
    published.loadFile(reference / "cim_schema_2.28.0.mof");
    for (const auto& name : interop().classNames(kInterop, "", true)) {
        const ClassDecl* theirs = published.getClass(kNs, name);
        ASSERT_NE(theirs, nullptr) << name << " is not a 2.28 class";
        expectSameClass(*interop().getClass(kInterop, name), *theirs);
    }
}

}  // namespace
}  // namespace orv::repository
