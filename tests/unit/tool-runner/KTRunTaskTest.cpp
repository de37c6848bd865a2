#include <LumoraKit/platform/KTRunTask.h>
#include <LumoraKit/platform/RootedToolRunner.h>
#include <LumoraKit/testing/FakePlatform.h>

#include <gmock/gmock.h>

namespace lumora::tests {
namespace {

using fakes::FakePlatform;
using fakes::FakeToolRunner;
using fakes::ToolReply;
using testing::ElementsAre;

TEST(KTRunTask, asksThePlatformsRunner) {
  const FakePlatform platform;
  platform.toolRunner->setDefaultReply({26, "output", "error"});
  std::string output;
  std::string error;
  EXPECT_EQ(KTRunTask("/usr/bin/lumctl", {"--plistin"}, "input", &output, &error, nullptr), 26);
  EXPECT_EQ(output, "output");
  EXPECT_EQ(error, "error");
  const auto request = platform.toolRunner->requests().at(0);
  EXPECT_EQ(request.executable, "/usr/bin/lumctl");
  EXPECT_THAT(request.arguments, ElementsAre("--plistin"));
  EXPECT_EQ(request.standardInput, "input");
}

TEST(KTRunTask, runsTool_whenOutputsAreNotWanted) {
  const FakePlatform platform;
  platform.toolRunner->setDefaultReply({3, "output", "error"});
  EXPECT_EQ(KTRunTask("/usr/bin/lumctl", {}, "", nullptr, nullptr, nullptr), 3);
}

class RootedRunner : public testing::Test {
protected:
  std::string executableFor(const std::filesystem::path& root, const std::string& executable) {
    std::string output;
    std::string error;
    RootedToolRunner(root, runner_).run(executable, {"--plistin"}, "input", output, error);
    return runner_->requests().back().executable;
  }

  std::shared_ptr<FakeToolRunner> runner_ = std::make_shared<FakeToolRunner>();
};

TEST_F(RootedRunner, putsRootBeforePath) {
  EXPECT_EQ(executableFor("/srv/lumora", "/usr/bin/lumctl"), "/srv/lumora/usr/bin/lumctl");
  EXPECT_EQ(executableFor("/srv/lumora/", "/usr/bin/lumctl"), "/srv/lumora/usr/bin/lumctl");
  EXPECT_EQ(executableFor("/", "/usr/bin/lumctl"), "/usr/bin/lumctl");
}

TEST_F(RootedRunner, countsFromWorkingFolder_whenRootIsRelative) {
  EXPECT_EQ(executableFor("server", "/usr/bin/lumctl"),
            (std::filesystem::current_path() / "server/usr/bin/lumctl").string());
}

TEST_F(RootedRunner, passesEverythingElseOn) {
  runner_->setDefaultReply({7, "output", "error"});
  std::string output;
  std::string error;
  EXPECT_EQ(RootedToolRunner("/srv", runner_).run("/bin/tool", {"a", "b"}, "input", output, error), 7);
  EXPECT_EQ(output + error, "outputerror");
  EXPECT_THAT(runner_->requests().back().arguments, ElementsAre("a", "b"));
  EXPECT_EQ(runner_->requests().back().standardInput, "input");
}

} // namespace
} // namespace lumora::tests
