#include "ClientTest.h"

#include <LumoraKit/platform/PropertyList.h>

using lumora::Array;
using lumora::Dictionary;
using lumora::tests::contentOf;
using lumora::tests::FailedWith;
using lumora::tests::pair;
using lumora::tests::SandboxServer;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;
using testing::StartsWith;

namespace {

class WorkflowTest : public lumora::tests::ClientTest {
protected:
  std::string uuid_ = server_.workflowUUID("single-video");

  std::string package(const std::string& name, bool isProtected = false) const {
    return file(name + ".plist",
                *lumora::xmlDescription(Dictionary{{"name", name},
                                                   {"title", "Title of " + name},
                                                   {"sources", Array{Dictionary{{"sourceTypes", Array{"Video"}}}}},
                                                   {"protected", isProtected}}));
  }
  std::string workflows() const { return server_.administrate({"workflow", "list"}).standardOutput; }
};

TEST_F(WorkflowTest, workflows_areATable) {
  const auto text = output({"workflows"});
  EXPECT_THAT(text, StartsWith("Name               Title              Takes           UUID\n"
                               "single-video       Single Video       Video or File   " +
                               uuid_ + "\n"));
  EXPECT_THAT(text, HasSubstr("camera-and-screen  Camera and Screen  Video + Screen  "));
  EXPECT_EQ(request(), Array{"listworkflows"});
}

TEST_F(WorkflowTest, workflows_comeWhole_asAPropertyListAndAsJSON) {
  const auto all = reply({"workflows"});
  ASSERT_NE(all.array("workflows"), nullptr);
  EXPECT_EQ(all.array("workflows")->size(), 5U);
  EXPECT_EQ(all.string("user_fullname"), SandboxServer::userFullName);
  EXPECT_THAT(output({"workflows", "--output=json"}), HasSubstr("\"uuid\": \"" + uuid_ + "\""));
}

TEST_F(WorkflowTest, info_describesOne_byUUIDAndByName) {
  EXPECT_THAT(output({"workflow", "info", uuid_}), StartsWith("Name       single-video\nTitle      Single Video\n"));
  EXPECT_EQ(request(), (Array{"infoworkflow", pair("workflow_uuid", uuid_)}));
  EXPECT_THAT(output({"workflow", "info", "single-video"}), HasSubstr("Protected  no\n"));
  EXPECT_EQ(requests(), (std::vector<Array>{{"listworkflows"}, {"infoworkflow", pair("workflow_uuid", uuid_)}}));
  EXPECT_THAT(run({"workflow", "info", "nothing"}), FailedWith(12, "there is no workflow with the UUID \"nothing\""));
}

TEST_F(WorkflowTest, install_addsAndReplacesAWorkflow) {
  const auto path = package("lectures");
  EXPECT_THAT(output({"workflow", "install", path}), StartsWith("Name       lectures\n"));
  EXPECT_EQ(request(), (Array{"installworkflow", pair("path", path)}));
  EXPECT_THAT(workflows(), HasSubstr("Title of lectures"));
  EXPECT_THAT(run({"workflow", "install", path}), FailedWith(12, "Invalid arguments: there is a workflow named"));
  requests();
  EXPECT_EQ(run({"workflow", "install", "--overwrite", path}).status, 0);
  EXPECT_EQ(request(), (Array{"installworkflow", pair("path", path), "overwrite"}));
}

TEST_F(WorkflowTest, install_takesARelativePath) {
  const auto result = lumora::tests::runToEnd({"/bin/sh", "-c", "cd \"$1\" && shift && exec \"$@\"", "sh",
                                               folder_.path().string(), LUMORA_CLIENT_PROGRAM, "workflow", "install",
                                               std::filesystem::path(package("lectures")).filename().string(),
                                               "--password-file", "password"});
  EXPECT_EQ(result.status, 0) << result.standardError;
  EXPECT_EQ(request(), (Array{"installworkflow", pair("path", (folder_ / "lectures.plist").string())}));
}

TEST_F(WorkflowTest, masterPassword_comesFromAFile) {
  server_.administrate({"master-password"}, {}, "pear\n");
  const auto path = package("secret", true);
  EXPECT_THAT(run({"workflow", "install", path}), FailedWith(26, "Not authorized"));
  requests();
  const auto master = file("master", "pear\nand more\n");
  EXPECT_EQ(run({"workflow", "install", path, "--master-password-file", master}).status, 0);
  EXPECT_EQ(request(), (Array{"installworkflow", pair("path", path), pair("master_password", "pear")}));
}

TEST_F(WorkflowTest, bothPasswords_comeFromStandardInputLineByLine) {
  server_.administrate({"master-password"}, {}, "pear\n");
  const auto result = lumora::tests::runToEnd({LUMORA_CLIENT_PROGRAM, "workflow", "install", package("secret", true),
                                               "--password-file", "-", "--master-password-file", "-"},
                                              std::string(SandboxServer::password) + "\npear\n");
  EXPECT_EQ(result.status, 0) << result.standardError;
  EXPECT_THAT(workflows(), HasSubstr("secret"));
}

TEST_F(WorkflowTest, download_writesTheFileWhole) {
  const auto path = (folder_ / "mine.plist").string();
  EXPECT_EQ(output({"workflow", "download", "single-video", path}), "Downloaded single-video to " + path + ".\n");
  EXPECT_EQ(lumora::dictionaryWithXMLDescription(contentOf(path))->string("name"), "single-video");
  EXPECT_THAT(output({"workflow", "download", uuid_, "-"}), Not(IsEmpty()));
  EXPECT_EQ(lumora::dictionaryWithXMLDescription(output({"workflow", "download", uuid_, "-"}))->string("name"),
            "single-video");
}

TEST_F(WorkflowTest, download_leavesTheOldFile_whenItFails) {
  std::filesystem::create_directories(folder_ / "out");
  const auto path = file("out/old.plist", "old");
  inject("failure", {"--command", "downloadworkflow", "--status", "33", "--message", "no room"});
  EXPECT_THAT(run({"workflow", "download", uuid_, path}), FailedWith(33, "File copy failed: no room."));
  inject("clear", {});
  inject("crash", {"--command", "downloadworkflow"});
  EXPECT_EQ(run({"workflow", "download", uuid_, path}).status, 139);
  EXPECT_EQ(contentOf(path), "old");
  EXPECT_THAT(filesIn(folder_ / "out"), ElementsAre("old.plist"));
}

TEST_F(WorkflowTest, delete_removesOne) {
  EXPECT_EQ(output({"workflow", "delete", "single-video"}), "Deleted single-video.\n");
  EXPECT_EQ(requests().back(), (Array{"deleteworkflow", pair("workflow_uuid", uuid_)}));
  EXPECT_THAT(workflows(), Not(HasSubstr("single-video")));
}

TEST_F(WorkflowTest, submit_runsTheAuxiliaryTool) {
  server_.administrate({"master-password"}, {}, "pear\n");
  ASSERT_EQ(
      run({"workflow", "install", package("secret", true), "--master-password-file", file("master", "pear\n")}).status,
      0);
  requests();
  const auto first = file("a.mov");
  const auto second = file("b.mov");
  EXPECT_THAT(output({"workflow", "submit", "single-video", first, second, "--title", "Lecture 1", "--metadata",
                      "Course=Sets", "--master-password-file", file("master", "pear\n")}),
              StartsWith("Submitted to single-video.\nEpisode  "));
  auto words = request();
  ASSERT_EQ(words.size(), 7U);
  EXPECT_EQ(words[0], pair("subcommand", "workflow"));
  EXPECT_EQ(words[1], pair("workflow", "single-video"));
  EXPECT_EQ(words[3], pair("basedir", "/tmp"));
  EXPECT_EQ(words[4], pair("master_password", "pear"));
  EXPECT_EQ(words[6], pair("input", second));
  ASSERT_EQ(server_.episodes().size(), 1U);
  EXPECT_EQ(*server_.episodes()[0].dictionary("metadata"), (Dictionary{{"Course", "Sets"}, {"Title", "Lecture 1"}}));
  EXPECT_THAT(filesIn(folder_ / "data/lumora"), IsEmpty());
}

TEST_F(WorkflowTest, recordingCreate_makesASubmissionForEachSource) {
  const auto recording = reply({"recording", "create", "camera-and-screen"});
  EXPECT_EQ(recording.array("submission_uuids")->size(), 2U);
  EXPECT_EQ(requests().back(),
            (Array{"create_recording", pair("workflow_uuid", server_.workflowUUID("camera-and-screen"))}));
  EXPECT_THAT(output({"recording", "create", uuid_}), StartsWith("Recording    "));
}

} // namespace
