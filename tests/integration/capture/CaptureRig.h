#pragma once

#include "support/HeadlessDevices.h"

#include <LumoraKit/platform/MediaCapture.h>

#include <gtest/gtest.h>

#include <chrono>
#include <condition_variable>
#include <functional>
#include <mutex>

namespace lumora::testing {

/// What a delegate was told, other than samples.
struct Told {
  std::string event;
  std::filesystem::path file;
  LMRErrorRef error;
};

/// A delegate that notes what it is told and acts at the next picture (or sound) when asked to.
class NotingDelegate final : public MovieFileOutputDelegate {
public:
  using Output = std::shared_ptr<MovieFileOutput>;
  using Action = std::function<void(MovieFileOutput&)>;

  /// Runs the action inside the message of the next sample of that type; returns the sample's time, or 0 when none
  /// came within 10 seconds.
  HostTime atNext(MediaType type, Action action);
  /// Waits for a message about a file; false when it did not come within 20 seconds.
  bool waitFor(const std::string& event, const std::filesystem::path& file);
  bool waitForEnd(const std::filesystem::path& file);
  std::vector<Told> told() const;
  /// The events for one file, in order, separated by blanks.
  std::string events(const std::filesystem::path& file) const;
  /// The error of the last message.
  LMRErrorRef lastError() const;
  /// The times of the pictures that were shown so far.
  std::vector<HostTime> pictures() const;

  void captureOutput_didStartRecordingToOutputFileAtURL_forConnections(const Output& output,
                                                                       const std::filesystem::path& file,
                                                                       const Connections& connections) override;
  void captureOutput_didPauseRecordingToOutputFileAtURL_forConnections(const Output& output,
                                                                       const std::filesystem::path& file,
                                                                       const Connections& connections) override;
  void captureOutput_didResumeRecordingToOutputFileAtURL_forConnections(const Output& output,
                                                                        const std::filesystem::path& file,
                                                                        const Connections& connections) override;
  void captureOutput_willFinishRecordingToOutputFileAtURL_forConnections_dueToError(const Output& output,
                                                                                    const std::filesystem::path& file,
                                                                                    const Connections& connections,
                                                                                    const LMRErrorRef& error) override;
  void captureOutput_didFinishRecordingToOutputFileAtURL_forConnections_dueToError(const Output& output,
                                                                                   const std::filesystem::path& file,
                                                                                   const Connections& connections,
                                                                                   const LMRErrorRef& error) override;
  void captureOutput_didOutputSampleBuffer_fromConnection(MovieFileOutput& output, const SampleBuffer& sampleBuffer,
                                                          CaptureConnection& connection) override;

private:
  void note(const std::string& event, const std::filesystem::path& file, const LMRErrorRef& error);

  mutable std::mutex mutex_;
  mutable std::condition_variable changed_;
  std::vector<Told> told_;
  std::vector<HostTime> pictures_;
  MediaType wanted_ = MediaType::Video;
  Action action_;
  HostTime actedAt_ = 0;
};

/// A session of the headless camera and microphone with a movie-file output, and a temporary folder.
class CaptureRig : public ::testing::Test {
protected:
  void SetUp() override;
  void TearDown() override;

  MediaCapture& capture() const;
  /// Adds an opened device to the session; skips nothing: a failure fails the test.
  void addDevice(const std::string& uniqueID);
  void addCameraAndMicrophone();
  /// Starts the session with the output.
  void run();
  /// Records about so long and waits for the end, which must be a good one.
  void record(const std::filesystem::path& file, std::chrono::milliseconds time);
  /// Each returns the time of the picture that it happened at.
  HostTime startAtNextPicture(const std::filesystem::path& file);
  HostTime pauseAtNextPicture();
  HostTime resumeAtNextPicture();
  HostTime stopAtNextPicture();
  /// Expects that the last recording ended with such an error, and that the session can record afterwards.
  void expectError(CaptureErrorCode code);
  void expectGoesOn();
  std::filesystem::path file(const std::string& name) const { return folder_ / name; }

  std::unique_ptr<HeadlessDevices> devices_;
  std::filesystem::path folder_;
  std::shared_ptr<CaptureSession> session_;
  std::shared_ptr<MovieFileOutput> output_;
  std::shared_ptr<NotingDelegate> delegate_ = std::make_shared<NotingDelegate>();
};

} // namespace lumora::testing
