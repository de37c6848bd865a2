#include "Requests.h"
#include "ToolProcess.h"

#include <LumoraKit/platform/Platform.h>

#include <sandbox/store/Store.h>

using namespace lumora;
using namespace lumora::tests;
using testing::IsEmpty;
using testing::SizeIs;

namespace {

class Robustness : public testing::Test {
protected:
  Array submission(const std::filesystem::path& file) const {
    return asUser(server, {"submit", Array{"delete"}, pair("file", file), pair("metadata", writeMetadata(server)),
                           Array{"workflow", "single-video"}});
  }
  std::filesystem::path requestFile(const Array& request) const {
    return writeFile(server.folder() / "request", xmlDescription(request).value());
  }
  std::filesystem::path movie(std::uintmax_t size) const {
    const auto path = writeFile(server.folder() / "movie.mov", "");
    std::filesystem::resize_file(path, size);
    return path;
  }
  /// Bytes that have arrived in the staging folder.
  std::uintmax_t stagedBytes() const {
    std::uintmax_t sum = 0;
    std::error_code ignored;
    for (const auto& entry : std::filesystem::recursive_directory_iterator(incoming, ignored)) {
      const auto size = entry.is_regular_file(ignored) ? entry.file_size(ignored) : 0;
      sum += ignored ? 0 : size;
    }
    return sum;
  }

  SandboxServer server;
  std::filesystem::path incoming = server.root() / "var/lib/lumora/incoming";
  std::filesystem::path submissions = server.root() / "var/lib/lumora/submissions";
};

class KilledSubmission : public Robustness, public testing::WithParamInterface<std::uintmax_t> {};

} // namespace

TEST_P(KilledSubmission, leavesNothingOrTheWhole_whenKilledAfterBytes) {
  constexpr std::uintmax_t size = 96 << 20;
  const auto source = movie(size);
  {
    ToolProcess tool(server.tool(), requestFile(submission(source)));
    ASSERT_TRUE(waitUntil([&] { return stagedBytes() >= GetParam() || !tool.isRunning(); }));
    tool.kill();
  }
  const auto episodes = server.episodes();
  if (episodes.empty()) {
    EXPECT_TRUE(std::filesystem::exists(source));
    EXPECT_TRUE(std::filesystem::is_empty(submissions));
  } else {
    const auto& file = *episodes.front().array("files")->front().dictionary();
    EXPECT_EQ(std::filesystem::file_size(file.string("path").value()), size);
  }
  EXPECT_TRUE(std::filesystem::is_empty(incoming));
}

INSTANTIATE_TEST_SUITE_P(Points, KilledSubmission,
                         testing::Values(std::uintmax_t{0}, std::uintmax_t{1}, std::uintmax_t{20} << 20,
                                         std::uintmax_t{95} << 20));

TEST_F(Robustness, folderIsClearedAway_whenItsEpisodeWasNeverRecorded) {
  const auto folder = submissions / "5C4BC4E2-4BC5-4F9C-8F5C-1F0F6D6F3C21";
  std::filesystem::create_directory(folder);
  writeFile(folder / "1-movie.mov", "abc");
  EXPECT_THAT(server.episodes(), IsEmpty());
  EXPECT_FALSE(std::filesystem::exists(folder));
}

TEST_F(Robustness, isStatus33AndLeavesNothing_whenTheFileCannotBeWrittenWhole) {
  const auto source = movie(4 << 20);
  std::string output;
  std::string error;
  // No file of this run may grow beyond 2 MiB.
  const int status = Platform::current().toolRunner->run(
      "/bin/sh", {"-c", "ulimit -f 4096; exec \"$0\" --plistin", server.tool().string()},
      xmlDescription(submission(source)).value(), output, error);
  EXPECT_EQ(status, 33);
  EXPECT_THAT(error, testing::HasSubstr("File too large"));
  EXPECT_THAT(server.episodes(), IsEmpty());
  EXPECT_TRUE(std::filesystem::is_empty(incoming));
  EXPECT_TRUE(std::filesystem::exists(source));
}

TEST_F(Robustness, isStatus25AndLeavesNothing_whenTheEpisodeCannotBeRecorded) {
  sandbox::Store::open(server.root())
      .database()
      .exec("CREATE TRIGGER refuse BEFORE INSERT ON files BEGIN "
            "SELECT RAISE(ABORT, 'database or disk is full'); END");
  const auto source = movie(1000);
  EXPECT_THAT(server.request(submission(source)), EndedWith(25, "database or disk is full"));
  EXPECT_TRUE(std::filesystem::exists(source));
  EXPECT_TRUE(std::filesystem::is_empty(incoming));
  EXPECT_TRUE(std::filesystem::is_empty(submissions));
  EXPECT_THAT(server.episodes(), IsEmpty());
}

TEST_F(Robustness, toolNeverEnds_whenItHangs) {
  ASSERT_THAT(server.administrate({"inject", "hang"}, {"--times", "1"}), Succeeded());
  ToolProcess tool(server.tool(), requestFile({"getconfig", "plist"}));
  // Once it has struck, the fault is used up.
  ASSERT_TRUE(waitUntil([&] { return server.administrate({"inject", "list"}).standardOutput.empty(); }));
  EXPECT_THAT(server.request({"getconfig", "plist"}), Succeeded());
  EXPECT_TRUE(tool.isRunning());
}

TEST_F(Robustness, nothingIsLost_when50SubmitAtOnce) {
  constexpr int count = 50;
  std::vector<ProgramRun> runs(count);
  std::vector<std::thread> threads;
  for (int index = 0; index < count; ++index) {
    threads.emplace_back([&, index] {
      const std::string name = "Lecture " + std::to_string(index);
      const auto file = writeFile(server.folder() / (name + ".mov"), name);
      runs[static_cast<std::size_t>(index)] = server.request(
          asUser(server, {"submit", Array{"delete"}, pair("file", file), pair("metadata", writeMetadata(server, name)),
                          Array{"workflow", "single-video"}}));
    });
  }
  for (auto& thread : threads) {
    thread.join();
  }
  EXPECT_THAT(runs, testing::Each(Succeeded()));
  const auto episodes = server.episodes();
  ASSERT_THAT(episodes, SizeIs(count));
  for (const auto& episode : episodes) {
    const auto& file = *episode.array("files")->front().dictionary();
    EXPECT_EQ(contentOf(file.string("path").value()), episode.string("title"));
  }
}

TEST_F(Robustness, oneSubmissionIsFiled_whenManyGoIntoOnePlaceAtOnce) {
  const auto created =
      server.request(asUser(server, {"create_recording", Array{"workflow_uuid", server.workflowUUID("single-video")}}));
  const auto reply = dictionaryWithXMLDescription(created.standardOutput).value();
  const auto request = asUser(server, {"submit", pair("file", movie(100'000)), pair("metadata", writeMetadata(server)),
                                       Array{"submission_uuid", *reply.array("submission_uuids")->front().string()}});
  std::vector<int> statuses(20);
  std::vector<std::thread> threads;
  for (auto& status : statuses) {
    threads.emplace_back([&] { status = server.request(request).status; });
  }
  for (auto& thread : threads) {
    thread.join();
  }
  EXPECT_EQ(std::count(statuses.begin(), statuses.end(), 0), 1);
  EXPECT_EQ(std::count(statuses.begin(), statuses.end(), 34), 19);
  EXPECT_THAT(server.episodes(), SizeIs(1));
  EXPECT_TRUE(std::filesystem::is_empty(incoming));
}
