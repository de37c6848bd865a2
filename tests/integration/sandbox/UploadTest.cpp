#include "Requests.h"

#include <LumoraKit/platform/Platform.h>

#include <set>

#include <sandbox/store/Uploads.h>
#include <sandbox/submission/Staging.h>

using namespace lumora;
using namespace lumora::tests;
using testing::IsEmpty;
using testing::SizeIs;

namespace {

class Uploads : public testing::Test {
protected:
  Array submission(const std::filesystem::path& file) const {
    return asUser(server, {"submit", Array{"async"}, Array{"delete"}, pair("file", file),
                           pair("metadata", writeMetadata(server)), Array{"workflow", "single-video"}});
  }
  std::vector<Dictionary> list() const {
    const auto run = server.request({"list_uploads"});
    EXPECT_THAT(run, Succeeded());
    const auto reply = dictionaryWithXMLDescription(run.standardOutput).value_or(Dictionary{{"uploads", Array{}}});
    std::vector<Dictionary> all;
    for (const auto& upload : *reply.array("uploads")) {
      all.push_back(*upload.dictionary());
    }
    return all;
  }
  /// The one upload, once it has ended.
  Dictionary ended() const {
    EXPECT_TRUE(waitUntil([&] { return list().at(0).string("state") != "uploading"; }));
    return list().at(0);
  }

  SandboxServer server;
};

} // namespace

TEST_F(Uploads, areNone_whenNothingWasSubmittedAsynchronously) {
  EXPECT_THAT(list(), IsEmpty());
}

TEST_F(Uploads, asynchronousSubmissionIsListedThenCompleted) {
  const auto movie = writeFile(server.folder() / "movie.mov", "abc");
  ASSERT_THAT(server.request(submission(movie)), Succeeded());
  const auto upload = ended();
  EXPECT_EQ(upload.string("state"), "completed");
  EXPECT_EQ(upload.string("title"), "Title");
  EXPECT_EQ(upload.string("workflow"), "single-video");
  EXPECT_EQ(upload.find("size")->integer(), 3);
  EXPECT_EQ(upload.find("sent")->integer(), 3);
  EXPECT_TRUE(upload.find("ended")->date());
  EXPECT_EQ(server.episodes().at(0).string("uuid"), upload.string("uuid"));
  EXPECT_TRUE(waitUntil([&] { return !std::filesystem::exists(movie); }));
}

TEST_F(Uploads, toolRefusesAtOnce_whenTheFileIsMissing) {
  EXPECT_THAT(server.request(submission(server.folder() / "missing.mov")), EndedWith(33, "missing.mov"));
  EXPECT_THAT(list(), IsEmpty());
}

TEST_F(Uploads, isListedAsFailedAndSourceStays_whenItCannotBeWritten) {
  const auto movie = writeFile(server.folder() / "movie.mov", std::string(4 << 20, 'x'));
  std::string output;
  std::string error;
  // No file of this run may grow beyond 2 MiB.
  ASSERT_EQ(Platform::current().toolRunner->run("/bin/sh",
                                                {"-c", "ulimit -f 4096; exec \"$0\" --plistin", server.tool().string()},
                                                xmlDescription(submission(movie)).value(), output, error),
            0)
      << error;
  const auto upload = ended();
  EXPECT_EQ(upload.string("state"), "failed");
  EXPECT_THAT(upload.string("message").value(), testing::HasSubstr("File too large"));
  EXPECT_THAT(server.episodes(), IsEmpty());
  EXPECT_TRUE(std::filesystem::exists(movie));
}

TEST_F(Uploads, isListedAsFailed_whenItsProcessDied) {
  auto store = sandbox::Store::open(server.root());
  std::filesystem::path folder;
  {
    sandbox::Staging abandoned(store);
    sandbox::Upload upload;
    upload.uuid = abandoned.uuid();
    insertUpload(store, upload);
    abandoned.keep();
    folder = store.incomingFolder() / upload.uuid;
  }
  ASSERT_TRUE(std::filesystem::exists(folder));
  EXPECT_EQ(list().at(0).string("state"), "failed");
  EXPECT_EQ(list().at(0).string("message"), "the transfer was interrupted");
  EXPECT_FALSE(std::filesystem::exists(folder));
}

TEST_F(Uploads, isLeftAlone_whileItsProcessLives) {
  auto store = sandbox::Store::open(server.root());
  const sandbox::Staging alive(store);
  sandbox::Upload upload;
  upload.uuid = alive.uuid();
  insertUpload(store, upload);
  EXPECT_EQ(list().at(0).string("state"), "uploading");
  EXPECT_TRUE(std::filesystem::exists(store.incomingFolder() / upload.uuid));
}

