#include <LumoraKit/testing/FakeMediaCapture.h>

#include <algorithm>

namespace lumora::fakes {

FakeMediaCapture::FakeMediaCapture() = default;
FakeMediaCapture::~FakeMediaCapture() = default;

std::shared_ptr<CaptureDevice> FakeMediaCapture::defaultInputDevice(MediaType type) {
  {
    const std::lock_guard lock(mutex_);
    if (const auto found = defaults_.find(type); found != defaults_.end()) {
      return found->second;
    }
  }
  const auto all = inputDevices(type);
  return all.empty() ? nullptr : all.front();
}

std::vector<std::shared_ptr<CaptureDevice>> FakeMediaCapture::inputDevices(MediaType type) {
  const std::lock_guard lock(mutex_);
  std::vector<std::shared_ptr<CaptureDevice>> found;
  std::copy_if(devices_.begin(), devices_.end(), std::back_inserter(found),
               [type](const auto& device) { return device->hasMediaType(type); });
  return found;
}

std::shared_ptr<CaptureDevice> FakeMediaCapture::deviceWithUniqueID(const std::string& uniqueID) {
  const std::lock_guard lock(mutex_);
  const auto found = std::find_if(devices_.begin(), devices_.end(),
                                  [&](const auto& device) { return device->uniqueID() == uniqueID; });
  return found == devices_.end() ? nullptr : *found;
}

std::shared_ptr<CaptureInput> FakeMediaCapture::makeDeviceInput(const std::shared_ptr<CaptureDevice>& device) {
  return std::make_shared<FakeCaptureInput>(std::static_pointer_cast<FakeCaptureDevice>(device));
}

std::shared_ptr<CaptureInput> FakeMediaCapture::makeScreenInput() {
  return std::make_shared<FakeCaptureInput>(nullptr);
}

std::shared_ptr<CaptureSession> FakeMediaCapture::makeSession() {
  const std::lock_guard lock(mutex_);
  const auto& session = sessions_.emplace_back(std::make_shared<FakeCaptureSession>());
  session->failToAddScreenInput(screenError_);
  session->failToAddOutput(outputError_);
  session->failToStart(startError_);
  return session;
}

std::shared_ptr<MovieFileOutput> FakeMediaCapture::makeMovieFileOutput() {
  const std::lock_guard lock(mutex_);
  return outputs_.emplace_back(std::make_shared<FakeMovieFileOutput>());
}

HostTime FakeMediaCapture::hostTime() const {
  const std::lock_guard lock(mutex_);
  return hostTime_;
}

std::vector<MediaEncoder> FakeMediaCapture::encoders(const std::string&) {
  const std::lock_guard lock(mutex_);
  return encoders_;
}

void FakeMediaCapture::setEncoders(std::vector<MediaEncoder> encoders) {
  const std::lock_guard lock(mutex_);
  encoders_ = std::move(encoders);
}

std::shared_ptr<FakeCaptureDevice> FakeMediaCapture::addDevice(std::string uniqueID, std::vector<MediaType> types) {
  const std::lock_guard lock(mutex_);
  return devices_.emplace_back(std::make_shared<FakeCaptureDevice>(std::move(uniqueID), std::move(types)));
}

void FakeMediaCapture::setDefaultInputDevice(MediaType type, std::shared_ptr<FakeCaptureDevice> device) {
  const std::lock_guard lock(mutex_);
  defaults_[type] = std::move(device);
}

void FakeMediaCapture::loseDevice(const std::string& uniqueID) {
  const auto device = deviceWithUniqueID(uniqueID);
  if (!device) {
    return;
  }
  {
    const std::lock_guard lock(mutex_);
    std::erase(devices_, device);
    std::erase_if(defaults_, [&](const auto& entry) { return entry.second == device; });
  }
  for (const auto& session : sessions()) {
    if (session->uses(*device)) {
      for (const auto& output : session->outputs()) {
        std::static_pointer_cast<FakeMovieFileOutput>(output)->endWithError(
            captureError(CaptureErrorCode::DeviceMissing, "The device was removed"));
      }
    }
  }
}

void FakeMediaCapture::failToAddScreenInput(LMRErrorRef error) {
  const std::lock_guard lock(mutex_);
  screenError_ = std::move(error);
}

void FakeMediaCapture::failToAddOutput(LMRErrorRef error) {
  const std::lock_guard lock(mutex_);
  outputError_ = std::move(error);
}

void FakeMediaCapture::failToStart(LMRErrorRef error) {
  const std::lock_guard lock(mutex_);
  startError_ = std::move(error);
}

void FakeMediaCapture::setHostTime(HostTime time) {
  const std::lock_guard lock(mutex_);
  hostTime_ = time;
}

HostTime FakeMediaCapture::advanceHostTime(HostTime ticks) {
  const std::lock_guard lock(mutex_);
  return hostTime_ += ticks;
}

std::vector<std::shared_ptr<FakeCaptureSession>> FakeMediaCapture::sessions() const {
  const std::lock_guard lock(mutex_);
  return sessions_;
}

std::vector<std::shared_ptr<FakeMovieFileOutput>> FakeMediaCapture::movieFileOutputs() const {
  const std::lock_guard lock(mutex_);
  return outputs_;
}

} // namespace lumora::fakes
