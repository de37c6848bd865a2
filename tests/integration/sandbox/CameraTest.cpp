#include "MovieProbe.h"
#include "Requests.h"

#include <atomic>

using namespace lumora;
using namespace lumora::tests;
using testing::ElementsAre;
using testing::Gt;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::SizeIs;

namespace {

class Cameras : public testing::Test {
protected:
  Cameras() { EXPECT_THAT(server.administrate({"camera", "add"}, {camera}), Succeeded()); }

  ProgramRun request(const Array& elements) const { return server.request(asUser(server, elements)); }
  ProgramRun verb(const char* name) const { return request(Array(1, Value(Array{name, camera}))); }
  ProgramRun start(int delay = 0) const { return request({Array{"start", camera}, Array{"delay", delay}}); }
  ProgramRun startAudioOnly() const { return request({Array{"start", camera}, Array{"delay", 0}, "audio_only"}); }
  ProgramRun stopInto(const Array& target) const {
    return request({Array{"stop", camera}, pair("metadata", metadata), target});
  }
  ProgramRun stop() const { return stopInto({"workflow", "single-video"}); }

  Dictionary status() const { return replyTo(verb("status")); }
  std::string state() const { return status().string("state").value_or(""); }
  std::string createRecording() const {
    const auto reply =
        replyTo(request({"create_recording", Array{"workflow_uuid", server.workflowUUID("camera-and-screen")}}));
    return *reply.array("submission_uuids")->at(1).string();
  }
  /// The one file that was filed.
  Dictionary filed() const { return *server.episodes().at(0).array("files")->front().dictionary(); }

  static constexpr const char* camera = "Studio A";
  SandboxServer server;
  std::filesystem::path metadata = writeMetadata(server, "Lecture 1");
};

/// Brings the camera into a state and tries what the state forbids.
struct Forbidden {
  const char* state;
  const char* verb;
};

class ForbiddenVerb : public Cameras, public testing::WithParamInterface<Forbidden> {
protected:
  void bringInto(const std::string& state) const {
    if (state != "idle") {
      ASSERT_THAT(start(), Succeeded());
    }
    if (state == "paused") {
      ASSERT_THAT(verb("pause"), Succeeded());
    }
  }
  ProgramRun attempt(const std::string& name) const {
    if (name == "start") {
      return start();
    }
    return name == "stop" ? stop() : verb(name.c_str());
  }
};

} // namespace

TEST_P(ForbiddenVerb, isStatus36WithTheStateAsReason) {
  const auto [state, name] = GetParam();
  bringInto(state);
  EXPECT_THAT(attempt(name), EndedWith(36, "\"Studio A\" cannot " + std::string(name) + ": it is " + state));
  EXPECT_EQ(this->state(), state);
  EXPECT_THAT(server.episodes(), IsEmpty());
}

INSTANTIATE_TEST_SUITE_P(Table, ForbiddenVerb,
                         testing::Values(Forbidden{"idle", "pause"}, Forbidden{"idle", "resume"},
                                         Forbidden{"idle", "cancel"}, Forbidden{"idle", "stop"},
                                         Forbidden{"recording", "start"}, Forbidden{"recording", "resume"},
                                         Forbidden{"paused", "start"}, Forbidden{"paused", "pause"}));

TEST_F(Cameras, isStatus36_whenThereIsNoSuchCamera) {
  ASSERT_THAT(server.administrate({"camera", "remove"}, {camera}), Succeeded());
  for (const auto* name : {"status", "pause", "resume", "cancel"}) {
    EXPECT_THAT(verb(name), EndedWith(36, "no remote camera named \"Studio A\"")) << name;
  }
  EXPECT_THAT(start(), EndedWith(36, "no remote camera"));
  EXPECT_THAT(stop(), EndedWith(36, "no remote camera"));
}

