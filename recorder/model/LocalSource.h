#pragma once

#include "recorder/model/Source.h"

#include <LumoraKit/LumoraKit.h>

#include <memory>

namespace recorder {

/// A camera, the screen or a microphone of this machine. Devices are opened and closed one after another, on a queue.
class LocalSource final : public Source {
public:
  /// No picture or sound for so many seconds: it was lost.
  static constexpr int patience = 4;
  /// So many seconds without sound: the user is warned.
  static constexpr int silence = 10;

  LocalSource(PlannedSource plan, std::optional<lumora::CompressionOptions> videoCompression);
  ~LocalSource() override;

  void open() override;
  std::shared_ptr<LMRSourceRecorder> recorder() const override { return recorder_; }
  void renewRecorder() override;
  void look(std::optional<std::pair<std::uint32_t, std::uint32_t>> size) override;

  bool hasSound() const override;
  const std::vector<lumora::SoundLevel>& levels() const override { return levels_; }
  bool isSilent() const override;
  const std::optional<lumora::Picture>& picture() const override { return picture_; }

protected:
  bool isAskingUser() const override { return isAskingUser_; }

private:
  // How long an answer has been waited for.
  class Waiting {
  public:
    void note(bool hasCome);
    void forget() { since_ = 0; }
    bool isTooLong() const;

  private:
    lumora::HostTime since_ = 0;
  };

  void start(const std::shared_ptr<lumora::CaptureSession>& session);
  void opened(const std::shared_ptr<lumora::CaptureSession>& session, const LMRErrorRef& error);
  void joinSession();
  std::shared_ptr<LMRLocalVideoRecorder> makeRecorder() const;

  const std::optional<lumora::CompressionOptions> videoCompression_;
  bool isAskingUser_ = false;
  std::shared_ptr<lumora::CaptureSession> session_;
  std::shared_ptr<LMRLocalVideoRecorder> recorder_;
  std::unique_ptr<LMRLevelMeter> meter_;
  std::unique_ptr<LMRVideoPreview> preview_;
  std::vector<lumora::SoundLevel> levels_;
  std::optional<lumora::Picture> picture_;
  Waiting soundWaiting_;
  Waiting pictureWaiting_;
};

} // namespace recorder
