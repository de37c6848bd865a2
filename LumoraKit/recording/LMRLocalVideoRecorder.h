#pragma once

#include <LumoraKit/platform/KeyedArchive.h>
#include <LumoraKit/platform/MediaCapture.h>
#include <LumoraKit/recording/LMRSourceRecorder.h>

#include <filesystem>
#include <limits>

/// Records a capture session into a movie file.
///
///     LMRErrorRef error;
///     auto session = LMRCaptureSessionAdditions::captureSessionWithAudioDevice_videoDevice_error(
///         LMRCaptureDeviceAdditions::defaultAudioCaptureDevice(),
///         LMRCaptureDeviceAdditions::defaultVideoCaptureDevice(), &error);
///     auto recorder = LMRLocalVideoRecorder::recorderWithCaptureSession(session);
///     recorder->setDelegate(controller);
///     recorder->bootstrap();
///     session->startRunning();
///     recorder->start();
///
/// Start, pause and resume are not performed when they are requested: a request notes the host time, and the first
/// captured sample that has reached it starts, pauses or resumes the file, so that each falls on a sample. In the file
/// time counts from the request, not from the sample: recorders that are asked together stay together.
///
/// The application keeps the session running; the recorder stops it when it dies, which may happen on any thread.
class LUMORA_EXPORT LMRLocalVideoRecorder : public LMRSourceRecorder,
                                            public lumora::Archivable,
                                            public lumora::MovieFileOutputDelegate {
protected:
  /// Makes the constructor callable by the factories of this class and its subclasses only.
  struct MadeByFactory {
    explicit MadeByFactory() = default;
  };

public:
  /// A new recorder for the session, with a movie-file output of its own.
  static std::shared_ptr<LMRLocalVideoRecorder>
  recorderWithCaptureSession(const std::shared_ptr<lumora::CaptureSession>& captureSession);
  /// An idle recorder for the archived camera and microphone; null, with a log line, when one of them is missing or
  /// cannot be opened. Blocks while they are opened.
  static std::shared_ptr<LMRLocalVideoRecorder> initWithCoder(const lumora::KeyedUnarchiver& coder);

  explicit LMRLocalVideoRecorder(MadeByFactory key);
  ~LMRLocalVideoRecorder() override;

  std::string className() const override;

  /// The session that is recorded; needed before bootstrap().
  std::shared_ptr<lumora::CaptureSession> captureSession() const { return captureSession_.get(); }
  void setCaptureSession(std::shared_ptr<lumora::CaptureSession> session) { captureSession_.set(std::move(session)); }

  /// How sound and video are encoded; applied by bootstrap(). Absent: the framework's choice.
  std::optional<lumora::CompressionOptions> audioCompressionOptions() const { return audioCompressionOptions_.get(); }
  void setAudioCompressionOptions(const std::optional<lumora::CompressionOptions>& options) {
    audioCompressionOptions_.set(options);
  }
  /// How the pictures are encoded; applied by bootstrap(). Absent: the framework's choice.
  std::optional<lumora::CompressionOptions> videoCompressionOptions() const { return videoCompressionOptions_.get(); }
  void setVideoCompressionOptions(const std::optional<lumora::CompressionOptions>& options) {
    videoCompressionOptions_.set(options);
  }

  /// Where the movie is written; chosen by bootstrap().
  std::optional<std::filesystem::path> outputFileURL() const { return outputFileURL_.get(); }
  void setOutputFileURL(std::optional<std::filesystem::path> file) { outputFileURL_.set(std::move(file)); }

  /// When the output reported that the recording started; nothing before.
  std::optional<lumora::WallTime> recordingStartDate() const { return recordingStartDate_.get(); }
  /// When the output reported that the file is finished; nothing before.
  std::optional<lumora::WallTime> recordingStopDate() const { return recordingStopDate_.get(); }

  /// The moments at which the file began, was paused, went on, was paused and so on: its time is the host's from the
  /// first one on, without the pauses. Recorders whose moments agree are in step.
  std::vector<lumora::HostTime> hostTimesOfFile() const { return hostTimesOfFile_.get(); }

  /// What writes the file; this recorder is its delegate.
  std::shared_ptr<lumora::MovieFileOutput> movieFileOutput() const { return movieFileOutput_.get(); }

  /// The server submission that the file belongs to; set by whoever stops the recording.
  std::optional<std::string> submissionUUID() const { return submissionUUID_.get(); }
  void setSubmissionUUID(std::optional<std::string> uuid) { submissionUUID_.set(std::move(uuid)); }

  /// Whether the file was submitted; set by whoever submits it.
  bool isSubmitted() const { return isSubmitted_; }
  void setIsSubmitted(bool isSubmitted) { isSubmitted_ = isSubmitted; }

  /// The host time of the pending request to start; nothing when none is pending.
  std::optional<lumora::HostTime> hostTimeToStart() const { return hostTimeToStart_.get(); }
  /// The host time of the pending request to pause; nothing when none is pending.
  std::optional<lumora::HostTime> hostTimeToPause() const { return hostTimeToPause_.get(); }
  /// The host time of the pending request to resume; nothing when none is pending.
  std::optional<lumora::HostTime> hostTimeToResume() const { return hostTimeToResume_.get(); }

  /// Adds the output to the session and chooses the file: a new UUID with ".mov" in the application-support folder,
  /// or in the folder that the application's preferences name under LMRRecorderDestinationFolder. Needs a session
  /// (asserted). Nothing is written yet. An output that cannot be added fails the start. Any thread.
  void bootstrap() override;
  /// Starts the file at the first sample that is captured after now. The delay is ignored. Any thread.
  void startWithDelay(double delay) override;
  /// Pauses the file at the first sample that is captured from now on. Any thread.
  void pause() override;
  /// Goes on with the paused file at the first sample that is captured from now on. Any thread.
  void resume() override;
  /// Finishes the file. Fails at once, without an error, when none is being written. Any thread.
  void stop() override;
  /// The same, and deletes the file.
  void cancel() override;

  /// Archives the identifiers of the devices whose sound or video is enabled, and nothing else.
  void encodeWithCoder(lumora::KeyedArchiver& coder) const override;

  void captureOutput_didStartRecordingToOutputFileAtURL_forConnections(
      const std::shared_ptr<lumora::MovieFileOutput>& output, const std::filesystem::path& file,
      const Connections& connections) override;
  void captureOutput_didPauseRecordingToOutputFileAtURL_forConnections(
      const std::shared_ptr<lumora::MovieFileOutput>& output, const std::filesystem::path& file,
      const Connections& connections) override;
  void captureOutput_didResumeRecordingToOutputFileAtURL_forConnections(
      const std::shared_ptr<lumora::MovieFileOutput>& output, const std::filesystem::path& file,
      const Connections& connections) override;
  void captureOutput_willFinishRecordingToOutputFileAtURL_forConnections_dueToError(
      const std::shared_ptr<lumora::MovieFileOutput>& output, const std::filesystem::path& file,
      const Connections& connections, const LMRErrorRef& error) override;
  void captureOutput_didFinishRecordingToOutputFileAtURL_forConnections_dueToError(
      const std::shared_ptr<lumora::MovieFileOutput>& output, const std::filesystem::path& file,
      const Connections& connections, const LMRErrorRef& error) override;
  void captureOutput_didOutputSampleBuffer_fromConnection(lumora::MovieFileOutput& output,
                                                          const lumora::SampleBuffer& sampleBuffer,
                                                          lumora::CaptureConnection& connection) override;

protected:
  /// A recorder of the wanted class for a session.
  template <class Recorder>
  static std::shared_ptr<Recorder> makeWithCaptureSession(const std::shared_ptr<lumora::CaptureSession>& session) {
    auto recorder = std::make_shared<Recorder>(MadeByFactory());
    recorder->setCaptureSession(session);
    recorder->commonInit();
    return recorder;
  }
  /// A recorder of the wanted class for the archived devices; null when its session cannot be built.
  template <class Recorder> static std::shared_ptr<Recorder> makeWithCoder(const lumora::KeyedUnarchiver& coder) {
    auto recorder = std::make_shared<Recorder>(MadeByFactory());
    LMRLocalVideoRecorder& decoded = *recorder;
    return decoded.decodeWithCoder(coder) ? recorder : nullptr;
  }

  /// Makes a fresh movie-file output with this recorder as its delegate.
  void commonInit();
  /// Rebuilds the session of a new recorder; false when it cannot.
  virtual bool decodeWithCoder(const lumora::KeyedUnarchiver& coder);

  /// How a session of sound alone, or of sound and one more input, is built.
  using SessionOfAudioDevice = std::shared_ptr<lumora::CaptureSession> (*)(
      const std::shared_ptr<lumora::CaptureDevice>& audioDevice, LMRErrorRef* error);
  /// For a decoding subclass: puts the session of the archived microphone in the place of the one with a camera. The
  /// output stays. False, with a log line when there is an error, when there is no such session.
  bool rebuildSession(const lumora::KeyedUnarchiver& coder, SessionOfAudioDevice makeSession);

  /// Asks the output to begin the file at that moment.
  void beginFile(lumora::HostTime time);
  /// Asks the output to pause the file at that moment.
  void pauseFile(lumora::HostTime time);
  /// Asks the output to go on with the file at that moment.
  void resumeFile(lumora::HostTime time);

private:
  // A host time that waits for its sample. The largest one stands for "none"; it is 584 years away.
  class PendingHostTime {
  public:
    bool isSet() const { return time_.load(std::memory_order_relaxed) != none; }
    std::optional<lumora::HostTime> get() const;
    void set(lumora::HostTime time) { time_ = time; }
    // Takes it away when the sample has passed it; or has reached it. Nothing otherwise.
    std::optional<lumora::HostTime> takeBefore(lumora::HostTime sample);
    std::optional<lumora::HostTime> takeUpTo(lumora::HostTime sample);

  private:
    std::optional<lumora::HostTime> take(lumora::HostTime time);
    static constexpr auto none = std::numeric_limits<lumora::HostTime>::max();
    std::atomic<lumora::HostTime> time_ = none;
  };

  bool takeDecodedSession(const std::shared_ptr<lumora::CaptureSession>& session, const LMRErrorRef& error);
  void setCompressionOptionsOfConnections() const;
  void noteHostTime(lumora::HostTime time, bool hasEffect);
  bool finishFile() const;
  void actOnSample(const lumora::SampleBuffer& sampleBuffer);
  void reportFinish(const std::filesystem::path& file, const LMRErrorRef& error);

  // First, and together: the sample callback looks at them for every sample.
  PendingHostTime hostTimeToStart_;
  PendingHostTime hostTimeToPause_;
  PendingHostTime hostTimeToResume_;
  // Held while a sample's action is performed, so that the actions of samples on several threads keep their order.
  std::mutex actionMutex_;

  lumora::Property<std::shared_ptr<lumora::CaptureSession>> captureSession_;
  lumora::Property<std::optional<lumora::CompressionOptions>> audioCompressionOptions_;
  lumora::Property<std::optional<lumora::CompressionOptions>> videoCompressionOptions_;
  lumora::Property<std::optional<std::filesystem::path>> outputFileURL_;
  lumora::Property<std::optional<lumora::WallTime>> recordingStartDate_;
  lumora::Property<std::optional<lumora::WallTime>> recordingStopDate_;
  lumora::Property<std::vector<lumora::HostTime>> hostTimesOfFile_;
  lumora::Property<std::shared_ptr<lumora::MovieFileOutput>> movieFileOutput_;
  lumora::Property<std::optional<std::string>> submissionUUID_;
  std::atomic<bool> deleteMovieFileWhenItFinishesRecording_ = false;
  std::atomic<bool> isSubmitted_ = false;
};
