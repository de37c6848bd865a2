// The examples about submissions.

#include <LumoraKit/LumoraKit.h>

#include <any>
#include <memory>
#include <string>

namespace snippets {

std::shared_ptr<LMRAction> submitOneFile(const lumora::Dictionary& recordingMetadata,
                                         const std::shared_ptr<LMRSession>& session) {
  auto action = LMRActionFactory::
      actionToSubmitFile_toWorkflow_userMetadata_recordingMetadata_asynchronous_deleteAfterSubmission_session(
          "/home/ada/take.mov", "Lectures", lumora::Dictionary{{"Title", "Lecture 1"}}, recordingMetadata,
          /*asynchronous*/ true, /*deleteAfterSubmission*/ false, session);
  return action;
}

LMRErrorRef queued(const std::shared_ptr<LMRSession>& session, const std::shared_ptr<LMRLocalVideoRecorder>& recorder) {
  LMRErrorRef error;
  auto queue = LMRSubmissionQueue::queueWithError(&error);
  queue->setSession(session); // after each login; submissions of other users wait for theirs
  // When the recorder has stopped:
  LMRSubmission submission;
  submission.file = *recorder->outputFileURL();
  submission.submissionUUID = *recorder->submissionUUID();
  submission.userMetadata = {{std::string(LMREpisodeUserMetadataTitleKey), "Lecture 1"}};
  error = queue->add(submission, *session); // on disk when it returns
  return error;
}

class Window {
public:
  void watch(const std::shared_ptr<LMRSubmissionQueue>& queue);

private:
  void showWaiting(std::size_t count, const std::string& problem);
  lumora::Connection changed_;
};

void Window::watch(const std::shared_ptr<LMRSubmissionQueue>& queue) {
  changed_ = lumora::Platform::current().notificationCenter->observe(
      LMRSubmissionQueueDidChangeNotification, [this, queue](const std::any&) {
        std::string problem;
        for (const LMRSubmission& submission : queue->submissions()) {
          problem = submission.lastError.value_or(problem);
        }
        showWaiting(queue->submissions().size(), problem);
      });
}

// Where something goes into the recording metadata: when and how long, as the recorder knows it.
lumora::Dictionary recordingMetadata(const LMRLocalVideoRecorder& recorder) {
  const auto date = [](const std::optional<lumora::WallTime>& time) {
    return std::chrono::floor<std::chrono::seconds>(time.value_or(lumora::WallTime()));
  };
  return lumora::Dictionary{
      {std::string(LMREpisodeRecordingMetadataStartDateKey), date(recorder.recordingStartDate())},
      {std::string(LMREpisodeRecordingMetadataStopDateKey), date(recorder.recordingStopDate())},
      {std::string(LMREpisodeRecordingMetadataDurationKey), recorder.elapsedRecordingTime()},
  };
}

} // namespace snippets
