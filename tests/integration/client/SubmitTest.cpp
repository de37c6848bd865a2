#include "ClientTest.h"

#include <LumoraKit/platform/PropertyList.h>

#include <thread>

using lumora::Array;
using lumora::Dictionary;
using lumora::tests::FailedWith;
using lumora::tests::pair;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::SizeIs;
using testing::StartsWith;

namespace {

class SubmitTest : public lumora::tests::ClientTest {
protected:
  using ClientTest::ClientTest;

  /// The state of the only transfer, once it has ended.
  std::string endOfTransfer() const {
    for (;;) {
      const auto all = reply({"transfers"});
      const auto* transfer = all.array("uploads")->at(0).dictionary();
      if (transfer->contains("ended")) {
        return transfer->string("state").value();
      }
      std::this_thread::yield();
    }
  }

  std::string movie_ = file("lecture.mov", "a movie");
};

TEST_F(SubmitTest, submit_sendsAFileWithAllThatIsKnownOfIt) {
  EXPECT_EQ(output({"submit", movie_, "--workflow", "single-video", "--title", "Lecture 1", "--description", "Sets",
                    "--metadata", "Course=Logic=2", "--recording-start", "2026-11-21T09:30:00+01:00", "--recording-end",
                    "2026-11-21T09:00:00Z", "--recording-duration", "1799.5", "--recording-metadata", "Room=4"}),
            "Submitted " + movie_ + " to single-video.\n");
  const auto words = request();
  ASSERT_EQ(words.size(), 5U);
  EXPECT_EQ(words[0], lumora::Value("submit"));
  EXPECT_EQ(words[1], pair("file", movie_));
  EXPECT_EQ(words[4], pair("workflow", "single-video"));
  const auto episodes = server_.episodes();
  ASSERT_THAT(episodes, SizeIs(1));
  EXPECT_EQ(*episodes[0].dictionary("metadata"),
            (Dictionary{{"Course", "Logic=2"}, {"Title", "Lecture 1"}, {"Description", "Sets"}}));
  EXPECT_EQ(*episodes[0].dictionary("recording_metadata"),
            (Dictionary{{"Room", "4"},
                        {"RecordingMetadata_START_DATE", "2026-11-21 08:30:00 +0000"},
                        {"RecordingMetadata_END_DATE", "2026-11-21 09:00:00 +0000"},
                        {"RecordingMetadata_DURATION", "1799.5"}}));
  EXPECT_THAT(filesIn(folder_ / "data/lumora"), IsEmpty());
  EXPECT_TRUE(std::filesystem::exists(movie_));
}

TEST_F(SubmitTest, submit_printsAnEmptyReply_whenThereIsNone) {
  EXPECT_EQ(output({"submit", movie_, "-w", "single-video", "-o", "json"}), "{}\n");
  EXPECT_EQ(reply({"submit", movie_, "-w", "single-video"}), Dictionary());
}

TEST_F(SubmitTest, submit_removesTheFile_whenAskedTo) {
  EXPECT_EQ(run({"submit", movie_, "-w", "single-video", "--delete"}).status, 0);
  EXPECT_EQ(request()[1], pair("delete"));
  EXPECT_FALSE(std::filesystem::exists(movie_));
}

TEST_F(SubmitTest, submit_sendsSeveralFilesAsOneEpisode) {
  const auto notes = file("notes.pdf");
  EXPECT_EQ(output({"submit", movie_, notes, "-w", "folder-of-files"}), "Submitted 2 files to folder-of-files.\n");
  const auto words = request();
  EXPECT_EQ(words[1], pair("file", movie_));
  EXPECT_EQ(words[2], pair("file", notes));
  EXPECT_THAT(server_.episodes(), SizeIs(1));
}

TEST_F(SubmitTest, submit_fillsARecordingContainer) {
  const auto recording = reply({"recording", "create", "single-video"});
  const auto submission = *recording.array("submission_uuids")->at(0).string();
  requests();
  EXPECT_EQ(output({"submit", movie_, "--submission", submission}),
            "Submitted " + movie_ + " to the submission " + submission + ".\n");
  EXPECT_EQ(request().back(), pair("submission_uuid", submission));
  EXPECT_THAT(run({"submit", movie_, "--submission", submission}), FailedWith(34, "Failed to complete submission: "));
}

TEST_F(SubmitTest, submit_takesSeveralFilesForAWorkflowOnly) {
  EXPECT_THAT(run({"submit", movie_, movie_, "--submission", "U"}), FailedWith(64, "Several files"));
  EXPECT_THAT(run({"submit", movie_, movie_, "-w", "w", "--recording-duration", "2"}), FailedWith(64, "Several files"));
  EXPECT_THAT(requests(), IsEmpty());
}

TEST_F(SubmitTest, transfers_tellOfAsynchronousSubmissions) {
  EXPECT_EQ(output({"transfers"}), "There are no transfers.\n");
  EXPECT_EQ(request(), Array{"list_uploads"});
  EXPECT_THAT(output({"submit", movie_, "-w", "single-video", "--async", "--title", "Lecture 1"}),
              StartsWith("Submitting " + movie_ + " to single-video; "));
  EXPECT_EQ(request()[1], pair("async"));
  EXPECT_EQ(endOfTransfer(), "completed");
  EXPECT_THAT(output({"transfers"}),
              StartsWith("State      Title      Workflow      User  Files  Sent  Size  Started"));
  EXPECT_THAT(output({"transfers"}), HasSubstr("\ncompleted  Lecture 1  single-video  ada   1      7 B   7 B   20"));
  requests();
  EXPECT_EQ(output({"transfers", "clear"}), "Forgot 1 transfer that had ended.\n");
  EXPECT_EQ(request(), Array{"clear_completed_uploads"});
  EXPECT_EQ(output({"transfers"}), "There are no transfers.\n");
}

TEST_F(SubmitTest, transfers_tellWhyOneFailed) {
  inject("failure", {"--command", "transfer", "--status", "32", "--message", "the disk is full"});
  EXPECT_EQ(run({"submit", movie_, "-w", "single-video", "--async"}).status, 0);
  EXPECT_EQ(endOfTransfer(), "failed");
  EXPECT_THAT(output({"transfers"}), HasSubstr("the disk is full\n"));
}

TEST_F(SubmitTest, toolsStatusIsTheProgramsOwn) {
  for (const int status : {1, 10, 25, 31, 37, 200}) {
    inject("clear", {});
    inject("failure", {"--command", "submit", "--status", std::to_string(status), "--message", "it rains"});
    EXPECT_THAT(run({"submit", movie_, "-w", "single-video"}), FailedWith(status, ": it rains."));
  }
  inject("clear", {});
  inject("crash", {"--command", "submit", "--signal", "11"});
  EXPECT_EQ(run({"submit", movie_, "-w", "single-video"}).status, 139);
}

class LibraryServerTest : public SubmitTest {
protected:
  LibraryServerTest() : SubmitTest({"--library-server"}) {}
};

TEST_F(LibraryServerTest, submit_sendsSeveralFilesSynchronously) {
  EXPECT_EQ(run({"submit", movie_, file("b.mov"), "-w", "folder-of-files", "--async"}).status, 0);
  const auto all = requests();
  ASSERT_THAT(all, SizeIs(3));
  EXPECT_EQ(all[2][1], pair("file", movie_));
  EXPECT_THAT(server_.episodes(), SizeIs(1));
}

} // namespace
