// The submission queue, which keeps each submission on disk until the server has it, against the bare actions, which
// keep nothing. The server is a fake that answers at once, the disk is real.

#include "support/Figures.h"
#include "support/TemporaryFolder.h"

#include <LumoraKit/actions/LMRActionFactory.h>
#include <LumoraKit/platform/MainThread.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/testing/FakeToolRunner.h>
#include <LumoraKit/workflows/LMRSubmissionQueue.h>

#include <benchmark/benchmark.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <string>

namespace lumora::bench {
namespace {

constexpr int submissions = 200;

class Bench {
public:
  Bench() {
    std::ofstream(file()) << "movie";
    auto platform = Platform::current();
    platform.toolRunner = std::make_shared<fakes::FakeToolRunner>();
    Platform::install(platform);
    session_->setServer("lumora.example.org");
    session_->setUserName("alice");
    session_->setPassword("apple");
    session_->setAuthenticationType(LMRAuthenticationTypePassword);
  }
  std::filesystem::path file() const { return folder_ / "lecture.mov"; }
  std::filesystem::path queueFolder() const { return folder_ / "queue"; }
  const std::shared_ptr<LMRSession>& session() const { return session_; }

private:
  tests::TemporaryFolder folder_;
  std::shared_ptr<LMRSession> session_ = LMRSession::session();
};

Bench& bench() {
  static Bench bench;
  return bench;
}

const Dictionary& metadata() {
  static const Dictionary metadata{{"Title", "Lecture 1"}, {"Description", "The first of twelve."}};
  return metadata;
}

void actions(benchmark::State& state) {
  for ([[maybe_unused]] auto iteration : state) {
    for (int i = 0; i < submissions; ++i) {
      const auto action = LMRActionFactory::
          actionToSubmitFile_toSubmissionUUID_userMetadata_recordingMetadata_asynchronous_deleteAfterSubmission_session(
              bench().file(), std::to_string(i), metadata(), Dictionary(), false, false, bench().session());
      action->runSynchronously();
      if (action->error()) {
        state.SkipWithError("a submission failed");
      }
    }
  }
}

void queue(benchmark::State& state) {
  const auto queue = LMRSubmissionQueue::queueWithFolder_error(bench().queueFolder(), nullptr);
  queue->setSession(bench().session());
  for ([[maybe_unused]] auto iteration : state) {
    for (int i = 0; i < submissions; ++i) {
      LMRSubmission submission;
      submission.file = bench().file();
      submission.submissionUUID = std::to_string(i);
      submission.userMetadata = metadata();
      if (queue->add(submission, *bench().session())) {
        state.SkipWithError("a submission was refused");
      }
    }
    Platform::current().mainThread->serveUntil([&] { return queue->submissions().empty(); });
  }
}

BENCHMARK(actions)->Iterations(1)->Repetitions(9)->UseRealTime()->ReportAggregatesOnly();
BENCHMARK(queue)->Iterations(1)->Repetitions(9)->UseRealTime()->ReportAggregatesOnly();

} // namespace
} // namespace lumora::bench

int main(int argc, char** argv) {
  using namespace lumora::bench;
  auto seconds = runBenchmarks(argc, argv);
  tell("submissions through the queue, kept on disk", submissions / seconds["queue"], "1/s");
  tell("submissions as bare actions, kept nowhere", submissions / seconds["actions"], "1/s");
  return EXIT_SUCCESS;
}
