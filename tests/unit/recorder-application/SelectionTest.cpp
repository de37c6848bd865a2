#include "recorder/model/Selection.h"

#include "Workflows.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <utility>

namespace recorder {
namespace {

using ::testing::ElementsAre;
using ::testing::Field;
using ::testing::IsEmpty;
using ::testing::SizeIs;

const SourceDescription camera{SourceKind::Camera, "video:a", "Camera A"};
const SourceDescription otherCamera{SourceKind::Camera, "video:b", "Camera B"};
const SourceDescription screen{SourceKind::Screen, "", "Screen"};
const SourceDescription studio{SourceKind::RemoteCamera, "Studio A", "Studio A"};
const SourceDescription microphone{SourceKind::Microphone, "audio:a", "Microphone A"};
const SourceDescription otherMicrophone{SourceKind::Microphone, "audio:b", "Microphone B"};

class SelectionTest : public ::testing::Test {
protected:
  SelectionTest() { selection_.setWorkflows(workflows()); }

  std::vector<std::string> titles() const {
    std::vector<std::string> all;
    for (const Workflow& each : selection_.workflows()) {
      all.push_back(each.title);
    }
    return all;
  }
  std::vector<SourceDescription> planned() const {
    std::vector<SourceDescription> all;
    for (const PlannedSource& each : selection_.plan()) {
      all.push_back(each.source);
    }
    return all;
  }

  Selection selection_;
};

TEST(Workflows, areKnown_onlyWhenTheFrameworkRecordsForThem) {
  EXPECT_FALSE(Workflow::withDescription(description("folder", {{"File"}})));
  EXPECT_FALSE(Workflow::withDescription(description("three", {{"Video"}, {"Video"}, {"Screen"}})));
  EXPECT_FALSE(Workflow::withDescription(description("sound and file", {{"Audio"}, {"File"}})));
  EXPECT_FALSE(Workflow::withDescription({}));
  EXPECT_TRUE(Workflow::withDescription(description("camera", {{"Video", "File"}})));
}

TEST(Workflows, areFedWithEachSourceOnce) {
  const auto both = Workflow::withDescription(description("both", {{"Video", "Screen"}, {"Screen"}}));
  ASSERT_TRUE(both);
  EXPECT_FALSE(both->fed({screen}));
  EXPECT_EQ(both->fed({screen, camera}), (std::vector<std::size_t>{1, 0}));
}

TEST_F(SelectionTest, offersNothing_withoutDevices) {
  EXPECT_THAT(titles(), IsEmpty());
  EXPECT_EQ(selection_.workflow(), nullptr);
  EXPECT_THAT(selection_.plan(), IsEmpty());
}

TEST_F(SelectionTest, offersTheWorkflowsThatCanBeFed) {
  selection_.setDevices({screen}, {});
  EXPECT_THAT(titles(), ElementsAre("Screen"));
  selection_.setDevices({camera, screen}, {microphone});
  EXPECT_THAT(titles(), ElementsAre("Camera", "Screen", "Sound", "Camera and screen"));
}

TEST_F(SelectionTest, takesACameraOfTheServerForAVideo) {
  selection_.setDevices({studio}, {});
  EXPECT_THAT(titles(), ElementsAre("Camera"));
  EXPECT_THAT(planned(), ElementsAre(studio));
  EXPECT_THAT(selection_.microphonesFor(0), IsEmpty());
}

TEST_F(SelectionTest, givesOneMicrophoneToTheFirstPictureOfThisMachine) {
  selection_.setDevices({camera, screen}, {microphone, otherMicrophone});
  selection_.selectWorkflow("both");
  EXPECT_THAT(selection_.plan(), ElementsAre(PlannedSource{camera, "audio:a"}, PlannedSource{screen, ""}));
}

TEST_F(SelectionTest, beginsWithWhatTheUserPrefers) {
  selection_.setPreferences("camera", "video:b", "audio:b");
  selection_.setDevices({camera, otherCamera, screen}, {microphone, otherMicrophone});
  EXPECT_EQ(selection_.workflow()->uuid, "camera");
  EXPECT_THAT(selection_.plan(), ElementsAre(PlannedSource{otherCamera, "audio:b"}));
}

TEST_F(SelectionTest, offersASourceAtOnePlaceOnly) {
  selection_.setDevices({camera, otherCamera, screen}, {});
  selection_.selectWorkflow("both");
  EXPECT_THAT(selection_.sourcesFor(0), ElementsAre(camera, otherCamera));
  EXPECT_THAT(selection_.sourcesFor(1), ElementsAre(screen));
}

TEST_F(SelectionTest, keepsTheChosenSource_whenItHasGone) {
  selection_.setDevices({camera, otherCamera}, {microphone});
  selection_.chooseSource(0, otherCamera);
  selection_.setDevices({camera}, {microphone});
  EXPECT_THAT(planned(), ElementsAre(otherCamera));
  EXPECT_FALSE(selection_.isPresent(0));
  EXPECT_THAT(selection_.sourcesFor(0), ElementsAre(otherCamera, camera));
  selection_.setDevices({}, {});
  EXPECT_THAT(titles(), ElementsAre("Camera"));
  selection_.setDevices({camera, otherCamera}, {microphone});
  EXPECT_TRUE(selection_.isPresent(0));
}

TEST_F(SelectionTest, isNotPresent_withoutItsMicrophone) {
  selection_.setDevices({camera}, {microphone});
  ASSERT_THAT(selection_.plan(), ElementsAre(PlannedSource{camera, "audio:a"}));
  selection_.setDevices({camera}, {});
  EXPECT_FALSE(selection_.isPresent(0));
}

TEST_F(SelectionTest, takesAMicrophoneThatComes_unlessTheUserHasChosen) {
  selection_.setDevices({camera}, {});
  selection_.setDevices({camera}, {microphone});
  EXPECT_EQ(selection_.plan()[0].microphone, "audio:a");
  selection_.chooseMicrophone(0, "");
  selection_.setDevices({camera}, {microphone, otherMicrophone});
  EXPECT_EQ(selection_.plan()[0].microphone, "");
}

TEST_F(SelectionTest, dropsTheMicrophone_whenASourceWithoutOneIsChosen) {
  selection_.setDevices({camera, studio}, {microphone});
  selection_.chooseSource(0, studio);
  EXPECT_EQ(selection_.plan()[0].microphone, "");
}

} // namespace
} // namespace recorder
