#include "AgentTest.h"

#include <unistd.h>

using lumora::HelperAgentError;
using lumora::tests::ChildProgram;
using lumora::tests::SystemBus;
using testing::StartsWith;

namespace {

const std::string notAuthorized = std::to_string(static_cast<int>(HelperAgentError::NotAuthorized));

constexpr const char* allowedUser = "nobody";
constexpr const char* allowedNumber = "65534";
constexpr const char* refusedNumber = "1";
constexpr const char* rootNumber = "0";

std::unique_ptr<ChildProgram> call(std::vector<std::string> arguments) {
  arguments.insert(arguments.begin(), "--caller");
  return ChildProgram::startSelf(std::move(arguments));
}

// On a bus without polkit.
class OwnerTest : public lumora::tests::AgentTest {};

TEST_F(OwnerTest, isRefused_whenHeIsNot) {
  if (geteuid() != 0) {
    GTEST_SKIP() << "only root can call as another user";
  }
  EXPECT_EQ(call({refusedNumber})->readLine(), "refused " + notAuthorized);
  EXPECT_THAT(call({rootNumber})->readLine(), StartsWith("authorized "));
}

TEST_F(OwnerTest, isRefused_whenPolkitIsToDecideAndThereIsNone) {
  agent_.reset();
  ASSERT_TRUE(startAgent("polkit"));
  LMRErrorRef error;
  EXPECT_EQ(authorize(lumora::tests::configureOperation, &error), std::nullopt);
  ASSERT_TRUE(error);
  EXPECT_EQ(error->code(), static_cast<int>(HelperAgentError::NotAuthorized));
  EXPECT_THAT(error->localizedDescription(), testing::HasSubstr("polkit cannot be asked"));
}

// Real callers of other users, judged by a real polkitd, by the policies that are installed.
class PolkitTest : public lumora::tests::AgentTest {
protected:
  PolkitTest() : AgentTest(SystemBus::Policy::AsInstalled) {}

  void SetUp() override {
    for (const auto& obstacle : {SystemBus::obstacle(), SystemBus::polkitObstacle()}) {
      if (obstacle) {
        GTEST_SKIP() << *obstacle;
      }
    }
    ASSERT_TRUE(bus_.start());
    ASSERT_TRUE(bus_.startPolkit(allowedUser));
    ASSERT_TRUE(startAgent("polkit"));
  }
};

TEST_F(PolkitTest, unprivilegedCallerChangesTheConfiguration_whenAllowed) {
  const auto caller = call({allowedNumber});
  EXPECT_THAT(caller->readLine(), StartsWith("authorized "));
  caller->writeLine("high");
  EXPECT_EQ(caller->readLine(), "succeeded high");
  EXPECT_EQ(configuration().string("Capture"), "high");
}

TEST_F(PolkitTest, unprivilegedCallerIsRefused_whenNotAllowed) {
  EXPECT_EQ(call({refusedNumber})->readLine(), "refused " + notAuthorized);
}

TEST_F(PolkitTest, authorizationIsOfNoUse_whenStolen) {
  const auto owner = call({allowedNumber});
  const std::string line = owner->readLine();
  ASSERT_THAT(line, StartsWith("authorized "));
  for (const char* const thiefsNumber : {refusedNumber, allowedNumber, rootNumber}) {
    const auto thief = call({thiefsNumber, line.substr(line.find(' ') + 1)});
    EXPECT_EQ(thief->readLine(), line);
    thief->writeLine("stolen");
    EXPECT_EQ(thief->readLine(), "failed " + notAuthorized) << thiefsNumber;
  }
  EXPECT_EQ(configuration().string("Capture"), "");
  owner->writeLine("high");
  EXPECT_EQ(owner->readLine(), "succeeded high");
}

// Root's agent runs a server's tools as the server's owner, who might have put any program in their place.
TEST_F(PolkitTest, toolRunsAsTheServersOwner) {
  const auto lumexec = server_.tool("lumexec");
  std::filesystem::remove(lumexec);
  lumora::tests::writeFile(lumexec, "#!/bin/sh\nprintf '<plist version=\"1.0\"><dict><key>Capture</key><string>%s:%s"
                                    "</string></dict></plist>' \"$(id -u)\" \"$(id -G)\"\n");
  std::filesystem::permissions(lumexec, std::filesystem::perms(0755));
  std::filesystem::permissions(server_.folder(), std::filesystem::perms(0755));
  ASSERT_EQ(chown((server_.root() / "var/lib/lumora").c_str(), 65534, 65534), 0);
  const auto action = set("Capture", "high");
  ASSERT_THAT(action, lumora::tests::WasSuccessful());
  EXPECT_EQ(action->result()->string("Capture"), "65534:65534");
}

} // namespace
