#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/recording/LMRLevelMeter.h>
#include <LumoraKit/recording/LMRSampleListener.h>

#include <algorithm>
#include <cmath>
#include <mutex>
#include <utility>

namespace {

constexpr double nanosecondsInSecond = 1e9;
constexpr double decibelsPerDecade = 20;

lumora::HostTime now() {
  return lumora::Platform::current().mediaCapture->hostTime();
}

} // namespace

class LMRLevelMeter::Listener final : public lumora::SampleListener {
public:
  void captureOutput_didOutputSampleBuffer_fromConnection(lumora::MovieFileOutput&,
                                                          const lumora::SampleBuffer& sampleBuffer,
                                                          lumora::CaptureConnection& connection) override {
    if (connection.mediaType() == lumora::MediaType::Sound) {
      add(sampleBuffer.soundLevels(), sampleBuffer.hostTime().value_or(now()));
    }
  }

  std::vector<lumora::SoundLevel> take() {
    const std::lock_guard lock(mutex_);
    return std::exchange(loudest_, {});
  }

  lumora::HostTime lastSound() const {
    const std::lock_guard lock(mutex_);
    return lastSound_;
  }

private:
  void add(const std::vector<lumora::SoundLevel>& levels, lumora::HostTime time) {
    const std::lock_guard lock(mutex_);
    loudest_.resize(std::max(loudest_.size(), levels.size()));
    for (std::size_t i = 0; i < levels.size(); ++i) {
      loudest_[i].peak = std::max(loudest_[i].peak, levels[i].peak);
      loudest_[i].rms = std::max(loudest_[i].rms, levels[i].rms);
    }
    if (std::ranges::any_of(levels, [](const lumora::SoundLevel& level) { return level.rms > silence; })) {
      lastSound_ = std::max(lastSound_, time);
    }
  }

  mutable std::mutex mutex_;
  std::vector<lumora::SoundLevel> loudest_;
  lumora::HostTime lastSound_ = now();
};

std::unique_ptr<LMRLevelMeter>
LMRLevelMeter::meterWithCaptureSession_error(const std::shared_ptr<lumora::CaptureSession>& session,
                                             LMRErrorRef* error) {
  auto listener = std::make_shared<Listener>();
  auto output = lumora::SampleListener::join(*session, listener, error);
  if (!output) {
    return nullptr;
  }
  return std::unique_ptr<LMRLevelMeter>(new LMRLevelMeter(session, std::move(output), std::move(listener)));
}

LMRLevelMeter::LMRLevelMeter(std::shared_ptr<lumora::CaptureSession> session,
                             std::shared_ptr<lumora::MovieFileOutput> output, std::shared_ptr<Listener> listener)
    : session_(std::move(session)), output_(std::move(output)), listener_(std::move(listener)) {}

LMRLevelMeter::~LMRLevelMeter() {
  session_->removeOutput(output_);
}

std::vector<lumora::SoundLevel> LMRLevelMeter::takeLevels() {
  return listener_->take();
}

double LMRLevelMeter::secondsOfSilence() const {
  const auto since = listener_->lastSound();
  return static_cast<double>(std::max(now(), since) - since) / nanosecondsInSecond;
}

double LMRLevelMeter::decibels(double level) {
  return decibelsPerDecade * std::log10(level);
}
