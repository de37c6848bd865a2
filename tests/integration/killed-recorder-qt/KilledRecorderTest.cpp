// The application is killed with SIGKILL and started again, as a user would.
#include "Assistant.h"
#include "support/HeadlessDevices.h"
#include "support/MainLoop.h"
#include "support/Movie.h"
#include "support/Sandbox.h"
#include "support/TemporaryFolder.h"

#include <LumoraKit/recording/LMRMovieFile.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <cstdlib>
#include <filesystem>

namespace {

using lumora::testing::Movie;
using lumora::tests::Assistant;
using lumora::tests::ChildProgram;
using lumora::tests::serveUntil;
using testing::IsEmpty;
using testing::SizeIs;
using Server = lumora::tests::SandboxServer;

constexpr const char* button = "push button";

class KilledRecorder : public testing::Test {
protected:
  void SetUp() override {
    // The services that the devices' bus starts are to have this home, too.
    for (const auto& [name, value] :
         {std::pair("XDG_DATA_HOME", (home_ / "data").string()),
          std::pair("XDG_CONFIG_HOME", (home_ / "config").string()), std::pair("LC_ALL", std::string("C.UTF-8")),
          std::pair("QT_QPA_PLATFORM", std::string("xcb")), std::pair("QT_STYLE_OVERRIDE", std::string("fusion")),
          std::pair("QT_LINUX_ACCESSIBILITY_ALWAYS_ON", std::string("1"))}) {
      ::setenv(name, value.c_str(), 1);
    }
    std::string missing;
    devices_ = lumora::testing::HeadlessDevices::start(missing);
    if (!devices_ || !Movie::canBeRead()) {
      GTEST_SKIP() << (devices_ ? "ffprobe and ffmpeg are not installed" : missing);
    }
    if (const auto obstacle = Assistant::obstacle()) {
      GTEST_SKIP() << *obstacle;
    }
    manager_ = ChildProgram::start({"jwm"});
    if (!manager_) {
      GTEST_SKIP() << "jwm is not installed";
    }
    server_.emplace();
    user_.emplace();
  }

  void start() {
    recorder_ = ChildProgram::start({LUMORA_RECORDER_PROGRAM, "--sandbox", server_->root().string()});
    ASSERT_NE(recorder_, nullptr);
    ASSERT_TRUE(serveUntil([&] { return logIn(); })) << "nobody can log in";
  }
  // A step of it; true when the window has come.
  bool logIn() {
    if (user_->see(button, "Record")) {
      return true;
    }
    if (user_->see("password text", "Password")) {
      user_->type("text", "User name", Server::userName);
      user_->type("password text", "Password", Server::password);
      user_->key("Return");
    } else if (user_->see("text", "Server").value_or(Server::host) != Server::host) {
      user_->type("text", "Server", Server::host);
      user_->key("Return");
    }
    return false;
  }
  void kill() { recorder_->kill(); }

  void press(const std::string& name) {
    ASSERT_TRUE(serveUntil([&] { return user_->press(button, name); })) << "there is no button " << name;
  }
  /// Whether the list of submissions comes to have a line that begins so.
  bool listComesToSay(const std::string& title, const std::string& state) {
    return serveUntil([&] { return user_->see("list item", title + " " + state + "*").has_value(); });
  }
  void record(const std::string& title) {
    ASSERT_TRUE(serveUntil([&] { return user_->type("text", "Title", title); }));
    press("Record");
    ASSERT_TRUE(serveUntil([&] {
      const auto files = movies();
      return !files.empty() && LMRMovieFile::movieFileWithPath(files.front()).duration > 2;
    }));
  }
  std::vector<std::filesystem::path> movies() const {
    std::vector<std::filesystem::path> movies;
    for (const auto& entry : std::filesystem::recursive_directory_iterator(home_.path())) {
      if (entry.path().extension() == ".mov") {
        movies.push_back(entry.path());
      }
    }
    return movies;
  }
  /// Whether a tool of the server runs, whoever has started it.
  bool toolRuns() const {
    const std::string tool = server_->tool().string();
    return std::ranges::any_of(std::filesystem::directory_iterator("/proc"), [&](const auto& process) {
      return lumora::tests::contentOf(process.path() / "cmdline").starts_with(tool);
    });
  }
  bool serverHas(std::size_t episodes) {
    return serveUntil([&] { return server_->episodes().size() == episodes; });
  }
  void expectOnePlayableEpisode(const std::string& title) {
    const auto episodes = server_->episodes();
    ASSERT_THAT(episodes, SizeIs(1));
    EXPECT_EQ(episodes.front().string("title"), title);
    const Movie movie(episodes.front().array("files")->at(0).dictionary()->string("path").value());
    EXPECT_TRUE(movie.decodes());
    EXPECT_GT(movie.duration(), 1.5);
  }