TEST_F(Uploads, showsItsProgress_whileItIsUnderWay) {
  constexpr std::int64_t size = 400'000;
  ASSERT_THAT(server.administrate({"inject", "latency"}, {"--command", "transfer", "--milliseconds", "1000"}),
              Succeeded());
  ASSERT_THAT(server.request(submission(writeFile(server.folder() / "movie.mov", std::string(size, 'x')))),
              Succeeded());
  std::int64_t sent = 0;
  std::set<std::int64_t> seen;
  ASSERT_TRUE(waitUntil([&] {
    const auto upload = list().at(0);
    const auto now = upload.find("sent")->integer().value();
    EXPECT_GE(now, sent);
    sent = now;
    seen.insert(now);
    return upload.string("state") == "completed";
  }));
  EXPECT_EQ(sent, size);
  // Nothing or all of it would be no progress.
  EXPECT_GE(seen.size(), 3U);
}

TEST_F(Uploads, isListedAsFailedWithTheReason_whenItsTransferFails) {
  ASSERT_THAT(server.administrate({"inject", "failure"},
                                  {"--command", "transfer", "--status", "32", "--message", "the connection was lost"}),
              Succeeded());
  const auto movie = writeFile(server.folder() / "movie.mov", "abc");
  ASSERT_THAT(server.request(submission(movie)), Succeeded());
  const auto upload = ended();
  EXPECT_EQ(upload.string("state"), "failed");
  EXPECT_EQ(upload.string("message"), "the connection was lost");
  EXPECT_EQ(upload.find("sent")->integer(), 0);
  EXPECT_THAT(server.episodes(), IsEmpty());
  EXPECT_TRUE(std::filesystem::exists(movie));
}

TEST_F(Uploads, isListedAsFailed_whenItsTransferCrashes) {
  ASSERT_THAT(server.administrate({"inject", "crash"}, {"--command", "transfer"}), Succeeded());
  ASSERT_THAT(server.request(submission(writeFile(server.folder() / "movie.mov", "abc"))), Succeeded());
  EXPECT_EQ(ended().string("message"), "the transfer was interrupted");
  EXPECT_THAT(server.episodes(), IsEmpty());
}

TEST_F(Uploads, transferIsSpared_whenEveryCommandIsStruck) {
  ASSERT_THAT(server.administrate({"inject", "latency"}, {"--milliseconds", "1", "--times", "2"}), Succeeded());
  ASSERT_THAT(server.request(submission(writeFile(server.folder() / "movie.mov", "abc"))), Succeeded());
  EXPECT_TRUE(waitUntil([&] { return !server.episodes().empty(); }));
  // Only the tool was struck.
  EXPECT_THAT(server.administrate({"inject", "list"}).standardOutput, testing::HasSubstr("\t1 times\t"));
}

TEST(LibraryServer, takesSeveralFilesSynchronouslyOnly) {
  const SandboxServer server({"--library-server"});
  const auto file = pair("file", writeFile(server.folder() / "movie.mov", "abc"));
  const auto metadata = pair("metadata", writeMetadata(server));
  const Array workflow{"workflow", "single-video"};
  EXPECT_THAT(server.request(asUser(server, {"submit", Array{"async"}, file, file, metadata, workflow})),
              EndedWith(12, "synchronously only"));
  EXPECT_THAT(server.request(asUser(server, {"submit", file, file, metadata, workflow})), Succeeded());
  EXPECT_THAT(server.request(asUser(server, {"submit", Array{"async"}, file, metadata, workflow})), Succeeded());
}

TEST_F(Uploads, endedOnesAreForgotten_whenCleared) {
  auto store = sandbox::Store::open(server.root());
  const sandbox::Staging alive(store);
  for (const auto& uuid : {alive.uuid(), std::string("completed"), std::string("failed")}) {
    sandbox::Upload upload;
    upload.uuid = uuid;
    insertUpload(store, upload);
  }
  completeUpload(store, "completed");
  failUpload(store, "failed", "no reason");
  const auto reply = dictionaryWithXMLDescription(server.request({"clear_completed_uploads"}).standardOutput).value();
  EXPECT_EQ(reply.find("cleared")->integer(), 2);
  ASSERT_THAT(list(), SizeIs(1));
  EXPECT_EQ(list().at(0).string("uuid"), alive.uuid());
}
