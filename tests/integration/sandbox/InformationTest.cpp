#include "Requests.h"

#include <unistd.h>

using namespace lumora;
using namespace lumora::tests;
using testing::ElementsAre;
using testing::SizeIs;

namespace {

Array listInfo(const std::string& address) {
  return {"listinfo", Array{"server", address}};
}

std::vector<std::string> names(const Array& descriptions) {
  std::vector<std::string> all;
  for (const auto& description : descriptions) {
    all.push_back(description.dictionary()->string("name").value());
  }
  return all;
}

} // namespace

TEST(ListInfo, tellsAuthenticationAndVersion) {
  const SandboxServer server;
  const auto reply = replyTo(server.request(listInfo("localhost:8170")));
  EXPECT_EQ(*reply.array("http_auth_type"), (Array{"basic", "digest"}));
  EXPECT_EQ(reply.string("server_version"), "2.0.1");
}

TEST(ListInfo, answersUnderEachOfTheServersNames) {
  const SandboxServer server;
  std::string machine(256, '\0');
  ASSERT_EQ(gethostname(machine.data(), machine.size() - 1), 0);
  machine.resize(machine.find('\0'));
  for (const auto& host : {std::string("localhost"), std::string("127.0.0.1"), std::string("sandbox.local"), machine}) {
    EXPECT_THAT(server.request(listInfo(host + ":8170")), Succeeded()) << host;
  }
}

TEST(ListInfo, port0IsTheDefaultPort) {
  const SandboxServer server;
  EXPECT_THAT(server.request(listInfo("localhost:0")), Succeeded());
}

TEST(ListInfo, isStatus21_whenTheHostIsAnother) {
  const SandboxServer server;
  EXPECT_THAT(server.request(listInfo("elsewhere.example:8170")), EndedWith(21, "no server at \"elsewhere.example\""));
}

TEST(ListInfo, isStatus20_whenNothingListensOnThePort) {
  const SandboxServer server({"--port", "9000"});
  EXPECT_THAT(server.request(listInfo("localhost:9000")), Succeeded());
  EXPECT_THAT(server.request(listInfo("localhost:8170")), EndedWith(20, "port 8170 of localhost"));
  EXPECT_THAT(server.request(listInfo("localhost:0")), EndedWith(20, "port 8170 of localhost"));
}

TEST(ListWorkflows, tellsWorkflowsAndUser) {
  const SandboxServer server;
  const auto reply = replyTo(server.request(asUser(server, {"listworkflows"})));
  EXPECT_THAT(names(*reply.array("workflows")),
              ElementsAre("single-video", "screen-recording", "audio-podcast", "camera-and-screen", "folder-of-files"));
  EXPECT_EQ(reply.string("user_shortname"), SandboxServer::userName);
  EXPECT_EQ(reply.string("user_fullname"), SandboxServer::userFullName);
  EXPECT_EQ(reply.string("server"), "LumoraServer");
}

TEST(ListWorkflows, describesEachSource) {
  const SandboxServer server;
  const auto reply = replyTo(server.request(asUser(server, {"listworkflows"})));
  const auto& dual = *reply.array("workflows")->at(3).dictionary();
  EXPECT_EQ(dual.string("title"), "Camera and Screen");
  EXPECT_EQ(*dual.array("sources"), (Array{Dictionary{{"sourceTypes", Array{"Video"}}, {"isFolder", false}},
                                           Dictionary{{"sourceTypes", Array{"Screen"}}, {"isFolder", false}}}));
  const auto& folder = *reply.array("workflows")->at(4).dictionary();
  EXPECT_EQ(folder.array("sources")->front(), Value(Dictionary{{"sourceTypes", Array{"File"}}, {"isFolder", true}}));
}

TEST(ListWorkflows, namesALibraryServer) {
  const SandboxServer server({"--library-server"});
  EXPECT_EQ(replyTo(server.request(asUser(server, {"listworkflows"}))).string("server"), "LumoraLibrary");
}

