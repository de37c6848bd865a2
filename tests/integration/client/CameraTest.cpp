#include "ClientTest.h"

using lumora::Array;
using lumora::Dictionary;
using lumora::tests::contentOf;
using lumora::tests::FailedWith;
using lumora::tests::pair;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::StartsWith;

namespace {

constexpr std::string_view pngBeginning = "\x89PNG\r\n\x1a\n";

class CameraTest : public lumora::tests::ClientTest {
protected:
  CameraTest() { server_.administrate({"camera", "add"}, {"Studio A"}); }
  void startCamera() const {
    ASSERT_EQ(run({"camera", "start", "Studio A"}).status, 0);
    requests();
  }
};

TEST_F(CameraTest, cameras_areATable) {
  EXPECT_EQ(output({"cameras"}), "Name      State\nStudio A  idle\n");
  EXPECT_EQ(request(), Array{"listcameras"});
  server_.administrate({"camera", "remove"}, {"Studio A"});
  EXPECT_EQ(output({"cameras"}), "There are no cameras.\n");
}

TEST_F(CameraTest, status_tellsTheState) {
  EXPECT_THAT(output({"camera", "status", "Studio A"}),
              StartsWith("Name     Studio A\nState    idle\nPreview  file:///"));
  EXPECT_EQ(request(), Array{pair("status", "Studio A")});
  EXPECT_EQ(reply({"camera", "status", "Studio A"}).string("state"), "idle");
  EXPECT_THAT(run({"camera", "status", "Studio B"}),
              FailedWith(36, "Remote camera failure: there is no remote camera"));
}

TEST_F(CameraTest, preview_writesThePicture) {
  const auto path = (folder_ / "preview.png").string();
  EXPECT_THAT(output({"camera", "preview", "Studio A", path}), StartsWith("Wrote the picture of Studio A to "));
  EXPECT_EQ(request(), (Array{pair("status", "Studio A"), "update_preview_image", "include_preview_image"}));
  EXPECT_THAT(contentOf(path), StartsWith(pngBeginning));
  EXPECT_THAT(output({"camera", "preview", "Studio A", "-"}), StartsWith(pngBeginning));
  EXPECT_THAT(output({"camera", "preview", "Studio A", path, "-ojson"}),
              HasSubstr("\"preview_image_data\": \"iVBORw0KGgo"));
}

TEST_F(CameraTest, preview_leavesTheOldFile_whenItFails) {
  std::filesystem::create_directories(folder_ / "out");
  const auto path = file("out/old.png", "old");
  EXPECT_THAT(run({"camera", "preview", "Studio B", path}), FailedWith(36, "Studio B"));
  inject("garbage", {});
  EXPECT_THAT(run({"camera", "preview", "Studio A", path}), FailedWith(76, "cannot be read"));
  EXPECT_EQ(contentOf(path), "old");
  EXPECT_THAT(filesIn(folder_ / "out"), ElementsAre("old.png"));
}

TEST_F(CameraTest, recordsWithPauses) {
  EXPECT_EQ(output({"camera", "start", "Studio A", "--delay", "1", "--audio-only"}), "Studio A is recording.\n");
  EXPECT_EQ(request(), (Array{pair("start", "Studio A"), pair("delay", 1), "audio_only"}));
  EXPECT_EQ(cameraState("Studio A"), "recording");
  EXPECT_EQ(output({"camera", "pause", "Studio A"}), "Studio A is paused.\n");
  EXPECT_EQ(request(), Array{pair("pause", "Studio A")});
  EXPECT_EQ(cameraState("Studio A"), "paused");
  EXPECT_EQ(output({"camera", "resume", "Studio A"}), "Studio A is recording.\n");
  EXPECT_EQ(request(), Array{pair("resume", "Studio A")});
  EXPECT_EQ(output({"camera", "cancel", "Studio A"}), "Studio A is idle.\n");
  EXPECT_EQ(request(), Array{pair("cancel", "Studio A")});
  EXPECT_EQ(cameraState("Studio A"), "idle");
  EXPECT_THAT(server_.episodes(), IsEmpty());
}

TEST_F(CameraTest, start_sendsNoDelay_unlessAskedFor) {
  startCamera();
  EXPECT_THAT(run({"camera", "start", "Studio A"}), FailedWith(36, "cannot start: it is recording"));
  EXPECT_EQ(request(), (Array{pair("start", "Studio A"), pair("delay", 0)}));
}

TEST_F(CameraTest, stop_submitsToAWorkflow) {
  startCamera();
  EXPECT_THAT(
      output({"camera", "stop", "Studio A", "--workflow", "single-video", "--title", "T", "--description", "D"}),
      StartsWith("Studio A stopped, its recording is submitted.\nEpisode  "));
  const auto words = request();
  EXPECT_EQ(words.front(), pair("stop", "Studio A"));
  EXPECT_EQ(words.back(), pair("workflow", "single-video"));
  EXPECT_EQ(cameraState("Studio A"), "idle");
  ASSERT_EQ(server_.episodes().size(), 1U);
  EXPECT_EQ(*server_.episodes()[0].dictionary("metadata"), (Dictionary{{"Title", "T"}, {"Description", "D"}}));
  EXPECT_THAT(filesIn(folder_ / "data/lumora"), IsEmpty());
}

TEST_F(CameraTest, stop_submitsToARecordingContainer) {
  const auto recording = reply({"recording", "create", "single-video"});
  const auto submission = *recording.array("submission_uuids")->at(0).string();
  startCamera();
  EXPECT_EQ(run({"camera", "stop", "Studio A", "--submission", submission}).status, 0);
  EXPECT_EQ(request().back(), pair("submission_uuid", submission));
  EXPECT_EQ(server_.episodes().size(), 1U);
}

TEST_F(CameraTest, stop_needsOnePlaceForTheRecording) {
  EXPECT_THAT(run({"camera", "stop", "Studio A"}), FailedWith(64, "needs --workflow WORKFLOW or --submission UUID"));
  EXPECT_THAT(run({"camera", "stop", "Studio A", "-w", "a", "--submission", "b"}), FailedWith(64, "only one of"));
  EXPECT_THAT(requests(), IsEmpty());
}

TEST_F(CameraTest, stop_saysSo_whenTheMetadataCannotBeWritten) {
  ::setenv("XDG_DATA_HOME", "/dev/null", 1);
  EXPECT_THAT(run({"camera", "stop", "Studio A", "-w", "single-video"}),
              FailedWith(73, "The metadata cannot be written below \"/dev/null\""));
  EXPECT_THAT(requests(), IsEmpty());
}

} // namespace
