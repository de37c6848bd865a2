#pragma once

#include "PortalDesktop.h"
#include "support/HeadlessDevices.h"
#include "support/RecordingDelegate.h"

#include <LumoraKit/platform/MediaCapture.h>
#include <LumoraKit/recording/LMRLocalScreenRecorder.h>

#include <gtest/gtest.h>

/// A desktop whose screen is the headless camera, and a session with that screen.
class ScreenPortal : public testing::Test {
protected:
  static constexpr const char* screenNode = "lumora_camera";

  void SetUp() override;
  void TearDown() override;

  /// The whole desktop.
  void startDesktop();
  /// A session with the screen, which the desktop has not been asked for yet.
  void makeSession();
  std::shared_ptr<LMRLocalScreenRecorder> makeRecorder();
  /// Starts the session, which must succeed.
  void run();
  /// The same, which must fail with such an error.
  LMRErrorRef expectFailure(lumora::CaptureErrorCode code);
  /// Serves the main thread until the delegate was told something new.
  void awaitMessage(const std::string& selector);
  void recordFor(const LMRSourceRecorder& recorder, double seconds);

  const lumora::Platform previous_ = lumora::Platform::current();
  const lumora::tests::TemporaryFolder folder_;
  std::unique_ptr<lumora::testing::HeadlessDevices> devices_;
  std::unique_ptr<lumora::tests::PortalDesktop> desktop_;
  std::shared_ptr<lumora::CaptureSession> session_;
  std::shared_ptr<lumora::tests::RecordingDelegate> delegate_ = std::make_shared<lumora::tests::RecordingDelegate>();
  std::size_t messages_ = 0;
};