  lumora::tests::TemporaryFolder home_;
  std::unique_ptr<lumora::testing::HeadlessDevices> devices_;
  std::unique_ptr<ChildProgram> manager_;
  std::optional<Server> server_;
  std::optional<Assistant> user_;
  std::unique_ptr<ChildProgram> recorder_;
};

TEST_F(KilledRecorder, offersItsRecording_whenItWasKilledInTheMiddle_andSubmitsIt) {
  start();
  record("Interrupted");
  kill();
  ASSERT_THAT(movies(), SizeIs(1));
  EXPECT_THAT(server_->episodes(), IsEmpty());
  start();
  press("Submit");
  ASSERT_TRUE(serverHas(1));
  expectOnePlayableEpisode("Interrupted");
  EXPECT_TRUE(listComesToSay("Interrupted", "Arrived at the server"));
  EXPECT_TRUE(serveUntil([&] { return movies().empty(); }));
}

TEST_F(KilledRecorder, recordsAgain_afterItsRecordingWasDiscarded) {
  start();
  record("Unwanted");
  kill();
  start();
  press("Discard");
  ASSERT_TRUE(serveUntil([&] { return movies().empty(); }));
  record("Wanted");
  press("Stop");
  ASSERT_TRUE(serverHas(1));
  expectOnePlayableEpisode("Wanted");
}

// The server's tool goes on without the application.
TEST_F(KilledRecorder, filesOnce_whenItWasKilledWhileItSubmitted) {
  start();
  record("Under way");
  server_->administrate({"inject", "latency"}, {"--command", "submit", "--milliseconds", "4000", "--times", "1"});
  press("Stop");
  ASSERT_TRUE(listComesToSay("Under way", "Is being submitted"));
  kill();
  ASSERT_TRUE(toolRuns());
  start();
  ASSERT_TRUE(serverHas(1));
  // Whichever was first, nothing is on its way any more.
  ASSERT_TRUE(serveUntil([&] {
    return user_->see("list item", "Under way Arrived*") || user_->see("list item", "Under way Not submitted*");
  }));
  ASSERT_TRUE(serveUntil([&] { return !toolRuns(); }));
  expectOnePlayableEpisode("Under way");
}

TEST_F(KilledRecorder, filesOnce_whenItWasKilledWhileASubmissionWaited) {
  start();
  record("Waiting");
  server_->administrate({"inject", "failure"}, {"--command", "submit", "--status", "20"});
  press("Stop");
  ASSERT_TRUE(listComesToSay("Waiting", "Will be tried again"));
  kill();
  EXPECT_THAT(server_->episodes(), IsEmpty());
  server_->administrate({"inject", "clear"});
  start();
  ASSERT_TRUE(serverHas(1));
  expectOnePlayableEpisode("Waiting");
  EXPECT_TRUE(listComesToSay("Waiting", "Arrived at the server"));
  EXPECT_THAT(server_->episodes(), SizeIs(1));
  EXPECT_TRUE(serveUntil([&] { return movies().empty(); }));
}

} // namespace
