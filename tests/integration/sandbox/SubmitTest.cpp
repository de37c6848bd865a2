#include "Requests.h"

using namespace lumora;
using namespace lumora::tests;
using testing::IsEmpty;
using testing::SizeIs;

namespace {

/// SHA-256 of "abc" (the first example of FIPS 180).
constexpr const char* digestOfABC = "ba7816bf8f01cfea414140de5dae2223b00361a396177a9cb410ff61f20015ad";

constexpr const char* recordingProperties =
    "<?xml version=\"1.0\"?>\n<LumoraServerAgentRecordingProperties>\n  <RecordingProperties>\n"
    "    <RecordingProperty key=\"RecordingMetadata_START_DATE\" value=\"2010-01-20 15:04:05 +0000\"/>\n"
    "    <RecordingProperty key=\"RecordingMetadata_DURATION\" value=\"12.5\"/>\n"
    "  </RecordingProperties>\n</LumoraServerAgentRecordingProperties>\n";

class Submit : public testing::Test {
protected:
  Array file() const { return pair("file", movie); }
  Array metadata() const { return pair("metadata", metadataPath); }
  ProgramRun submit(Array elements) const {
    elements.insert(elements.begin(), "submit");
    return server.request(asUser(server, elements));
  }
  ProgramRun submitWithRecordingMetadata(const std::string& text) const {
    const auto path = writeFile(server.folder() / "recording.xml", text);
    return submit({file(), metadata(), pair("recording_metadata", path), workflow});
  }
  std::vector<std::string> createRecording(const std::string& workflowName) const {
    const auto run =
        server.request(asUser(server, {"create_recording", Array{"workflow_uuid", server.workflowUUID(workflowName)}}));
    const auto reply = dictionaryWithXMLDescription(run.standardOutput).value();
    std::vector<std::string> uuids;
    for (const auto& uuid : *reply.array("submission_uuids")) {
      uuids.push_back(*uuid.string());
    }
    return uuids;
  }
  bool isStagingEmpty() const { return std::filesystem::is_empty(server.root() / "var/lib/lumora/incoming"); }

  SandboxServer server;
  std::filesystem::path movie = writeFile(server.folder() / "movie.mov", "abc");
  std::filesystem::path metadataPath = writeMetadata(server, "Lecture 1");
  Array workflow{"workflow", "single-video"};
};

} // namespace

TEST_F(Submit, episodeTellsEverything_whenAFileWasSubmitted) {
  ASSERT_THAT(submitWithRecordingMetadata(recordingProperties), Succeeded());
  const auto episodes = server.episodes();
  ASSERT_THAT(episodes, SizeIs(1));
  const auto& episode = episodes.front();
  EXPECT_EQ(episode.string("title"), "Lecture 1");
  EXPECT_EQ(episode.string("description"), "About it");
  EXPECT_EQ(episode.string("workflow"), "single-video");
  EXPECT_EQ(episode.string("workflow_uuid"), server.workflowUUID("single-video"));
  EXPECT_EQ(episode.string("user"), SandboxServer::userName);
  EXPECT_EQ(episode.string("state"), "completed");
  EXPECT_TRUE(episode.find("submitted")->date());
  EXPECT_EQ(*episode.dictionary("metadata"), (Dictionary{{"Title", "Lecture 1"}, {"Description", "About it"}}));
  EXPECT_EQ(*episode.dictionary("recording_metadata"),
            (Dictionary{{"RecordingMetadata_START_DATE", "2010-01-20 15:04:05 +0000"},
                        {"RecordingMetadata_DURATION", "12.5"}}));
}

TEST_F(Submit, fileIsStoredWithItsChecksum) {
  ASSERT_THAT(submit({file(), metadata(), workflow}), Succeeded());
  const auto stored = *server.episodes().at(0).array("files")->front().dictionary();
  EXPECT_EQ(stored.string("name"), "movie.mov");
  EXPECT_EQ(stored.find("size")->integer(), 3);
  EXPECT_EQ(stored.string("sha256"), digestOfABC);
  EXPECT_EQ(contentOf(stored.string("path").value()), "abc");
  EXPECT_TRUE(std::filesystem::exists(movie));
  EXPECT_TRUE(isStagingEmpty());
}

TEST_F(Submit, filesKeepTheirOrderAndNames_whenSeveralHaveOneName) {
  std::filesystem::create_directory(server.folder() / "other");
  const auto other = writeFile(server.folder() / "other/movie.mov", "other");
  ASSERT_THAT(submit({pair("file", other), file(), metadata(), workflow}), Succeeded());
  const auto files = *server.episodes().at(0).array("files");
  ASSERT_THAT(files, SizeIs(2));
  EXPECT_EQ(contentOf(files[0].dictionary()->string("path").value()), "other");
  EXPECT_EQ(contentOf(files[1].dictionary()->string("path").value()), "abc");
}

TEST_F(Submit, workflowIsFoundByItsUUIDToo) {
  ASSERT_THAT(submit({file(), metadata(), Array{"workflow", server.workflowUUID("audio-podcast")}}), Succeeded());
  EXPECT_EQ(server.episodes().at(0).string("workflow"), "audio-podcast");
}

TEST_F(Submit, sourceIsRemoved_whenAskedForAndOnlyAfterSuccess) {
  EXPECT_THAT(submit({Array{"delete"}, file(), metadata(), Array{"workflow", "none"}}), EndedWith(30, "no workflow"));
  EXPECT_TRUE(std::filesystem::exists(movie));
  EXPECT_THAT(submit({Array{"delete"}, file(), metadata(), workflow}), Succeeded());
  EXPECT_FALSE(std::filesystem::exists(movie));
}

