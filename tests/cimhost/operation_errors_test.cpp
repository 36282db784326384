// The table of status codes each operation may answer, and the nearest code sent
// for one it may not.
#include "operation_errors.hpp"

#include <gtest/gtest.h>

#include "orv/cimxml/cim_status.hpp"

namespace orv::cimhost::detail {
namespace {

using cimxml::CimStatus;

int answered(std::string_view operation, CimStatus status) {
    return answeredCode(operation, static_cast<int>(status));
}

TEST(OperationErrorsTest, CodesOnTheOperationsListPassUnchanged) {
    EXPECT_EQ(answered("GetInstance", CimStatus::NotFound), 6);
    EXPECT_EQ(answered("GetInstance", CimStatus::InvalidClass), 5);
    EXPECT_EQ(answered("ExecQuery", CimStatus::InvalidQuery), 15);
    EXPECT_EQ(answered("ExecQuery", CimStatus::QueryLanguageNotSupported), 14);
    EXPECT_EQ(answered(kMethodCall, CimStatus::MethodNotFound), 17);
    EXPECT_EQ(answered("Associators", CimStatus::AccessDenied), 2);
}

TEST(OperationErrorsTest, OperationNamesIgnoreCase) {
    EXPECT_EQ(answered("getinstance", CimStatus::NoSuchProperty), 4);
}

TEST(OperationErrorsTest, ProviderNoSuchPropertyIsAnInvalidParameter) {
    EXPECT_EQ(answered("GetInstance", CimStatus::NoSuchProperty), 4);
    EXPECT_EQ(answered("DeleteInstance", CimStatus::NoSuchProperty), 4);
    EXPECT_EQ(answered("GetProperty", CimStatus::NoSuchProperty), 12);
}

TEST(OperationErrorsTest, UnknownClassIsNotFoundForMethodsAndGetClass) {
    EXPECT_EQ(answered(kMethodCall, CimStatus::InvalidClass), 6);
    EXPECT_EQ(answered("GetClass", CimStatus::InvalidClass), 6);
}

TEST(OperationErrorsTest, UnknownClassIsAnInvalidParameterForAssociations) {
    for (const char* operation : {"Associators", "AssociatorNames", "References", "ReferenceNames"}) {
        EXPECT_EQ(answered(operation, CimStatus::InvalidClass), 4) << operation;
        EXPECT_EQ(answered(operation, CimStatus::NotFound), 4) << operation;
    }
}

TEST(OperationErrorsTest, UnknownClassOfAQueryIsAnInvalidQuery) {
    EXPECT_EQ(answered("ExecQuery", CimStatus::InvalidClass), 15);
}

TEST(OperationErrorsTest, RefusalsOfReadOperationsWithoutNotSupportedAreFailures) {
    EXPECT_EQ(answered("GetInstance", CimStatus::NotSupported), 1);
    EXPECT_EQ(answered("EnumerateInstances", CimStatus::NotSupported), 7);
}

TEST(OperationErrorsTest, CodesWithoutANearerOneAreFailures) {
    EXPECT_EQ(answered("GetInstance", CimStatus::AlreadyExists), 1);
    EXPECT_EQ(answered("Associators", static_cast<CimStatus>(60)), 1);  // a CMPI-only code
}

TEST(OperationErrorsTest, OperationsWithoutAListAnswerAnyCode) {
    EXPECT_TRUE(mayAnswer("NoSuchOperation", 12));
    EXPECT_EQ(answered("NoSuchOperation", CimStatus::NoSuchProperty), 12);
}

TEST(OperationErrorsTest, EveryOperationMayAnswerTheCommonCodes) {
    for (const char* operation : {"GetClass", "EnumerateInstances", "ExecQuery", "References", "SetQualifier"}) {
        for (CimStatus status : {CimStatus::Failed, CimStatus::AccessDenied, CimStatus::InvalidNamespace,
                                 CimStatus::InvalidParameter}) {
            EXPECT_TRUE(mayAnswer(operation, static_cast<int>(status))) << operation;
        }
    }
}

}  // namespace
}  // namespace orv::cimhost::detail
