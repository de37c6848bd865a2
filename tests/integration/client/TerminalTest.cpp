#include "ClientTest.h"

#include <csignal>
#include <fstream>
#include <sstream>
#include <thread>

using lumora::tests::ClientProcess;
using lumora::tests::FailedWith;
using lumora::tests::SandboxServer;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;

namespace {

constexpr auto hasTerminal = ClientProcess::Terminal::Controlling;
constexpr const char* controlC = "\x03";
constexpr const char* controlD = "\x04";

/// Whether a process of the session is left, dead ones that nobody asked about excepted.
bool isAnybodyLeft(pid_t session) {
  for (const auto& entry : std::filesystem::directory_iterator("/proc")) {
    std::ifstream file(entry.path() / "stat");
    std::string content;
    std::getline(file, content);
    const auto name = content.rfind(')');
    if (name == std::string::npos) {
      continue;
    }
    std::istringstream fields(content.substr(name + 1));
    char state = 0;
    pid_t parent = 0;
    pid_t group = 0;
    pid_t ofSession = 0;
    fields >> state >> parent >> group >> ofSession;
    if (ofSession == session && state != 'Z') {
      return true;
    }
  }
  return false;
}

class TerminalTest : public lumora::tests::ClientTest {
protected:
  static std::vector<std::string> plainly(std::vector<std::string> arguments) {
    arguments.insert(arguments.begin(), LUMORA_CLIENT_PROGRAM);
    return arguments;
  }
  /// Until a tool has got its request.
  void waitForTool() const {
    while (filesIn(folder_ / "requests").empty()) {
      std::this_thread::yield();
    }
  }
  static constexpr const char* prompt = "Password of ada at localhost: ";
};

TEST_F(TerminalTest, password_isAskedForWithoutShowingIt) {
  ClientProcess client(plainly({"workflows"}), hasTerminal);
  EXPECT_THAT(client.readUntil(prompt), HasSubstr(prompt));
  EXPECT_FALSE(client.echoes());
  client.type(std::string(SandboxServer::password) + "\n");
  EXPECT_THAT(client.readUntil("Getting workflows…"), Not(HasSubstr(SandboxServer::password)));
  EXPECT_EQ(client.wait(), 0);
  EXPECT_TRUE(client.echoes());
  EXPECT_THAT(client.standardOutput(), HasSubstr("single-video"));
  EXPECT_THAT(client.standardOutput(), Not(HasSubstr("Password")));
}

TEST_F(TerminalTest, masterPassword_isAskedFor) {
  server_.administrate({"master-password"}, {}, "pear\n");
  ClientProcess client(commandLine({"workflow", "submit", "single-video", file("a.mov"), "--ask-master-password"}),
                       hasTerminal);
  client.readUntil("Master password: ");
  EXPECT_FALSE(client.echoes());
  client.type("pear\n");
  EXPECT_EQ(client.wait(), 0);
  EXPECT_EQ(server_.episodes().size(), 1U);
}

TEST_F(TerminalTest, terminalIsAsBefore_whenThePromptIsInterrupted) {
  ClientProcess client(plainly({"workflows"}), hasTerminal);
  client.readUntil(prompt);
  client.type(std::string("half a pass") + controlC);
  EXPECT_EQ(client.wait(), 130);
  EXPECT_TRUE(client.echoes());
  EXPECT_THAT(requests(), IsEmpty());
}

TEST_F(TerminalTest, terminalIsAsBefore_whenTheProgramIsEnded) {
  for (const int signal : {SIGTERM, SIGHUP}) {
    ClientProcess client(plainly({"workflows"}), hasTerminal);
    client.readUntil(prompt);
    client.signal(signal);
    EXPECT_EQ(client.wait(), 128 + signal);
    EXPECT_TRUE(client.echoes());
  }
}

TEST_F(TerminalTest, promptEnds_whenTheInputDoes) {
  ClientProcess client(plainly({"workflows"}), hasTerminal);
  client.readUntil(prompt);
  client.type(controlD);
  EXPECT_THAT(client.readUntil("typed."), HasSubstr("No password was typed."));
  EXPECT_EQ(client.wait(), 66);
  EXPECT_TRUE(client.echoes());
}

TEST_F(TerminalTest, passwordIsNotAskedFor_whenThereIsNoTerminal) {
  EXPECT_THAT(lumora::tests::runToEnd(plainly({"workflows"}), "correct horse\n"),
              FailedWith(64, "There is no terminal to ask for the password at: give --password-file."));
}

TEST_F(TerminalTest, progressIsTold_onATerminalOrWhenAskedFor) {
  ClientProcess shown(commandLine({"workflows"}), hasTerminal);
  EXPECT_THAT(shown.readUntil("Getting workflows…"), HasSubstr("Getting workflows…"));
  EXPECT_EQ(shown.wait(), 0);
  EXPECT_EQ(run({"workflows", "--progress"}).standardError, "Getting workflows…\n");
  EXPECT_EQ(run({"workflows"}).standardError, "");
  EXPECT_EQ(run({"workflows", "--progress", "--quiet"}).standardError, "");
}

TEST_F(TerminalTest, nothingButTheComplaintIsTold_whenQuiet) {
  inject("failure", {"--command", "listworkflows", "--status", "22", "--message", "it rains"});
  ClientProcess client(commandLine({"workflows", "-q"}), hasTerminal);
  const auto all = client.readUntil("\n");
  EXPECT_EQ(all, "lumora: No response from server: it rains.\r\n");
  EXPECT_EQ(client.wait(), 22);
}

class InterruptTest : public TerminalTest, public testing::WithParamInterface<const char*> {};

TEST_P(InterruptTest, controlC_endsTheProgramAndItsTool) {
  inject(GetParam(), {"--command", "listworkflows"});
  ClientProcess client(commandLine({"workflows"}), hasTerminal);
  const pid_t session = client.process();
  waitForTool();
  client.type(controlC);
  EXPECT_EQ(client.wait(), 130);
  EXPECT_FALSE(isAnybodyLeft(session));
  EXPECT_EQ(client.standardOutput(), "");
}

// A signal to the program alone, as another program sends it.
TEST_P(InterruptTest, signal_endsTheProgramAndItsTool) {
  inject(GetParam(), {"--command", "listworkflows"});
  for (const int signal : {SIGINT, SIGTERM, SIGHUP}) {
    ClientProcess client(commandLine({"workflows"}));
    const pid_t session = client.process();
    waitForTool();
    client.signal(signal);
    EXPECT_EQ(client.wait(), 128 + signal);
    EXPECT_FALSE(isAnybodyLeft(session));
    EXPECT_EQ(client.standardError(), "");
    requests();
  }
}

INSTANTIATE_TEST_SUITE_P(Tools, InterruptTest, testing::Values("hang", "stall"));

TEST_F(TerminalTest, toolIsKilled_whenItDoesNotHeedTheRequestToEnd) {
  const auto tool = file("root/usr/bin/lumctl", "#!/bin/sh\ntrap '' TERM INT\ntouch '" + folder_.path().string() +
                                                    "/requests/0'\nwhile :; do sleep 0.05; done\n");
  ClientProcess client(commandLine({"workflows"}));
  const pid_t session = client.process();
  waitForTool();
  client.signal(SIGINT);
  EXPECT_EQ(client.wait(), 130);
  // What the tool itself started ends by itself.
  while (isAnybodyLeft(session)) {
    std::this_thread::yield();
  }
}

TEST_F(TerminalTest, nothingIsLeftOfAFile_whenADownloadIsInterrupted) {
  inject("stall", {"--command", "downloadworkflow"});
  std::filesystem::create_directories(folder_ / "out");
  ClientProcess client(
      commandLine({"workflow", "download", server_.workflowUUID("single-video"), (folder_ / "out/w.plist").string()}));
  waitForTool();
  client.signal(SIGINT);
  EXPECT_EQ(client.wait(), 130);
  EXPECT_THAT(filesIn(folder_ / "out"), IsEmpty());
}

TEST_F(TerminalTest, readerMayGoAway) {
  std::string script = "set -o pipefail; \"$@\" | true; echo ${PIPESTATUS[0]}";
  std::vector<std::string> command{"/bin/bash", "-c", script, "bash"};
  const auto client = commandLine({"help"});
  command.insert(command.end(), client.begin(), client.end());
  const auto result = lumora::tests::runToEnd(command);
  EXPECT_THAT(result.standardOutput, testing::AnyOf("141\n", "0\n"));
  EXPECT_EQ(result.standardError, "");
}

// A pipe whose reading end is closed before anything is written.
TEST_F(TerminalTest, endsBySIGPIPE_whenNobodyReads) {
  std::vector<std::string> command{"/bin/bash", "-c", "exec 3> >(exit 0); wait $!; \"$@\" >&3; echo $? >&2", "bash"};
  const auto client = commandLine({"workflows"});
  command.insert(command.end(), client.begin(), client.end());
  EXPECT_EQ(lumora::tests::runToEnd(command).standardError, "141\n");
}

TEST_F(TerminalTest, fullDiskIsAnError) {
  std::vector<std::string> command{"/bin/sh", "-c", "\"$@\" > /dev/full", "sh"};
  const auto client = commandLine({"workflows"});
  command.insert(command.end(), client.begin(), client.end());
  EXPECT_THAT(lumora::tests::runToEnd(command), FailedWith(74, "The output cannot be written: No space left"));
}

} // namespace
