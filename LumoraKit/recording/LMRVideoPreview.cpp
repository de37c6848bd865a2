#include <LumoraKit/recording/LMRSampleListener.h>
#include <LumoraKit/recording/LMRVideoPreview.h>

#include <atomic>
#include <mutex>
#include <utility>

class LMRVideoPreview::Listener final : public lumora::SampleListener {
public:
  void captureOutput_didOutputSampleBuffer_fromConnection(lumora::MovieFileOutput&,
                                                          const lumora::SampleBuffer& sampleBuffer,
                                                          lumora::CaptureConnection& connection) override {
    if (isWanted_.load(std::memory_order_relaxed) && connection.mediaType() == lumora::MediaType::Video &&
        isWanted_.exchange(false)) {
      show(sampleBuffer);
    }
  }

  std::optional<lumora::Picture> take(std::uint32_t maximumWidth, std::uint32_t maximumHeight) {
    const std::lock_guard lock(mutex_);
    width_ = maximumWidth;
    height_ = maximumHeight;
    isWanted_ = true;
    return std::exchange(picture_, std::nullopt);
  }

private:
  // Whoever takes a picture meanwhile does not wait for this one.
  void show(const lumora::SampleBuffer& sampleBuffer) {
    std::unique_lock lock(mutex_);
    const auto width = width_;
    const auto height = height_;
    lock.unlock();
    auto picture = sampleBuffer.picture(width, height);
    lock.lock();
    picture_ = std::move(picture);
  }

  std::atomic<bool> isWanted_ = false;
  std::mutex mutex_;
  std::uint32_t width_ = 1;
  std::uint32_t height_ = 1;
  std::optional<lumora::Picture> picture_;
};

std::unique_ptr<LMRVideoPreview>
LMRVideoPreview::previewWithCaptureSession_error(const std::shared_ptr<lumora::CaptureSession>& session,
                                                 LMRErrorRef* error) {
  auto listener = std::make_shared<Listener>();
  auto output = lumora::SampleListener::join(*session, listener, error);
  if (!output) {
    return nullptr;
  }
  return std::unique_ptr<LMRVideoPreview>(new LMRVideoPreview(session, std::move(output), std::move(listener)));
}

LMRVideoPreview::LMRVideoPreview(std::shared_ptr<lumora::CaptureSession> session,
                                 std::shared_ptr<lumora::MovieFileOutput> output, std::shared_ptr<Listener> listener)
    : session_(std::move(session)), output_(std::move(output)), listener_(std::move(listener)) {}

LMRVideoPreview::~LMRVideoPreview() {
  session_->removeOutput(output_);
}

std::optional<lumora::Picture> LMRVideoPreview::takePicture(std::uint32_t maximumWidth, std::uint32_t maximumHeight) {
  return listener_->take(maximumWidth, maximumHeight);
}
