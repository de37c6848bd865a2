#include <LumoraKit/testing/FakeCaptureDevice.h>

#include <algorithm>

namespace lumora::fakes {

FakeCaptureDevice::FakeCaptureDevice(std::string uniqueID, std::vector<MediaType> types)
    : uniqueID_(std::move(uniqueID)), types_(std::move(types)) {}

bool FakeCaptureDevice::hasMediaType(MediaType type) const {
  return std::find(types_.begin(), types_.end(), type) != types_.end();
}

std::string FakeCaptureDevice::localizedDisplayName() const {
  const std::lock_guard lock(mutex_);
  return name_.empty() ? uniqueID_ : name_;
}

void FakeCaptureDevice::setLocalizedDisplayName(std::string name) {
  const std::lock_guard lock(mutex_);
  name_ = std::move(name);
}

LMRErrorRef FakeCaptureDevice::open() {
  const std::lock_guard lock(mutex_);
  if (!openError_) {
    ++openCount_;
  }
  return openError_;
}

void FakeCaptureDevice::failToOpen(LMRErrorRef error) {
  const std::lock_guard lock(mutex_);
  openError_ = std::move(error);
}

void FakeCaptureDevice::failToBeAdded(LMRErrorRef error) {
  const std::lock_guard lock(mutex_);
  addError_ = std::move(error);
}

int FakeCaptureDevice::openCount() const {
  const std::lock_guard lock(mutex_);
  return openCount_;
}

LMRErrorRef FakeCaptureDevice::errorWhenAdded() const {
  const std::lock_guard lock(mutex_);
  return addError_;
}

FakeCaptureInput::FakeCaptureInput(std::shared_ptr<FakeCaptureDevice> device) : device_(std::move(device)) {
  const auto delivers = [&](MediaType type) {
    return device_ ? device_->hasMediaType(type) || device_->hasMediaType(MediaType::Muxed) : type == MediaType::Video;
  };
  for (const auto type : {MediaType::Video, MediaType::Sound}) {
    if (delivers(type)) {
      connections_.push_back(std::make_shared<FakeCaptureConnection>(type));
    }
  }
}

} // namespace lumora::fakes