TEST_F(Submit, sourcesStay_whenOneOfThemCannotBeCopied) {
  const auto missing = pair("file", server.folder() / "missing.mov");
  EXPECT_THAT(submit({Array{"delete"}, file(), missing, metadata(), workflow}), EndedWith(33, "missing.mov"));
  EXPECT_TRUE(std::filesystem::exists(movie));
  EXPECT_THAT(server.episodes(), IsEmpty());
}

TEST_F(Submit, submissionUUIDIsFiledIntoItsPlace) {
  const auto uuids = createRecording("camera-and-screen");
  ASSERT_THAT(submit({file(), metadata(), Array{"submission_uuid", uuids.at(1)}}), Succeeded());
  const auto episode = server.episodes().at(0);
  EXPECT_EQ(episode.string("submission_uuid"), uuids.at(1));
  EXPECT_EQ(episode.find("source_index")->integer(), 1);
  EXPECT_EQ(episode.string("workflow"), "camera-and-screen");
}

TEST_F(Submit, isStatus34_whenTheSubmissionUUIDWasFiledAlready) {
  const Array place{"submission_uuid", createRecording("single-video").at(0)};
  ASSERT_THAT(submit({file(), metadata(), place}), Succeeded());
  EXPECT_THAT(submit({file(), metadata(), place}), EndedWith(34, "was filed already"));
  EXPECT_THAT(server.episodes(), SizeIs(1));
}

TEST_F(Submit, isStatus34_whenTheSubmissionUUIDIsUnknown) {
  EXPECT_THAT(submit({file(), metadata(), Array{"submission_uuid", "none"}}), EndedWith(34, "no submission UUID"));
}

TEST_F(Submit, isStatus26_whenTheRecordingIsAnotherUsers) {
  const auto uuid = createRecording("single-video").at(0);
  ASSERT_THAT(server.administrate({"user", "add"}, {"eve"}, "apple\n"), Succeeded());
  const Array request{Array{"server", "localhost:8170"},
                      Array{"auth", "Password"},
                      Array{"user", "eve"},
                      Array{"pass", "apple"},
                      "submit",
                      file(),
                      metadata(),
                      Array{"submission_uuid", uuid}};
  EXPECT_THAT(server.request(request), EndedWith(26, "another user's recording"));
}

TEST_F(Submit, isStatus30_whenTheWorkflowIsUnknown) {
  EXPECT_THAT(submit({file(), metadata(), Array{"workflow", "none"}}), EndedWith(30, "no workflow \"none\""));
}

TEST_F(Submit, isStatus30_whenTheMetadataCannotBeRead) {
  for (const auto* text : {"", "no property list", "<plist version=\"1.0\"><array/></plist>"}) {
    writeFile(metadataPath, text);
    EXPECT_THAT(submit({file(), metadata(), workflow}), EndedWith(30, "not a property-list dictionary")) << text;
  }
  std::filesystem::remove(metadataPath);
  EXPECT_THAT(submit({file(), metadata(), workflow}), EndedWith(30, "cannot be read"));
  EXPECT_THAT(submit({file(), pair("metadata", server.folder()), workflow}), EndedWith(30, "cannot be read"));
  EXPECT_THAT(server.episodes(), IsEmpty());
}

TEST_F(Submit, recordingMetadataMayBeEmpty) {
  EXPECT_THAT(submitWithRecordingMetadata("<LumoraServerAgentRecordingProperties><RecordingProperties/>"
                                          "</LumoraServerAgentRecordingProperties>"),
              Succeeded());
}

TEST_F(Submit, isStatus30_whenTheRecordingMetadataIsMalformed) {
  const auto wrapped = [](const std::string& properties) {
    return "<LumoraServerAgentRecordingProperties><RecordingProperties>" + properties +
           "</RecordingProperties></LumoraServerAgentRecordingProperties>";
  };
  for (const auto& text :
       {std::string(), std::string("<x"), std::string("<LumoraServerAgentRecordingProperties/>"),
        std::string("<RecordingProperties/>"), wrapped("<RecordingProperty key=\"k\"/>"),
        wrapped("<RecordingProperty value=\"v\" key=\"k\"/>"), wrapped("<Other key=\"k\" value=\"v\"/>"),
        wrapped("<RecordingProperty key=\"k\" value=\"v\">x</RecordingProperty>"),
        wrapped("<RecordingProperty key=\"k\" value=\"v\" more=\"m\"/>"), wrapped("text"),
        wrapped("<RecordingProperty key=\"k\" value=\"v\"/><RecordingProperty key=\"k\" value=\"w\"/>")}) {
    EXPECT_EQ(submitWithRecordingMetadata(text).status, 30) << text;
  }
  EXPECT_THAT(server.episodes(), IsEmpty());
}

TEST_F(Submit, isStatus33_whenTheSourceIsNoRegularFile) {
  EXPECT_THAT(submit({pair("file", server.folder()), metadata(), workflow}), EndedWith(33, "not a regular file"));
  EXPECT_THAT(submit({pair("file", "/dev/null"), metadata(), workflow}), EndedWith(33, "not a regular file"));
}

TEST_F(Submit, auxiliaryToolSubmitsItsInputs) {
  const Array request{Array{"server", "localhost:8170"},
                      Array{"user", "ada"},
                      Array{"pass", SandboxServer::password},
                      Array{"subcommand", "workflow"},
                      workflow,
                      metadata(),
                      Array{"basedir", "/tmp"},
                      pair("input", movie),
                      pair("input", movie)};
  ASSERT_THAT(server.request(request, "lumaction"), Succeeded());
  EXPECT_THAT(*server.episodes().at(0).array("files"), SizeIs(2));
}
