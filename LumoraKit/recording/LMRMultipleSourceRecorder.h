#pragma once

#include <LumoraKit/actions/LMRSession.h>
#include <LumoraKit/platform/KeyedArchive.h>
#include <LumoraKit/platform/Property.h>
#include <LumoraKit/platform/Value.h>
#include <LumoraKit/recording/LMRSourceRecorder.h>

#include <cstddef>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

/// Makes several source recorders, local and remote in any mix, behave as one.
///
///     auto recorder = LMRMultipleSourceRecorder::recorderWithSourceRecorders({camera, screen, studio});
///     recorder->setWorkflowUUID(uuid);
///     recorder->setSession(session);
///     recorder->setMetadata(lumora::Dictionary{{"Title", "Lecture 1"}});
///     recorder->setDelegate(controller);
///     recorder->bootstrap();
///     recorder->start();
///     ...
///     recorder->stop();
///
/// It is driven as any recorder is, and is itself the delegate of its sources: its outcome is told when all of them
/// have reported theirs, and the first failure of a source is the failure of the whole. After a failure the sources
/// are no longer listened to, and nothing more is told of them. A stop is told at least once, and again by each source
/// that reports when all have stopped already. Make a request when the last one's outcome was told and, in a program
/// that is faster than a user, not inside that message: a source whose report is still on its way is counted when it
/// comes.
///
/// With a mix of remote and local sources, the remote ones are started, paused and resumed first, one after another on
/// the caller's thread, which is blocked meanwhile; the local ones follow on the main thread once every remote one has
/// reported. Otherwise, and for a cancel always, each source is asked on a serial queue of its own, and the call
/// returns at once.
class LUMORA_EXPORT LMRMultipleSourceRecorder : public LMRSourceRecorder,
                                                public lumora::Archivable,
                                                public LMRDelegateImplementation<LMRMultipleSourceRecorder> {
  // Makes the constructor callable by the factories only.
  struct MadeByFactory {
    explicit MadeByFactory() = default;
  };

public:
  /// Source recorders, in the order in which they were given.
  using Recorders = std::vector<Recorder>;

  /// A recorder of these sources, in this order. It becomes the delegate of each; the sources are not null.
  static std::shared_ptr<LMRMultipleSourceRecorder> recorderWithSourceRecorders(Recorders sourceRecorders);
  /// An idle recorder of the archived sources. The session, the workflow, the metadata and the submission order are not
  /// archived: its owner sets them, and the sessions of remote sources. A source that cannot be decoded is left out.
  /// Blocks while devices are opened.
  static std::shared_ptr<LMRMultipleSourceRecorder> initWithCoder(const lumora::KeyedUnarchiver& coder);

  LMRMultipleSourceRecorder(MadeByFactory key, Recorders sourceRecorders);
  ~LMRMultipleSourceRecorder() override;

  std::string className() const override;

  /// Properties: any thread.
  ///
  /// The sources. Setting others neither makes this recorder their delegate nor changes the submission order.
  Recorders sourceRecorders() const { return sourceRecorders_.get(); }
  void setSourceRecorders(Recorders sources) { sourceRecorders_.set(std::move(sources)); }

  /// Indexes of the sources in the order in which they get a submission UUID; 0, 1, ... unless set.
  std::vector<std::size_t> sourceRecorderSubmissionOrder() const { return sourceRecorderSubmissionOrder_.get(); }
  void setSourceRecorderSubmissionOrder(std::vector<std::size_t> order) {
    sourceRecorderSubmissionOrder_.set(std::move(order));
  }

  /// The workflow that the recording is made for; needed by stop().
  std::optional<std::string> workflowUUID() const { return workflowUUID_.get(); }
  void setWorkflowUUID(std::optional<std::string> uuid) { workflowUUID_.set(std::move(uuid)); }

  /// What stop() hands to each remote source in the place of its own; absent unless set.
  std::optional<lumora::Dictionary> metadata() const { return metadata_.get(); }
  void setMetadata(std::optional<lumora::Dictionary> metadata) { metadata_.set(std::move(metadata)); }

  /// Whose server holds the recording; needed by stop().
  std::shared_ptr<LMRSession> session() const { return session_.get(); }
  void setSession(std::shared_ptr<LMRSession> session) { session_.set(std::move(session)); }

  /// True, also when all sources are local.
  bool isRemote() const override;

  /// Whether the state named "isStarting", "isRecording", "isPaused", "isCancelled" or "isRemote" (any other is
  /// asserted) has this value in every source. True without sources, whatever the key. Any thread.
  bool sourceRecordersHaveValue_forKey(bool value, std::string_view key) const;

  /// Prepares every source, in order, on the calling thread.
  void bootstrap() override;
  /// Starts the sources. The delay, in seconds, is for the remote ones of a mix, which wait it out at the server; the
  /// local ones of a mix then start without one. Any thread; blocks for the remote sources of a mix.
  void startWithDelay(double delay) override;
  /// Pauses every source. Any thread; blocks for the remote sources of a mix.
  void pause() override;
  /// Goes on with every paused source. Any thread; blocks for the remote sources of a mix.
  void resume() override;
  /// Creates a recording container for the workflow, hands every source a submission UUID of it in the submission
  /// order, and stops all of them at once. Blocks for the creation. Fails when that does, with the sources still
  /// recording: it may be called again.
  ///
  /// Needs a workflow UUID, a session, a submission order of as many indexes as there are sources, and at least as
  /// many UUIDs in the server's reply (asserted). Local files are not submitted: their owner does that, each into its
  /// recorder's submissionUUID(). A source that is neither an LMRLocalVideoRecorder nor an LMRRemoteVideoRecorder is
  /// not stopped and gets no UUID.
  ///
  /// In the application "org.vantor.lumora.recordertester" the sources are only stopped, one after another on the
  /// calling thread. Any thread.
  void stop() override;
  /// Cancels all sources at once. Any thread.
  void cancel() override;

  /// Archives the sources, those that can be, and nothing else.
  void encodeWithCoder(lumora::KeyedArchiver& coder) const override;

  /// @{
  /// What the sources report. Main thread only.
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
  /// @}

private:
  using Request = std::function<void(LMRSourceRecorder& source)>;

  static bool isRecorderTester();
  static bool stateOf(const LMRSourceRecorder& source, std::string_view key);

  void commonInit();
  bool isMixed() const;
  void ask(const Request& request) const;
  void fanOut(const Request& request) const;
  void stopSources(std::vector<std::string> submissionUUIDs) const;
  void stopSource(const Recorder& source, std::vector<std::string>& submissionUUIDs) const;
  bool localSourcesFollow(bool value, std::string_view key, const Request& request) const;
  void logStopOf(const LMRSourceRecorder& source) const;
  void detachSources() const;

  lumora::Property<std::shared_ptr<LMRSession>> session_;
  lumora::Property<std::optional<lumora::Dictionary>> metadata_;
  lumora::Property<std::optional<std::string>> workflowUUID_;
  lumora::Property<std::vector<std::size_t>> sourceRecorderSubmissionOrder_;
  lumora::Property<Recorders> sourceRecorders_;
};
