#include "Requests.h"

#include <LumoraKit/platform/Platform.h>

using namespace lumora;
using namespace lumora::tests;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;

namespace {

ProgramRun run(const std::vector<std::string>& arguments, const std::string& input = {}) {
  ProgramRun result;
  result.status = Platform::current().toolRunner->run(LUMORA_SANDBOX_PROGRAM, arguments, input, result.standardOutput,
                                                      result.standardError);
  return result;
}

} // namespace

TEST(Administration, createRefuses_whenThereIsAServerAlready) {
  const SandboxServer server;
  EXPECT_THAT(server.administrate({"create"}), EndedWith(1, "there is a server at"));
  EXPECT_EQ(server.administrate({"user", "list"}).standardOutput, "ada\tAda Lovelace\n");
}

TEST(Administration, createLeavesNothing_whenThereIsNoPassword) {
  const SandboxServer server;
  const auto root = server.folder() / "another";
  EXPECT_THAT(run({"create", root.string(), "--user", "eve"}), EndedWith(1, "no password was given"));
  EXPECT_THAT(run({"create", root.string(), "--user", "eve", "--password-file", "/nonexistent"}),
              EndedWith(1, "the password file /nonexistent cannot be read"));
  EXPECT_FALSE(std::filesystem::exists(root));
}

TEST(Administration, createFails_whenTheFolderCannotBeMade) {
  const SandboxServer server;
  const auto file = writeFile(server.folder() / "file", "");
  EXPECT_THAT(run({"create", (file / "root").string()}), EndedWith(1, "Not a directory"));
}

TEST(Administration, passwordIsReadFromItsFile) {
  const SandboxServer server;
  const auto file = writeFile(server.folder() / "password", "apple\n");
  ASSERT_THAT(server.administrate({"user", "add"}, {"ada", "--password-file", file.string()}), Succeeded());
  auto request = asUser(server, {"listworkflows"});
  request[3] = Array{"pass", "apple"};
  EXPECT_THAT(server.request(request), Succeeded());
}

TEST(Administration, passwordIsKeptAsAHashOnly) {
  const SandboxServer server;
  for (const auto& entry : std::filesystem::recursive_directory_iterator(server.root() / "var")) {
    if (entry.is_regular_file()) {
      EXPECT_THAT(contentOf(entry.path()), Not(HasSubstr(SandboxServer::password))) << entry.path();
    }
  }
}

TEST(Administration, usersAreAddedAndRemoved) {
  const SandboxServer server;
  ASSERT_THAT(server.administrate({"user", "add"}, {"eve", "--full-name", "Eve"}, "apple\n"), Succeeded());
  EXPECT_EQ(server.administrate({"user", "list"}).standardOutput, "ada\tAda Lovelace\neve\tEve\n");
  ASSERT_THAT(server.administrate({"user", "remove"}, {"ada"}), Succeeded());
  EXPECT_EQ(server.administrate({"user", "list"}).standardOutput, "eve\tEve\n");
  EXPECT_THAT(server.administrate({"user", "remove"}, {"ada"}), EndedWith(1, "there is no user named ada"));
}

TEST(Administration, workflowsAreAddedAndRemoved) {
  const SandboxServer server;
  const auto added = server.administrate(
      {"workflow", "add"}, {"two-cameras", "--title", "Two Cameras", "--source", "Video", "--source", "Video,File"});
  ASSERT_THAT(added, Succeeded());
  EXPECT_EQ(server.workflowUUID("two-cameras") + "\n", added.standardOutput);
  EXPECT_THAT(server.administrate({"workflow", "list"}).standardOutput,
              HasSubstr("\ttwo-cameras\tTwo Cameras\tVideo + Video,File\n"));
  EXPECT_THAT(server.administrate({"workflow", "add"}, {"two-cameras", "--source", "Video"}),
              EndedWith(1, "there is a workflow named two-cameras already"));
  ASSERT_THAT(server.administrate({"workflow", "remove"}, {"two-cameras"}), Succeeded());
  EXPECT_THAT(server.administrate({"workflow", "remove"}, {"two-cameras"}), EndedWith(1, "there is no workflow"));
}

TEST(Administration, workflowIsRefused_whenASourceTypeIsUnknown) {
  const SandboxServer server;
  EXPECT_THAT(server.administrate({"workflow", "add"}, {"w", "--source", "video"}),
              EndedWith(1, "\"video\" is not a source type"));
}

TEST(Administration, episodesAreTold_inWords) {
  const SandboxServer server;
  EXPECT_EQ(server.administrate({"episodes"}).standardOutput, "0 episodes\n");
  const auto file = writeFile(server.folder() / "movie.mov", "abc");
  ASSERT_THAT(server.request(asUser(server, {"submit", pair("file", file), pair("metadata", writeMetadata(server)),
                                             Array{"workflow", "single-video"}})),
              Succeeded());
  const auto told = server.administrate({"episodes"}).standardOutput;
  for (const auto* part : {"  title         Title\n", "  user          ada\n", "    Description = About it\n",
                           "movie.mov, 3 bytes\n", "sha256 ba7816bf", "\n1 episode\n"}) {
    EXPECT_THAT(told, HasSubstr(part));
  }
}

TEST(Administration, isStatus1_whenThereIsNoServer) {
  const SandboxServer server;
  const std::string nowhere = (server.folder() / "nowhere").string();
  for (const auto& command : std::vector<std::vector<std::string>>{{"episodes", nowhere},
                                                                   {"user", "list", nowhere},
                                                                   {"workflow", "list", nowhere},
                                                                   {"inject", "list", nowhere},
                                                                   {"agent", nowhere}}) {
    EXPECT_THAT(run(command), EndedWith(1, "there is no server at"));
  }
  EXPECT_FALSE(std::filesystem::exists(nowhere));
}

TEST(Administration, isStatus2_whenUsedWrongly) {
  for (const auto& command : std::vector<std::vector<std::string>>{{},
                                                                   {"frobnicate"},
                                                                   {"create"},
                                                                   {"episodes"},
                                                                   {"create", "/tmp/x", "--port", "65536"},
                                                                   {"create", "/tmp/x", "--no"}}) {
    const auto wrong = run(command);
    EXPECT_EQ(wrong.status, 2);
    EXPECT_THAT(wrong.standardError, Not(IsEmpty()));
  }
}

TEST(Administration, explainsItself_whenAskedForHelp) {
  for (const auto& command : std::vector<std::vector<std::string>>{
           {"--help"}, {"create", "--help"}, {"user", "add", "--help"}, {"inject", "failure", "--help"}}) {
    const auto help = run(command);
    EXPECT_THAT(help, Succeeded());
    EXPECT_THAT(help.standardOutput, HasSubstr("Usage: lumora-sandbox"));
  }
}
