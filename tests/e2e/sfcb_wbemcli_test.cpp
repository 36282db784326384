// The end-to-end wbemcli operations in both brokers: every class the provider
// library and the companion library serve (ein, ei, gi), every association from both ends (ai, ain, ri,
// rin) and the parent classes (ein, ei), on orv-cimhost and on the stock sfcb
// serving the same simulated host. The answers must be the same after
// normalising the documented broker conventions (broker_answers.hpp).
//
// The classes come from the registration file and the class repository, and
// the objects from orv-cimhost's own enumerations, so a new provider's classes
// join the suite without a change here. The shipped simulated host has no
// hardware health elements: the watched hardware classes answer empty in both
// (the companion library's own tests cover them with elements).
#include <gtest/gtest.h>

#include <set>

#include "broker_answers.hpp"
#include "two_broker_fixture.hpp"

namespace orv::e2e {
namespace {

enum class Target { Class, FirstInstance, FirstAssociationEnd1, FirstAssociationEnd2 };

struct SfcbCase {
    std::string operation;  // wbemcli operation
    std::string className;
    Target target = Target::Class;
};

// The classes named by the registration file, and their subclasses, less the
// indication classes; and the parents of those that no provider serves.
struct ServedClasses {
    std::vector<std::string> served;
    std::vector<std::string> parents;
    std::set<std::string> associations;
};

ServedClasses servedClasses() {
    ServedClasses out;
    orv::repository::ClassRepository classes;
    loadServedClasses(classes);
    std::set<std::string> seen;
    auto add = [&](const std::string& name) {
        if (classes.getClass("root/cimv2", name) == nullptr || classes.isIndication("root/cimv2", name) ||
            !seen.insert(name).second) {
            return;
        }
        out.served.push_back(name);
        if (classes.isAssociation("root/cimv2", name)) {
            out.associations.insert(name);
        }
    };
    for (const std::string& file : servedRegistrationFiles()) {
        for (const std::string& registered : registeredClasses(file)) {
            add(registered);
            for (const std::string& sub : classes.subclasses("root/cimv2", registered, true)) {
                add(sub);
            }
        }
    }
    std::set<std::string> parents;
    for (const std::string& name : out.served) {
        const std::string parent = classes.getClass("root/cimv2", name)->superClass;
        if (!parent.empty() && seen.count(parent) == 0 && parents.insert(parent).second) {
            out.parents.push_back(parent);
        }
    }
    return out;
}

// Classes that have no instance on the shipped simulated host, which has no
// "health" section: the watched hardware classes of the companion library, and
// the latched health records, since nothing is ever latched there. Both
// brokers are compared on their (empty) enumerations; the cases that start
// from an instance have nothing to start from. (CIM_Processor has instances:
// the project's processors.)
const std::set<std::string> kWithoutInstances = {
    "Orvane_LatchedHealthState", "Orvane_LatchedHealthAssociation",
    "CIM_Sensor",                "CIM_NumericSensor",
    "Orvane_NumericSensor",
    "CIM_PhysicalMemory",        "Orvane_PhysicalMemory",
    "CIM_PowerSupply",           "Orvane_PowerSupply",
    "Orvane_PortController",     "Orvane_Controller",
    "Orvane_Battery",            "Orvane_StorageVolume",
    "Orvane_StorageExtent",      "Orvane_DiskDrive",
    "Orvane_SASSATAPort",        "Orvane_StoragePool"};

std::vector<SfcbCase> sfcbCases() {
    const ServedClasses classes = servedClasses();
    std::vector<SfcbCase> cases;
    for (const std::string& name : classes.served) {
        cases.push_back({"ein", name});
        cases.push_back({"ei", name});
        if (kWithoutInstances.count(name) != 0) {
            continue;
        }
        cases.push_back({"gi", name, Target::FirstInstance});
        if (classes.associations.count(name) != 0) {
            for (Target end : {Target::FirstAssociationEnd1, Target::FirstAssociationEnd2}) {
                for (const char* op : {"ai", "ain", "ri", "rin"}) {
                    cases.push_back({op, name, end});
                }
            }
        }
    }
    for (const std::string& name : classes.parents) {
        cases.push_back({"ein", name});
        cases.push_back({"ei", name});
    }
    return cases;
}

void PrintTo(const SfcbCase& c, std::ostream* out) { *out << c.operation << " " << c.className; }

std::string caseName(const ::testing::TestParamInfo<SfcbCase>& info) {
    static const char* const kTargets[] = {"", "_first", "_end1", "_end2"};
    return info.param.operation + "_" + info.param.className + kTargets[static_cast<int>(info.param.target)];
}

class SfcbWbemcliTest : public TwoBrokerTest, public ::testing::WithParamInterface<SfcbCase> {
protected:
    // The first instance name of the class, as orv-cimhost enumerates it
    // (the text after "<ns>:"), or "" when there is none.
    static std::string firstInstanceName(const std::string& className) {
        const std::string names = wbemcli(orvPort(), "ein", className);
        const std::size_t colon = names.find("root/cimv2:");
        if (colon == std::string::npos) {
            return "";
        }
        return names.substr(colon + 11, names.find('\n', colon) - colon - 11);
    }

