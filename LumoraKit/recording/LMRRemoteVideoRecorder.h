#pragma once

#include <LumoraKit/actions/LMRSession.h>
#include <LumoraKit/platform/KeyedArchive.h>
#include <LumoraKit/platform/Property.h>
#include <LumoraKit/platform/Value.h>
#include <LumoraKit/recording/LMRSourceRecorder.h>

#include <atomic>
#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <utility>

class LMRAction;

/// Records with a camera that is bound to the server.
///
///     auto recorder = LMRRemoteVideoRecorder::recorderWithRemoteRecorderName_session("Studio A", session);
///     recorder->setDelegate(controller);
///     recorder->setWorkflow("single-video");
///     recorder->start();
///     ...
///     recorder->stop();
///
/// The server records, and files the recording itself when the camera is stopped: each request is one server command,
/// and nothing is uploaded from this machine. A request blocks until the tool has ended and the delegate has been told
/// of the outcome; call it on a thread that may block. A command that fails is not tried again; its error is the error
/// of the failure message.
///
/// Objects of this class must be held by a std::shared_ptr.
class LUMORA_EXPORT LMRRemoteVideoRecorder : public LMRSourceRecorder, public lumora::Archivable {
public:
  /// \param remoteRecorderName the name by which the server knows the camera
  /// \param session whose server and credentials every command uses
  static std::shared_ptr<LMRRemoteVideoRecorder>
  recorderWithRemoteRecorderName_session(const std::optional<std::string>& remoteRecorderName,
                                         const std::shared_ptr<LMRSession>& session);
  /// An idle recorder for the archived camera, without a session: its owner sets one, and where to submit to.
  static std::shared_ptr<LMRRemoteVideoRecorder> initWithCoder(const lumora::KeyedUnarchiver& coder);

  /// A recorder for a camera that is bound to the server; see recorderWithRemoteRecorderName_session().
  LMRRemoteVideoRecorder(std::optional<std::string> remoteRecorderName, std::shared_ptr<LMRSession> session);
  ~LMRRemoteVideoRecorder() override;

  std::string className() const override;

  /// Properties: any thread. The values that count are those at the moment of the request.
  std::optional<std::string> remoteRecorderName() const { return remoteRecorderName_.get(); }
  void setRemoteRecorderName(std::optional<std::string> name) { remoteRecorderName_.set(std::move(name)); }

  /// The login session that every command is sent with.
  std::shared_ptr<LMRSession> session() const { return session_.get(); }
  void setSession(std::shared_ptr<LMRSession> session) { session_.set(std::move(session)); }

  /// The name of the workflow that the stopped recording is submitted to, unless there is a submission UUID.
  std::optional<std::string> workflow() const { return workflow_.get(); }
  void setWorkflow(std::optional<std::string> workflow) { workflow_.set(std::move(workflow)); }

  /// What is sent to the viewers with the stopped recording (LMREpisodeUserMetadata...Key); empty unless set. Absent:
  /// an empty title and an empty description are sent.
  std::optional<lumora::Dictionary> metadata() const { return metadata_.get(); }
  void setMetadata(std::optional<lumora::Dictionary> metadata) { metadata_.set(std::move(metadata)); }

  /// The member of a recording container that the stopped recording is submitted into. It wins over the workflow.
  std::optional<std::string> submissionUUID() const { return submissionUUID_.get(); }
  void setSubmissionUUID(std::optional<std::string> uuid) { submissionUUID_.set(std::move(uuid)); }

  /// Whole seconds that the server waits before the camera records; set by every start.
  std::uint64_t delayBeforeRecording() const { return delayBeforeRecording_; }
  void setDelayBeforeRecording(std::uint64_t seconds) { delayBeforeRecording_ = seconds; }

  /// True.
  bool isRemote() const override;

  /// Has the server wait out the delay, of which whole seconds count, and start the camera. `delay` must not be
  /// negative. Blocks. Any thread, as the other requests.
  void startWithDelay(double delay) override;
  /// Has the server pause the recording. Blocks.
  void pause() override;
  /// Has the server go on with the paused recording. Blocks.
  void resume() override;
  /// Stops the camera and has the server submit what it recorded. Needs a submission UUID or a workflow, and a place
  /// for the metadata file (asserted by the action's factory).
  void stop() override;
  /// Ends the recording and has the server throw it away.
  void cancel() override;

  /// @{
  /// The ends of the commands, called with the finished action: each reports the outcome to the delegate.
  void recordingStartedWithAction(const std::shared_ptr<LMRAction>& action);
  void failedToStartRecordingWithAction(const std::shared_ptr<LMRAction>& action);
  void pausedRecordingWithAction(const std::shared_ptr<LMRAction>& action);
  void failedToPauseRecordingWithAction(const std::shared_ptr<LMRAction>& action);
  void resumedRecordingWithAction(const std::shared_ptr<LMRAction>& action);
  void failedToResumeRecordingWithAction(const std::shared_ptr<LMRAction>& action);
  void stoppedRecordingWithAction(const std::shared_ptr<LMRAction>& action);
  void failedToStopRecordingWithAction(const std::shared_ptr<LMRAction>& action);
  void cancelledRecordingWithAction(const std::shared_ptr<LMRAction>& action);
  void failedToCancelRecordingWithAction(const std::shared_ptr<LMRAction>& action);
  /// @}

  /// Archives the camera's name and nothing else.
  void encodeWithCoder(lumora::KeyedArchiver& coder) const override;

protected:
  /// The camera's name in an archive; nothing when it is not there.
  static std::optional<std::string> archivedName(const lumora::KeyedUnarchiver& coder);
  /// The start of this class and of its audio-only subclass.
  void startWithDelay_audioOnly(double delay, bool audioOnly);

private:
  using ActionTarget = void (LMRRemoteVideoRecorder::*)(const std::shared_ptr<LMRAction>&);

  std::shared_ptr<LMRAction> stopAction() const;
  void run(const std::shared_ptr<LMRAction>& action, ActionTarget succeeded, ActionTarget failed);

  // Members die in the reverse of this order, so the session goes last.
  lumora::Property<std::shared_ptr<LMRSession>> session_;
  lumora::Property<std::optional<std::string>> submissionUUID_;
  lumora::Property<std::optional<std::string>> workflow_;
  lumora::Property<std::optional<lumora::Dictionary>> metadata_;
  lumora::Property<std::optional<std::string>> remoteRecorderName_;
  std::atomic<std::uint64_t> delayBeforeRecording_ = 0;
};
