#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/recording/LMRLevelMeter.h>

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

// Shown every sample of the session. It outlives the meter for as long as a device shows one.
class LMRLevelMeter::Listener final : public lumora::MovieFileOutputDelegate {
public:
  using Output = std::shared_ptr<lumora::MovieFileOutput>;
  using File = std::filesystem::path;

  void captureOutput_didStartRecordingToOutputFileAtURL_forConnections(const Output&, const File&,
                                                                       const Connections&) override {}
  void captureOutput_didPauseRecordingToOutputFileAtURL_forConnections(const Output&, const File&,
                                                                       const Connections&) override {}
  void captureOutput_didResumeRecordingToOutputFileAtURL_forConnections(const Output&, const File&,
                                                                        const Connections&) override {}
  void captureOutput_willFinishRecordingToOutputFileAtURL_forConnections_dueToError(const Output&, const File&,
                                                                                    const Connections&,
                                                                                    const LMRErrorRef&) override {}
  void captureOutput_didFinishRecordingToOutputFileAtURL_forConnections_dueToError(const Output&, const File&,
                                                                                   const Connections&,
                                                                                   const LMRErrorRef&) override {}
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
  const auto output = lumora::Platform::current().mediaCapture->makeMovieFileOutput();
  auto listener = std::make_shared<Listener>();
  output->setDelegate(listener);
  if (LMRErrorRef refusal = session->addOutput(output)) {
    if (error) {
      *error = std::move(refusal);
    }
    return nullptr;
  }
  return std::unique_ptr<LMRLevelMeter>(new LMRLevelMeter(session, output, std::move(listener)));
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
