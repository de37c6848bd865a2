#include <gtest/gtest.h>

#include <client/running/ActionRunner.h>
#include <client/running/Connection.h>

using lumora::client::failureOf;
using lumora::client::ServerAddress;

namespace {

std::string parsed(const std::string& text) {
  const auto address = ServerAddress::parse(text);
  return address ? address->host + " " + std::to_string(address->port) : "none";
}

TEST(ServerAddressTest, isAHostWithOrWithoutAPort) {
  EXPECT_EQ(parsed("lumora.example.org"), "lumora.example.org 0");
  EXPECT_EQ(parsed("host:8171"), "host 8171");
  EXPECT_EQ(parsed("[::1]:8171"), "::1 8171");
  EXPECT_EQ(parsed("[fe80::1%eth0]"), "fe80::1%eth0 0");
  EXPECT_EQ(parsed("fe80::1"), "fe80::1 0");
}

TEST(ServerAddressTest, isRefused_whenItIsNone) {
  for (const auto* text : {"", ":", ":80", "host:", "host:0", "host:65536", "host:http", "[]", "[]:1", "[::1]:"}) {
    EXPECT_EQ(parsed(text), "none") << text;
  }
}

TEST(FailureTest, isOneSentenceWithTheToolsWords) {
  const auto of = [](std::int64_t status, const char* words) {
    return failureOf(*LMRAction::errorForStatusCode_standardError(status, words));
  };
  EXPECT_STREQ(of(26, "lumctl: the password is wrong\n").what(), "Not authorized: the password is wrong.");
  EXPECT_STREQ(of(26, "").what(), "Not authorized.");
  EXPECT_STREQ(of(26, "one\ntwo.\n").what(), "Not authorized: one; two.");
  EXPECT_STREQ(of(26, "\x1b[2Jgone").what(), "Not authorized: \\x1b[2Jgone.");
  EXPECT_EQ(of(26, "").status(), 26);
  EXPECT_EQ(of(139, "").status(), 139);
}

TEST(FailureTest, statusIsNeverThatOfSuccess) {
  for (const std::int64_t status : {-1, 256, 512}) {
    EXPECT_EQ(failureOf(*LMRAction::errorForStatusCode_standardError(status, std::nullopt)).status(), 1);
  }
  EXPECT_EQ(failureOf(*LMRError::make("elsewhere", 0, "Odd")).status(), 70);
}

} // namespace
