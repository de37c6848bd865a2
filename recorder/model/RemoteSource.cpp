#include "recorder/model/RemoteSource.h"

#include <utility>

namespace recorder {
namespace {

constexpr lumora::HostTime pause = 5'000'000'000;

lumora::HostTime now() {
  return lumora::Platform::current().mediaCapture->hostTime();
}

} // namespace

RemoteSource::RemoteSource(PlannedSource plan, std::shared_ptr<LMRSession> session)
    : Source(std::move(plan)), session_(std::move(session)) {}

// Nothing is to be opened: the server has the camera.
void RemoteSource::open() {
  setError(nullptr);
  renewRecorder();
  changed.notify();
}

void RemoteSource::renewRecorder() {
  recorder_ = LMRRemoteVideoRecorder::recorderWithRemoteRecorderName_session(plan().source.identifier, session_);
}

void RemoteSource::look(std::optional<std::pair<std::uint32_t, std::uint32_t>> size) {
  if (size && !isAsking_ && now() >= askAgainAt_) {
    askForPicture();
  }
}

void RemoteSource::askForPicture() {
  isAsking_ = true;
  const auto action =
      LMRActionFactory::actionToUpdatePreviewImageForRemoteCamera_session(plan().source.identifier, session_);
  action->setFinishTarget_selector(self(), &RemoteSource::pictureCame);
  action->setErrorTarget_selector(self(), &RemoteSource::pictureFailed);
  action->start();
}

void RemoteSource::pictureCame(const std::shared_ptr<LMRAction>& action) {
  const auto reply = action->result();
  const lumora::Value* const data = reply ? reply->find(LMRCameraPreviewDataKey) : nullptr;
  if (data && data->data()) {
    pictureFile_ = *data->data();
  }
  pictureFailed();
  changed.notify();
}

// The last one stays.
void RemoteSource::pictureFailed() {
  isAsking_ = false;
  askAgainAt_ = now() + pause;
}

} // namespace recorder
