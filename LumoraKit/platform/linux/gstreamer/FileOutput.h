#pragma once

#include <LumoraKit/platform/linux/gstreamer/Recording.h>
#include <LumoraKit/platform/linux/gstreamer/Snapshot.h>

#include <map>

namespace lumora::backend {

/// The movie-file output: shows every sample to its delegate and then offers it to the recordings in progress. (More
/// than one only while a file is being finished and the next one has begun.)
class FileOutput final : public MovieFileOutput, public std::enable_shared_from_this<FileOutput> {
public:
  FileOutput(std::shared_ptr<Queues> queues, std::shared_ptr<Encoders> encoders);
  FileOutput(const FileOutput&) = delete;
  FileOutput& operator=(const FileOutput&) = delete;
  ~FileOutput() override;

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

  /// For the session: takes the output, unless another session has it; gives it the session's connections; lets it
  /// go, which finishes its file.
  bool join();
  void attach(std::vector<std::shared_ptr<Connection>> connections);
  void leave();

  /// On the device's thread.
  void take(const CapturedSample& sample, const std::shared_ptr<Connection>& connection);
  void deviceFailed(const std::shared_ptr<Connection>& connection, const LMRErrorRef& error);

private:
  using Recordings = std::vector<std::shared_ptr<Recording>>;

  void record(const std::optional<std::filesystem::path>& file, HostTime time);
  std::shared_ptr<Recording> begin(const std::filesystem::path& file, HostTime time);
  std::vector<TrackPlan> planTracks() const;
  std::shared_ptr<Recording> current() const;
  void recordingTold(const Recording& recording, RecordingEvent event, const LMRErrorRef& error);
  void forget(const Recording& recording);
  void tellDelegate(const RecordingPlan& plan, RecordingEvent event, const LMRErrorRef& error);

  const std::shared_ptr<Queues> queues_;
  const std::shared_ptr<Encoders> encoders_;
  // Messages to the delegate other than samples.
  const std::shared_ptr<WorkQueue> messages_;
  Snapshot<std::weak_ptr<MovieFileOutputDelegate>> delegate_;
  Snapshot<Recordings> offered_;

  mutable std::mutex mutex_;
  bool inSession_ = false;
  std::vector<std::shared_ptr<Connection>> connections_;
  std::map<std::shared_ptr<CaptureConnection>, CompressionOptions> options_;
  Recordings recordings_;
  // The last of the recordings, until it has finished.
  std::shared_ptr<Recording> current_;
};

} // namespace lumora::backend