    // One reference of the first association instance (0 or 1, in the order
    // orv-cimhost prints the properties), as an object for wbemcli.
    static std::string associationEnd(const std::string& className, std::size_t which) {
        const std::vector<WbemcliObject> objects = parseWbemcliAnswer(wbemcli(orvPort(), "ei -nl", className));
        std::vector<std::string> ends;
        for (const auto& [name, value] : objects.empty() ? decltype(objects[0].properties){} : objects[0].properties) {
            const std::size_t colon = value.find("root/cimv2:");
            if (colon == 0) {
                ends.push_back(value.substr(11));
            }
        }
        return which < ends.size() ? ends[which] : "";
    }

    static std::string objectFor(const SfcbCase& c) {
        switch (c.target) {
        case Target::FirstInstance: return firstInstanceName(c.className);
        case Target::FirstAssociationEnd1: return associationEnd(c.className, 0);
        case Target::FirstAssociationEnd2: return associationEnd(c.className, 1);
        default: return c.className;
        }
    }
};

TEST_P(SfcbWbemcliTest, SameAnswerInBothBrokers) {
    const SfcbCase& c = GetParam();
    const std::string object = objectFor(c);
    ASSERT_FALSE(object.empty()) << "orv-cimhost has no object for " << c.className;
    std::string command = c.operation;
    if (c.target == Target::FirstAssociationEnd1 || c.target == Target::FirstAssociationEnd2) {
        // Only through the association class under test: the other end's view of it.
        command += std::string(c.operation[0] == 'a' ? " -ac " : " -arc ") + c.className;
    }
    expectSameAnswer(command, object);
}

INSTANTIATE_TEST_SUITE_P(Sfcb, SfcbWbemcliTest, ::testing::ValuesIn(sfcbCases()), caseName);

// The installed-software association leads from the hypervisor image to the
// computer system, which the companion library serves, in both brokers.
class SfcbComputerSystemTest : public TwoBrokerTest {};

TEST_F(SfcbComputerSystemTest, AssociatorsFromTheHypervisorIdentityReturnTheComputerSystemInBothBrokers) {
    const std::string identities = wbemcli(orvPort(), "ein", "Orvane_HypervisorSoftwareIdentity");
    const std::size_t at = identities.find("root/cimv2:");
    ASSERT_NE(at, std::string::npos) << identities;
    const std::string identity = identities.substr(at + 11, identities.find('\n', at) - at - 11);
    for (int port : {orvPort(), sfcbPort()}) {
        const std::string answer = wbemcli(port, "ai -nl -ac Orvane_InstalledSoftwareIdentity", identity);
        const std::vector<WbemcliObject> objects = parseWbemcliAnswer(answer);
        ASSERT_EQ(objects.size(), 1U) << "port " << port << ":\n" << answer;
        EXPECT_NE(objects[0].path.find("OMC_UnitaryComputerSystem"), std::string::npos) << answer;
        EXPECT_NE(answer.find("-ElementName="), std::string::npos) << answer;
    }
    expectSameAnswer("ai -ac Orvane_InstalledSoftwareIdentity", identity);
}

}  // namespace
}  // namespace orv::e2e
