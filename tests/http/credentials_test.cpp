#include "orv/http/credentials.hpp"

#include <gtest/gtest.h>

namespace orv::http {
namespace {

// "user:secret" in base64.
constexpr const char* kUserSecret = "dXNlcjpzZWNyZXQ=";

TEST(BasicAuthorization, SchemeIsComparedWithoutRegardToCase) {
    const Credentials users = Credentials::parse("user:secret\n", "test");
    for (const std::string scheme : {"Basic", "basic", "BASIC", "bAsIc"}) {
        EXPECT_EQ(users.authenticate(scheme + " " + kUserSecret), "user") << scheme;
    }
}

TEST(BasicAuthorization, OtherSchemesAndMalformedValuesAreRefused) {
    const Credentials users = Credentials::parse("user:secret\n", "test");
    EXPECT_FALSE(users.authenticate(std::string("Bearer ") + kUserSecret));
    EXPECT_FALSE(users.authenticate(std::string("Basicx ") + kUserSecret));
    EXPECT_FALSE(users.authenticate("Basic"));
    EXPECT_FALSE(users.authenticate("Basic !!!!"));
}

TEST(BasicAuthorization, ClaimedUserIsReadEvenWithAWrongPassword) {
    auto claimed = basicAuthorization("basic dXNlcjp3cm9uZw==");  // user:wrong
    ASSERT_TRUE(claimed);
    EXPECT_EQ(claimed->first, "user");
    EXPECT_EQ(claimed->second, "wrong");
}

}  // namespace
}  // namespace orv::http
