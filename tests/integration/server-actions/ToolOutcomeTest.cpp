#include "RecordingTool.h"

#include <LumoraKit/actions/LMRActionFactory.h>
#include <LumoraKit/platform/PropertyList.h>

#include <gmock/gmock.h>

#include <filesystem>
#include <thread>
#include <vector>

using lumora::Array;
using lumora::Dictionary;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;

namespace {

class ToolOutcomeTest : public lumora::tests::RecordingToolTest {
protected:
  std::shared_ptr<LMRAction> action_ = LMRAction::actionWithCommand_arguments("getconfig", Array{"plist"});
};

TEST_F(ToolOutcomeTest, resultIsTheReply_whenTheToolSucceeds) {
  const Dictionary reply{{"CameraName", "Studio A"}, {"Capture", 3}, {"names", Array{"a", "b"}}};
  answer(0, *lumora::xmlDescription(reply));
  action_->runSynchronously();
  EXPECT_EQ(action_->error(), nullptr);
  ASSERT_TRUE(action_->result());
  EXPECT_EQ(*action_->result(), reply);
}

TEST_F(ToolOutcomeTest, errorHoldsTheStandardErrorByteForByte_whenTheToolFails) {
  answer(26, "no matter", "one line\nand \xff another\n");
  action_->runSynchronously();
  ASSERT_TRUE(action_->error());
  EXPECT_EQ(action_->error()->code(), 26);
  EXPECT_EQ(action_->error()->localizedDescription(), "Not authorized");
  EXPECT_EQ(action_->error()->userInfo().string("stderr"), "one line\nand \xff another\n");
  EXPECT_EQ(action_->result(), nullptr);
}

TEST_F(ToolOutcomeTest, standardErrorIsAnEmptyText_whenTheToolSaysNothing) {
  answer(20, "");
  action_->runSynchronously();
  EXPECT_EQ(action_->error()->userInfo().string("stderr"), "");
}

TEST_F(ToolOutcomeTest, succeedsWithoutAResult_whenTheOutputIsMalformed) {
  answer(0, "<plist version=\"1.0\"><dict>");
  action_->runSynchronously();
  EXPECT_EQ(action_->error(), nullptr);
  EXPECT_EQ(action_->result(), nullptr);
  EXPECT_THAT(log_->lines(), ElementsAre(HasSubstr("Error: dictionaryWithXMLDescription: ")));
}

TEST_F(ToolOutcomeTest, fails_whenTheToolIsNotThere) {
  std::filesystem::remove(folder_ / "root/usr/bin/lumctl");
  action_->runSynchronously();
  ASSERT_TRUE(action_->error());
  EXPECT_EQ(action_->error()->code(), 127);
  EXPECT_EQ(action_->error()->localizedDescription(), "Generic podcast error");
  EXPECT_NE(action_->error()->userInfo().string("stderr"), "");
}

TEST_F(ToolOutcomeTest, noToolIsRun_whenTheRequestCannotBeWritten) {
  action_->setArguments(Array{"bell\a"});
  action_->runSynchronously();
  EXPECT_EQ(action_->error()->code(), 11);
  EXPECT_FALSE(std::filesystem::exists(folder_ / "request"));
}

TEST_F(ToolOutcomeTest, eachGetsItsOwnReply_whenManyRunAtOnce) {
  answer(0, *lumora::xmlDescription(Dictionary{{"Bound", true}}));
  std::vector<std::shared_ptr<LMRAction>> actions;
  std::vector<std::jthread> threads;
  for (int index = 0; index < 8; ++index) {
    const auto action = actions.emplace_back(LMRAction::actionWithCommand_arguments("isbound", Array{"plist"}));
    threads.emplace_back([action] { action->runSynchronously(); });
  }
  threads.clear();
  for (const auto& action : actions) {
    ASSERT_TRUE(action->result());
    EXPECT_EQ(*action->result(), (Dictionary{{"Bound", true}}));
  }
}

} // namespace
