// ExecQuery in both brokers. The providers refuse execQuery; each broker answers
// from the provider's enumeration, filtered by the WHERE clause, each instance
// with its path and the properties of the SELECT list. Both must select the same
// instances with the same properties, except where the stock sfcb's evaluator
// differs (documented in the README's two-broker section and tested here).
#include <gtest/gtest.h>

#include "exec_query_answers.hpp"
#include "two_broker_fixture.hpp"

namespace orv::e2e {
namespace {

class ExecQueryInBothBrokers : public TwoBrokerTest {};

const std::string kSystem = "SystemCreationClassName=OMC_UnitaryComputerSystem;SystemName=orvhost01.lab.example.com";

// The line of one Ethernet port in an answer with the given properties.
std::string portLine(int number, const std::string& properties) {
    return "Orvane_EthernetPort CreationClassName=Orvane_EthernetPort;DeviceID=vmnic" + std::to_string(number) + ";" +
           kSystem + " | " + properties + "\n";
}

TEST_F(ExecQueryInBothBrokers, SelectListAndWhereClauseGiveTheSameInstances) {
    const std::string query = "SELECT DeviceID, Speed FROM Orvane_EthernetPort WHERE ActiveMaximumTransmissionUnit = 1500";
    const std::string orv = execQueryAnswer(orvPort(), "WQL", query);
    EXPECT_EQ(orv, portLine(2, "DeviceID=vmnic2;Speed=1000000000") + portLine(3, "DeviceID=vmnic3;Speed=1000000000"));
    EXPECT_EQ(execQueryAnswer(sfcbPort(), "WQL", query), orv);
}

TEST_F(ExecQueryInBothBrokers, ConditionsSelectTheSameInstancesInBothBrokers) {
    const char* queries[] = {
        "SELECT DeviceID, Speed FROM Orvane_EthernetPort WHERE Speed > 1000000000",
        "SELECT DeviceID FROM CIM_EthernetPort WHERE DeviceID <> 'vmnic0' AND FullDuplex = TRUE",
        "SELECT DeviceID FROM CIM_NetworkPort WHERE DeviceID = 'vmnic1' OR DeviceID = 'vmnic3'",
        "SELECT Name, IPv4Address FROM Orvane_KernelIPv4ProtocolEndpoint WHERE NOT IPv4Address IS NULL",
        "SELECT ElementName FROM Orvane_EthernetPort WHERE ActiveMaximumTransmissionUnit < 9000 AND Speed >= 1000000000",
        "SELECT DeviceID FROM Orvane_EthernetPort WHERE DeviceID LIKE 'vmnic%' AND (Speed < 10 OR EnabledState = 2)",
    };
    for (const char* query : queries) {
        const std::string orv = execQueryAnswer(orvPort(), "WQL", query);
        EXPECT_NE(orv, "") << query;
        EXPECT_EQ(orv.find("BAD"), std::string::npos) << query << "\n" << orv;
        EXPECT_EQ(execQueryAnswer(sfcbPort(), "WQL", query), orv) << query;
    }
}

TEST_F(ExecQueryInBothBrokers, MalformedQueryIsAnInvalidQueryInBothBrokers) {
    EXPECT_EQ(execQueryAnswer(orvPort(), "WQL", "SELECT * FROM"), "ERROR 15");
    EXPECT_EQ(execQueryAnswer(sfcbPort(), "WQL", "SELECT * FROM"), "ERROR 15");
}

// Broker conventions: where the stock sfcb 1.3.11 answers otherwise.
TEST_F(ExecQueryInBothBrokers, UnknownLanguageIsRefusedHereAndReadAsWqlBySfcb) {
    const std::string query = "SELECT DeviceID FROM Orvane_EthernetPort WHERE DeviceID = 'vmnic1'";
    EXPECT_EQ(execQueryAnswer(orvPort(), "XPath", query), "ERROR 14");
    EXPECT_EQ(execQueryAnswer(sfcbPort(), "XPath", query), portLine(1, "DeviceID=vmnic1"));
}

TEST_F(ExecQueryInBothBrokers, NotOfAComparisonAndIsNotNullFollowTheQueryLanguageHereOnly) {
    const std::string notQuery = "SELECT DeviceID FROM Orvane_EthernetPort WHERE NOT DeviceID = 'vmnic0'";
    EXPECT_EQ(execQueryAnswer(orvPort(), "WQL", notQuery),
              portLine(1, "DeviceID=vmnic1") + portLine(2, "DeviceID=vmnic2") + portLine(3, "DeviceID=vmnic3"));
    EXPECT_EQ(execQueryAnswer(sfcbPort(), "WQL", notQuery), portLine(0, "DeviceID=vmnic0"));  // NOT is dropped
    const std::string notNull = "SELECT DeviceID FROM Orvane_EthernetPort WHERE Speed IS NOT NULL AND DeviceID = 'vmnic2'";
    EXPECT_EQ(execQueryAnswer(orvPort(), "WQL", notNull), portLine(2, "DeviceID=vmnic2"));
    EXPECT_EQ(execQueryAnswer(sfcbPort(), "WQL", notNull), "");  // IS NOT NULL is never true there
}

}  // namespace
}  // namespace orv::e2e
