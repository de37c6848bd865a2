#include "recorder/model/Source.h"

#include "recorder/model/LocalSource.h"
#include "recorder/model/RemoteSource.h"

#include <utility>

namespace recorder {

Source::Source(PlannedSource plan) : plan_(std::move(plan)) {}

Source::~Source() = default;

SourceState Source::state() const {
  if (error_) {
    return SourceState::Failed;
  }
  if (isAskingUser()) {
    return SourceState::AskingUser;
  }
  const auto recorder = this->recorder();
  if (!recorder) {
    return SourceState::Opening;
  }
  if (recorder->isPaused()) {
    return SourceState::Paused;
  }
  if (recorder->isRecording()) {
    return SourceState::Recording;
  }
  return recorder->isStarting() ? SourceState::Starting : SourceState::Ready;
}

void Source::fail(LMRErrorRef error) {
  setError(std::move(error));
  changed.notify();
}

bool Source::hasSound() const {
  return false;
}

const std::vector<lumora::SoundLevel>& Source::levels() const {
  static const std::vector<lumora::SoundLevel> none;
  return none;
}

bool Source::isSilent() const {
  return false;
}

const std::optional<lumora::Picture>& Source::picture() const {
  static const std::optional<lumora::Picture> none;
  return none;
}

const lumora::Data& Source::pictureFile() const {
  static const lumora::Data none;
  return none;
}

bool Source::isAskingUser() const {
  return false;
}

std::shared_ptr<Source> makeSource(const PlannedSource& plan, const std::shared_ptr<LMRSession>& session,
                                   const std::optional<lumora::CompressionOptions>& videoCompression) {
  if (plan.source.isRemote()) {
    return std::make_shared<RemoteSource>(plan, session);
  }
  return std::make_shared<LocalSource>(plan, videoCompression);
}

} // namespace recorder
