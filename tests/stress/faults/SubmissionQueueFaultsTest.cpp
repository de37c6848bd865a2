#include "FaultRun.h"
#include "OnDisk.h"
#include "support/Sessions.h"
#include "support/TemporaryFolder.h"

#include <LumoraKit/platform/PropertyList.h>
#include <LumoraKit/testing/ManualQueues.h>
#include <LumoraKit/workflows/LMRSubmissionQueue.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>
#include <map>
#include <string>

namespace lumora::tests {
namespace {

using namespace std::chrono_literals;
using fakes::ToolReply;
using testing::IsEmpty;

constexpr int noResponse = 22;
constexpr int notCompleted = 34;
constexpr int invalidRequest = 2;

// A server that files each submission UUID once, with its metadata. Its own calls do not fail.
class Server {
public:
  std::optional<ToolReply> answer(const fakes::ToolRequest& request) {
    if (requests_++ == 0) {
      return ToolReply::failure(noResponse);
    }
    const auto uuid = request.value("submission_uuid").value_or("");
    const auto title = titleIn(request.value("metadata").value_or(""));
    if (!title) {
      return ToolReply::failure(invalidRequest, "no metadata");
    }
    if (!filed.emplace(uuid, *title).second) {
      return ToolReply::failure(notCompleted);
    }
    if (request.contains("delete")) {
      std::filesystem::remove(request.value("file").value_or(""));
    }
    return ToolReply::success({});
  }

  // The title of each submission UUID.
  std::map<std::string, std::string> filed;

private:
  static std::optional<std::string> titleIn(const std::string& path) {
    const auto metadata = dictionaryWithXMLDescription(contentOf(path));
    return metadata ? metadata->string("Title") : std::nullopt;
  }

  int requests_ = 0;
};

class Submitting : public FaultScenario {
public:
  explicit Submitting(const std::filesystem::path& folder, bool deletes = false)
      : FaultScenario(folder), deletes_(deletes) {
    auto platform = Platform::current();
    platform.queues = queues_;
    platform.mainThread = queues_->mainThread();
    Platform::install(platform);
    disk_.platform.toolRunner->setHandler([this](const fakes::ToolRequest& request) {
      const WithoutFaults pause;
      return server_.answer(request);
    });
    writeFile(movie("A"), "movie");
    writeFile(movie("B"), "movie");
  }

  void act() override {
    const auto queue = open();
    for (const std::string uuid : {"A", "B"}) {
      if (queue && !add(*queue, uuid)) {
        accepted_.push_back(uuid);
      }
    }
    if (queue) {
      queue->setSession(session_);
      queues_->advance(100s);
    }
  }

  // The application is started again, and its user has everything tried again that is held.
  void check(const Fault& fault) override {
    EXPECT_TRUE(accepted_.size() == 2 || fault.call != 0);
    EXPECT_TRUE(accepted_.size() == 2 || error_) << "a refusal without an error";
    const auto queue = open();
    ASSERT_TRUE(queue) << error_->localizedDescription();
    queue->setSession(session_);
    queues_->advance(10'000s);
    for (const auto& submission : queue->submissions()) {
      queue->retry(submission.identifier);
      queues_->runAll();
    }
    expectFiled(*queue);
    EXPECT_THAT(filesBelow(folder_ / "data"), IsEmpty()) << "metadata files are left";
  }

private:
  std::filesystem::path movie(const std::string& uuid) const { return folder_ / (uuid + ".mov"); }
  std::shared_ptr<LMRSubmissionQueue> open() {
    return LMRSubmissionQueue::queueWithFolder_error(folder_ / "queue", &error_);
  }

  LMRErrorRef add(LMRSubmissionQueue& queue, const std::string& uuid) {
    LMRSubmission submission;
    submission.file = movie(uuid);
    submission.submissionUUID = uuid;
    submission.userMetadata = {{"Title", "Lecture " + uuid}};
    submission.deleteAfterSubmission = deletes_;
    const LMRErrorRef error = queue.add(submission, *session_);
    error_ = error ? error : error_;
    return error;
  }

  // Everything that the queue has taken, once, with its metadata; what is filed and yet in the queue is held for the
  // user to decide.
  void expectFiled(const LMRSubmissionQueue& queue) const {
    std::vector<std::string> filed;
    for (const auto& [uuid, title] : server_.filed) {
      EXPECT_EQ(title, "Lecture " + uuid);
      filed.push_back(uuid);
    }
    EXPECT_EQ(filed, accepted_);
    for (const auto& submission : queue.submissions()) {
      EXPECT_EQ(submission.state, LMRSubmission::State::Held);
      EXPECT_TRUE(submission.lastError);
    }
    for (const auto& name : filesBelow(folder_ / "queue")) {
      EXPECT_TRUE(name == "lock" || name.ends_with(".plist")) << name;
    }
  }

  const bool deletes_;
  const OnDisk disk_{folder_};
  const std::shared_ptr<fakes::ManualQueues> queues_ = std::make_shared<fakes::ManualQueues>();
  const std::shared_ptr<LMRSession> session_ = passwordSession();
  Server server_;
  LMRErrorRef error_;
  std::vector<std::string> accepted_;
};

const std::vector<std::string> everyCall{"mkdir", "open",   "openat", "readdir",   "flock", "mkostemp", "write",
                                         "fsync", "rename", "unlink", "getrandom", "close", "stat"};

TEST(SubmissionQueueFaults, fileEverythingOnce) {
  expectHolds(runWithFaults<Submitting>(), everyCall);
}

class SubmittingAndDeleting final : public Submitting {
public:
  explicit SubmittingAndDeleting(const std::filesystem::path& folder) : Submitting(folder, true) {}
};

TEST(SubmissionQueueFaults, fileEverythingOnce_whenTheFilesAreDeletedAfterwards) {
  expectHolds(runWithFaults<SubmittingAndDeleting>(), everyCall);
}

} // namespace
} // namespace lumora::tests
