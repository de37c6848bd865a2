#pragma once

#include "support/HeadlessDevices.h"
#include "support/RecordingDelegate.h"
#include "support/Sandbox.h"

#include <LumoraKit/actions/LMRSession.h>
#include <LumoraKit/platform/MediaCapture.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/recording/LMRSourceRecorder.h>

#include <gtest/gtest.h>

#include <filesystem>
#include <memory>
#include <string>

/// Real devices, and a server with the remote camera "Studio A" and a workflow of three parts. Recordings go into a
/// folder of the test.
class RecordingStudio : public testing::Test {
protected:
  static constexpr const char* cameraName = "Studio A";

  void SetUp() override;
  void TearDown() override;

  std::filesystem::path recordings() const { return server_.folder() / "recordings"; }
  std::string workflowUUID() const { return server_.workflowUUID("three-parts"); }

  /// A camera and a microphone, a microphone, the screen; running.
  std::shared_ptr<lumora::CaptureSession> cameraSession();
  std::shared_ptr<lumora::CaptureSession> microphoneSession();
  std::shared_ptr<lumora::CaptureSession> screenSession();

  /// Serves the main thread until the delegate was told something new, which must be this, and adds up how long that
  /// took.
  void awaitMessage(const std::string& selector);
  /// The request, and then the same.
  template <class Request> void expectAfter(Request request, const std::string& selector) {
    const auto requested = std::chrono::steady_clock::now();
    request();
    awaitMessage(selector);
    latency_ += std::chrono::duration<double>(std::chrono::steady_clock::now() - requested).count();
  }
  /// Serves the main thread until so many more seconds are recorded.
  void record(const LMRSourceRecorder& recorder, double seconds);
  /// Serves the main thread for a while.
  void pass(double seconds);
  /// Two seconds, a pause of one, and two more.
  void recordAroundAPause(LMRSourceRecorder& recorder);

  /// The file plays, has these tracks, and is as long as the recorder counted, but for the time that the requests took.
  void expectMovie(const std::filesystem::path& file, bool hasPicture, bool hasSound, double seconds) const;

  const lumora::Platform previous_ = lumora::Platform::current();
  lumora::tests::SandboxServer server_;
  std::unique_ptr<lumora::testing::HeadlessDevices> devices_;
  std::shared_ptr<LMRSession> session_ = LMRSession::session();
  std::shared_ptr<lumora::tests::RecordingDelegate> delegate_ = std::make_shared<lumora::tests::RecordingDelegate>();
  std::size_t messages_ = 0;
  double latency_ = 0;

private:
  void logIn();
  static std::shared_ptr<lumora::CaptureSession> running(std::shared_ptr<lumora::CaptureSession> session,
                                                         const LMRErrorRef& error);
};
