#pragma once

#include <LumoraKit/platform/MediaCapture.h>

#include <atomic>
#include <deque>
#include <map>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

namespace lumora::fakes {

class FakeCaptureSession;

/// A sample that holds nothing but its host time, and the levels of its sound or its picture when it is given any.
class LUMORA_EXPORT FakeSampleBuffer : public SampleBuffer {
public:
  /// A sample of that host time; sound when it is given levels, one a channel.
  explicit FakeSampleBuffer(std::optional<HostTime> hostTime, std::vector<SoundLevel> soundLevels = {})
      : hostTime_(hostTime), soundLevels_(std::move(soundLevels)) {}
  FakeSampleBuffer(std::optional<HostTime> hostTime, Picture picture)
      : hostTime_(hostTime), picture_(std::move(picture)) {}

  std::optional<HostTime> hostTime() const override;
  std::vector<SoundLevel> soundLevels() const override;
  /// The picture as it was given: it is not made smaller.
  std::optional<Picture> picture(std::uint32_t maximumWidth, std::uint32_t maximumHeight) const override;
  /// How often something of it was read.
  int reads() const { return reads_; }

private:
  const std::optional<HostTime> hostTime_;
  const std::vector<SoundLevel> soundLevels_;
  const std::optional<Picture> picture_;
  mutable std::atomic<int> reads_ = 0;
};

/// A movie-file output that is driven by hand: samples and outcomes happen when the test says so, and on the thread
/// on which it says so.
///
///     session->startRunning();
///     recorder->start();
///     output->emitSample(MediaType::Video, capture->advanceHostTime(1)); // the recorder asks for the file
///     output->deliverOutcomes();                                         // ... and learns that it was started
///
/// The file is a short text, made through the installed platform's Files when the start is delivered; a file that
/// cannot be made ends with that error. Any thread.
class LUMORA_EXPORT FakeMovieFileOutput : public MovieFileOutput,
                                          public std::enable_shared_from_this<FakeMovieFileOutput> {
public:
  FakeMovieFileOutput();
  ~FakeMovieFileOutput() override;

  void setDelegate(const std::weak_ptr<MovieFileOutputDelegate>& delegate) override;
  std::vector<std::shared_ptr<CaptureConnection>> connections() const override;
  void setCompressionOptions_forConnection(const CompressionOptions& options,
                                           const std::shared_ptr<CaptureConnection>& connection) override;
  void recordToOutputFileURL(const std::optional<std::filesystem::path>& file) override;
  void pauseRecording() override;
  void resumeRecording() override;
  void recordToOutputFileURL_atHostTime(const std::filesystem::path& file, HostTime time) override;
  void pauseRecordingAtHostTime(HostTime time) override;
  void resumeRecordingAtHostTime(HostTime time) override;
  std::optional<std::filesystem::path> outputFileURL() const override;
  std::uint64_t expectedBitRate() const override;

  /// Shows a sample to the delegate, on the calling thread. False when nothing was shown: the session is not running,
  /// the connection is disabled or in no input of the session, or the delegate died.
  bool emitSample(const SampleBuffer& sample, const std::shared_ptr<CaptureConnection>& connection);
  /// The same with a new sample on the first enabled connection of that type.
  bool emitSample(MediaType type, std::optional<HostTime> hostTime);

  /// Reports the outcomes of all requests so far in their order, on the calling thread; also of those that are made
  /// meanwhile. The number of reports: 0 inside of another call, which goes on with them.
  int deliverOutcomes();
  /// How many outcomes wait.
  std::size_t pendingOutcomes() const;

  /// The recording in progress ends by itself with this error (a lost device, a failed encoder); to be delivered like
  /// every outcome. Nothing happens when none is in progress.
  void endWithError(LMRErrorRef error);
  /// The same with the error of a full disk.
  void runOutOfDiskSpace();

  /// In bits a second; 4 Mbit/s unless set, whatever the compression options are.
  void setExpectedBitRate(std::uint64_t bitRate);

  /// The requests in their order: "record <file>", "finish", "pause", "resume"; also those that had no effect.
  std::vector<std::string> requests() const;
  /// The moments of those requests that named one.
  std::vector<HostTime> requestedHostTimes() const;
  /// The options that were set for a connection; nothing when none were.
  std::optional<CompressionOptions> compressionOptions(const CaptureConnection& connection) const;

  /// For the session. False when the output is in one already. An output that leaves its session finishes its file.
  bool attachTo(std::weak_ptr<FakeCaptureSession> session);
  /// The session lets go of the output.
  void detach();

private:
  enum class State { Idle, Recording, Paused };
  enum class Event { Started, Paused, Resumed, Finished };
  struct Outcome {
    Event event;
    std::filesystem::path file;
    LMRErrorRef error;
  };

  void note(HostTime time);
  void finish(LMRErrorRef error);
  void report(Outcome outcome);
  LMRErrorRef makeFile(const std::filesystem::path& file);
  void forget(const std::filesystem::path& file);
  void tell(MovieFileOutputDelegate& delegate, const Outcome& outcome);

  mutable std::mutex mutex_;
  std::weak_ptr<MovieFileOutputDelegate> delegate_;
  std::weak_ptr<FakeCaptureSession> session_;
  std::map<const CaptureConnection*, CompressionOptions> compressionOptions_;
  std::vector<std::string> requests_;
  std::vector<HostTime> requestedHostTimes_;
  std::deque<Outcome> outcomes_;
  State state_ = State::Idle;
  std::optional<std::filesystem::path> outputFileURL_;
  bool isDelivering_ = false;
  std::uint64_t expectedBitRate_ = 4'000'000;
};

} // namespace lumora::fakes
