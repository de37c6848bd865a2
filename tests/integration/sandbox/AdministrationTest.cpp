#include "support/Sandbox.h"

#include <gmock/gmock.h>

using lumora::tests::SandboxServer;
using testing::HasSubstr;
using testing::IsEmpty;

TEST(SandboxAdministration, createRefuses_whenThereIsAServerAlready) {
  const SandboxServer server;
  const auto again = server.administrate({"create"});
  EXPECT_EQ(again.status, 1);
  EXPECT_THAT(again.standardError, HasSubstr("there is a server at"));
  EXPECT_EQ(server.administrate({"user", "list"}).standardOutput, "ada\tAda Lovelace\n");
}