TEST_F(Cameras, areListedWithTheirStates) {
  ASSERT_THAT(server.administrate({"camera", "add"}, {"Hall"}), Succeeded());
  ASSERT_THAT(start(), Succeeded());
  const auto cameras = *replyTo(request({"listcameras"})).array("cameras");
  ASSERT_THAT(cameras, SizeIs(2));
  EXPECT_EQ(cameras[0].dictionary()->string("name"), "Hall");
  EXPECT_EQ(cameras[0].dictionary()->string("state"), "idle");
  EXPECT_EQ(cameras[1].dictionary()->string("name"), camera);
  EXPECT_EQ(cameras[1].dictionary()->string("state"), "recording");
  EXPECT_EQ(server.administrate({"camera", "list"}).standardOutput, "Hall\tidle\t\nStudio A\trecording\tada\n");
}

TEST_F(Cameras, startRepliesOnlyWhenTheDelayIsOver) {
  const auto reply = replyTo(start(1));
  EXPECT_EQ(reply.string("state"), "recording");
  EXPECT_EQ(reply.string("user"), SandboxServer::userName);
}

TEST_F(Cameras, onlyCancelIsAllowed_whileStarting) {
  ProgramRun started;
  std::thread starter([&] { started = start(3600); });
  EXPECT_TRUE(waitUntil([&] { return state() == "starting"; }));
  for (const auto* name : {"pause", "resume"}) {
    EXPECT_THAT(verb(name), EndedWith(36, "it is starting")) << name;
  }
  EXPECT_THAT(start(), EndedWith(36, "it is starting"));
  EXPECT_THAT(stop(), EndedWith(36, "it is starting"));
  EXPECT_THAT(verb("cancel"), Succeeded());
  starter.join();
  EXPECT_THAT(started, EndedWith(36, "did not start: its recording was cancelled"));
  EXPECT_EQ(state(), "idle");
}