TEST(ListWorkflows, execToolAnswersLikeTheMainTool) {
  const SandboxServer server;
  const auto request = asUser(server, {"listworkflows"});
  EXPECT_EQ(server.request(request, "lumexec").standardOutput, server.request(request).standardOutput);
}

TEST(Login, isStatus26_whenPasswordOrUserIsWrong) {
  const SandboxServer server;
  for (const auto& [user, password] :
       {std::pair("ada", "wrong"), std::pair("ada", ""), std::pair("nobody", "correct horse"),
        std::pair("", "correct horse"), std::pair("ADA", "correct horse")}) {
    auto request = asUser(server, {"listworkflows"});
    request[2] = Array{"user", user};
    request[3] = Array{"pass", password};
    EXPECT_THAT(server.request(request), EndedWith(26, "wrong user name or password")) << user << ' ' << password;
  }
}

TEST(Login, isStatus26_whenTheUserWasRemoved) {
  const SandboxServer server;
  ASSERT_THAT(server.administrate({"user", "remove"}, {"ada"}), Succeeded());
  EXPECT_THAT(server.request(asUser(server, {"listworkflows"})), EndedWith(26, "wrong user name"));
}

TEST(Login, isStatus26_whenTheServerHasNoSingleSignOn) {
  const SandboxServer server;
  EXPECT_THAT(server.request({Array{"server", "localhost:8170"}, Array{"auth", "Kerberos"}, "listworkflows"}),
              EndedWith(26, "no single sign-on"));
}

TEST(Login, addressIsCheckedBeforeThePassword) {
  const SandboxServer server;
  auto request = asUser(server, {"listworkflows"});
  request[0] = Array{"server", "elsewhere.example:8170"};
  request[3] = Array{"pass", "wrong"};
  EXPECT_THAT(server.request(request), EndedWith(21, "elsewhere.example"));
}

TEST(Login, isStatus12_whenTheCommandHasNoneOrNeedsNone) {
  const SandboxServer server;
  EXPECT_THAT(server.request({"listworkflows"}), EndedWith(12, "needs a server and a login"));
  EXPECT_THAT(server.request(asUser(server, listInfo("localhost:8170"))), EndedWith(12, "takes no login"));
}

TEST(InfoWorkflow, describesOneWorkflow) {
  const SandboxServer server;
  const auto uuid = server.workflowUUID("audio-podcast");
  const auto reply = replyTo(server.request(asUser(server, {"infoworkflow", Array{"workflow_uuid", uuid}})));
  EXPECT_EQ(reply.string("name"), "audio-podcast");
  EXPECT_EQ(reply.string("uuid"), uuid);
}

TEST(InfoWorkflow, isStatus12_whenThereIsNoneWithTheUUID) {
  const SandboxServer server;
  for (const auto* uuid : {"no-such-uuid", "audio-podcast"}) {
    EXPECT_THAT(server.request(asUser(server, {"infoworkflow", Array{"workflow_uuid", uuid}})),
                EndedWith(12, "no workflow with the UUID"));
  }
}

TEST(CreateRecording, givesOneSubmissionUUIDForEachSource) {
  const SandboxServer server;
  const std::vector<std::pair<std::string, std::size_t>> expected{{"single-video", 1}, {"camera-and-screen", 2}};
  for (const auto& [name, count] : expected) {
    const auto reply = replyTo(
        server.request(asUser(server, {"create_recording", Array{"workflow_uuid", server.workflowUUID(name)}})));
    EXPECT_TRUE(reply.string("recording_uuid"));
    EXPECT_THAT(*reply.array("submission_uuids"), SizeIs(count)) << name;
  }
}

TEST(CreateRecording, isStatus12_whenTheWorkflowIsUnknown) {
  const SandboxServer server;
  EXPECT_THAT(server.request(asUser(server, {"create_recording", Array{"workflow_uuid", "no-such-uuid"}})),
              EndedWith(12, "no workflow with the UUID"));
}
