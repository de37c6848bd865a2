#pragma once

#include "recorder/model/Source.h"

#include <LumoraKit/LumoraKit.h>

#include <filesystem>
#include <memory>
#include <set>
#include <string>
#include <vector>

namespace recorder {

enum class TakeState {
  Ready,
  Starting,
  Recording,
  Pausing,
  Paused,
  Resuming,
  Stopping,
  Cancelling,
  /// The ends.
  Stopped,
  Cancelled,
  Failed,
};

/// What the viewers are told of an episode.
struct Episode {
  std::string title;
  std::string description;

  lumora::Dictionary userMetadata() const;
};

/// One recording of several sources. A source that is lost ends its own file; the others go on. Main thread only.
class Take final : public LMRDelegateImplementation<Take>, public std::enable_shared_from_this<Take> {
  // Makes the constructor callable by make() only.
  struct MadeByFactory {
    explicit MadeByFactory() = default;
  };

public:
  using Sources = std::vector<std::shared_ptr<Source>>;

  /// Of sources that have a recorder each; they are prepared, and their files have names afterwards.
  static std::shared_ptr<Take> make(Sources sources, const std::string& workflowUUID,
                                    const std::shared_ptr<LMRSession>& session);
  Take(MadeByFactory key, Sources sources);

  /// Told when the state or the problem has become another one.
  lumora::Notifier changed;

  TakeState state() const { return state_; }
  bool isUnderWay() const;
  bool hasEnded() const;
  /// The last thing that went wrong; null when nothing did.
  const LMRErrorRef& problem() const { return problem_; }
  /// Whether a stop failed because the server gave no place for the recording: it goes on, and may be stopped again.
  bool hasNoPlaceAtServer() const { return hasNoPlaceAtServer_; }
  /// Whether it is under way and every source was lost: it can only be stopped or cancelled.
  bool nothingRecords() const;
  /// Seconds.
  double elapsedTime() const { return recorder_->elapsedRecordingTime(); }
  const std::shared_ptr<LMRMultipleSourceRecorder>& recorder() const { return recorder_; }

  /// Each is for the states in which it makes sense, and has no effect in others.
  void start();
  void pause();
  void resume();
  void stop(const Episode& episode);
  /// Ends the recording without a server: the files stay where they are, and nothing is submitted.
  void stopWithoutServer();
  void cancel();

  /// What is to be submitted when it has stopped: each file of this machine.
  std::vector<LMRSubmission> submissions(const Episode& episode) const;
  /// What tells the file of a source from the others of the same episode; empty when it has one source only.
  std::string nameOf(const std::filesystem::path& file) const;
  /// The files that a stop without a server left.
  std::vector<std::string> files() const;

  void recorderDidStartRecording(const Recorder& recorder) override;
  void recorderFailedToStartRecording_error(const Recorder& recorder, const LMRErrorRef& error) override;
  void recorderDidPauseRecording(const Recorder& recorder) override;
  void recorderFailedToPauseRecording_error(const Recorder& recorder, const LMRErrorRef& error) override;
  void recorderDidResumeRecording(const Recorder& recorder) override;
  void recorderFailedToResumeRecording_error(const Recorder& recorder, const LMRErrorRef& error) override;
  void recorderDidStopRecording(const Recorder& recorder) override;
  void recorderFailedToStopRecording_error(const Recorder& recorder, const LMRErrorRef& error) override;
  void recorderDidCancelRecording(const Recorder& recorder) override;
  void recorderFailedToCancelRecording_error(const Recorder& recorder, const LMRErrorRef& error) override;

private:
  using Request = void (LMRSourceRecorder::*)();

  void prepare(const std::string& workflowUUID, const std::shared_ptr<LMRSession>& session);
  void setState(TakeState state);
  void ask(TakeState next, Request request);
  void askEach(Request request);
  void abandon(TakeState end);
  void listenToEach();
  void stopRemoteSourcesAgain();
  void removeFilesOfLostSources() const;
  void requestFailed(const LMRErrorRef& error);
  void settle();
  bool isWhole(const Recorder& recorder) const { return recorder == recorder_; }
  bool hasPlaceAtServer() const;
  bool isLost(const LMRSourceRecorder& source) const;
  bool isLive(const Recorder& source) const;
  void markLostSources(const LMRErrorRef& error);

  const Sources sources_;
  std::vector<std::shared_ptr<LMRSourceRecorder>> recorders_;
  std::shared_ptr<LMRMultipleSourceRecorder> recorder_;
  std::shared_ptr<lumora::WorkQueue> queue_;
  TakeState state_ = TakeState::Ready;
  LMRErrorRef problem_;
  bool hasNoPlaceAtServer_ = false;
  bool isWithoutServer_ = false;
  bool isAbandoned_ = false;
  // After a failure the combined recorder tells nothing of its sources any more: then each tells this object.
  bool listensToEach_ = false;
  // The sources whose end has been told.
  std::set<const LMRSourceRecorder*> ended_;
};

} // namespace recorder