TEST_F(Cameras, isStatus36_whenTheDelayIsLongerThanADay) {
  EXPECT_THAT(start(86'401), EndedWith(36, "longer than a day"));
  EXPECT_EQ(state(), "idle");
}

TEST_F(Cameras, recordsNothing_whilePaused) {
  ASSERT_THAT(start(), Succeeded());
  ASSERT_THAT(verb("pause"), Succeeded());
  const auto recorded = status().find("recorded")->real();
  EXPECT_EQ(status().find("recorded")->real(), recorded);
  ASSERT_THAT(verb("resume"), Succeeded());
  EXPECT_TRUE(waitUntil([&] { return status().find("recorded")->real() > recorded; }));
}

TEST_F(Cameras, stopFilesTheRecordingIntoTheWorkflow) {
  ASSERT_THAT(start(), Succeeded());
  const auto reply = replyTo(stop());
  const auto episode = server.episodes().at(0);
  EXPECT_EQ(episode.string("uuid"), reply.string("uuid"));
  EXPECT_EQ(episode.string("title"), "Lecture 1");
  EXPECT_EQ(episode.string("workflow"), "single-video");
  EXPECT_EQ(filed().string("name"), "Studio A.mov");
  const auto& properties = *episode.dictionary("recording_metadata");
  for (const auto* key : {"RecordingMetadata_START_DATE", "RecordingMetadata_END_DATE", "RecordingMetadata_DURATION"}) {
    EXPECT_TRUE(properties.string(key)) << key;
  }
  EXPECT_EQ(state(), "idle");
}

TEST_F(Cameras, movieIsAsLongAsTheRecording) {
  ASSERT_THAT(start(), Succeeded());
  ASSERT_TRUE(waitUntil([&] { return status().find("recorded")->real() > 0.3; }));
  ASSERT_THAT(verb("pause"), Succeeded());
  const double recorded = status().find("recorded")->real().value();
  ASSERT_THAT(stop(), Succeeded());
  LUMORA_PROBE_OR_SKIP(probe, filed().string("path").value());
  EXPECT_THAT(probe.codecs, ElementsAre("png", "pcm_s16le"));
  EXPECT_NEAR(probe.duration, recorded, 0.001);
}

TEST_F(Cameras, movieHasOnlySound_whenStartedAudioOnly) {
  ASSERT_THAT(startAudioOnly(), Succeeded());
  EXPECT_EQ(status().find("audio_only")->boolean(), true);
  ASSERT_THAT(stop(), Succeeded());
  LUMORA_PROBE_OR_SKIP(probe, filed().string("path").value());
  EXPECT_THAT(probe.codecs, ElementsAre("pcm_s16le"));
}

TEST_F(Cameras, stopFilesIntoTheSubmissionUUID) {
  const auto uuid = createRecording();
  ASSERT_THAT(start(), Succeeded());
  ASSERT_THAT(stopInto({"submission_uuid", uuid}), Succeeded());
  EXPECT_EQ(server.episodes().at(0).string("submission_uuid"), uuid);
  EXPECT_EQ(server.episodes().at(0).find("source_index")->integer(), 1);
}

TEST_F(Cameras, goesOnRecordingAndCanBeStoppedAgain_whenItsStopFailed) {
  ASSERT_THAT(start(), Succeeded());
  EXPECT_THAT(stopInto({"submission_uuid", "none"}), EndedWith(34, "no submission UUID"));
  EXPECT_THAT(stopInto({"workflow", "none"}), EndedWith(30, "no workflow"));
  EXPECT_EQ(state(), "recording");
  EXPECT_THAT(stop(), Succeeded());
  EXPECT_THAT(server.episodes(), SizeIs(1));
}

TEST_F(Cameras, oneRecordingIsFiled_whenManyStopItAtOnce) {
  ASSERT_THAT(start(), Succeeded());
  std::atomic<int> filedRuns{0};
  std::vector<std::thread> threads;
  for (int index = 0; index < 8; ++index) {
    threads.emplace_back([&] {
      const auto run = stop();
      filedRuns += run.status == 0 ? 1 : 0;
      EXPECT_THAT(run.status, testing::AnyOf(0, 36)) << run.standardError;
    });
  }
  for (auto& thread : threads) {
    thread.join();
  }
  EXPECT_EQ(filedRuns, 1);
  EXPECT_THAT(server.episodes(), SizeIs(1));
}

TEST_F(Cameras, oneStartSucceeds_whenManyStartItAtOnce) {
  std::atomic<int> succeeded{0};
  std::vector<std::thread> threads;
  for (int index = 0; index < 8; ++index) {
    threads.emplace_back([&] { succeeded += start().status == 0 ? 1 : 0; });
  }
  for (auto& thread : threads) {
    thread.join();
  }
  EXPECT_EQ(succeeded, 1);
}

TEST_F(Cameras, cancelDiscardsTheRecording) {
  for (const bool isPaused : {false, true}) {
    ASSERT_THAT(start(), Succeeded());
    if (isPaused) {
      ASSERT_THAT(verb("pause"), Succeeded());
    }
    EXPECT_EQ(replyTo(verb("cancel")).string("state"), "idle");
  }
  EXPECT_THAT(server.episodes(), IsEmpty());
}

TEST_F(Cameras, isStatus26_whenItRecordsForAnotherUser) {
  ASSERT_THAT(server.administrate({"user", "add"}, {"eve"}, "apple\n"), Succeeded());
  ASSERT_THAT(start(), Succeeded());
  const auto asEve = [&](const Array& elements) { return server.request(asUser("eve", "apple", elements)); };
  EXPECT_THAT(asEve(Array(1, Value(Array{"cancel", camera}))), EndedWith(26, "records for another user"));
  EXPECT_EQ(replyTo(asEve(Array(1, Value(Array{"status", camera})))).string("user"), "ada");
}

TEST_F(Cameras, administrationRefusesASecondCameraOfOneName) {
  EXPECT_THAT(server.administrate({"camera", "add"}, {camera}), EndedWith(1, "a camera named \"Studio A\" already"));
  ASSERT_THAT(server.administrate({"camera", "remove"}, {camera}), Succeeded());
  EXPECT_THAT(server.administrate({"camera", "remove"}, {camera}), EndedWith(1, "no camera named Studio A"));
}
