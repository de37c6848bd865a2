#include <LumoraKit/platform/Files.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/testing/FakeCaptureErrors.h>
#include <LumoraKit/testing/FakeCaptureSession.h>

#include <algorithm>

namespace lumora::fakes {

std::optional<HostTime> FakeSampleBuffer::hostTime() const {
  ++reads_;
  return hostTime_;
}

std::vector<SoundLevel> FakeSampleBuffer::soundLevels() const {
  ++reads_;
  return soundLevels_;
}

std::optional<Picture> FakeSampleBuffer::picture(std::uint32_t, std::uint32_t) const {
  ++reads_;
  return picture_;
}

FakeMovieFileOutput::FakeMovieFileOutput() = default;
FakeMovieFileOutput::~FakeMovieFileOutput() = default;

void FakeMovieFileOutput::setDelegate(const std::weak_ptr<MovieFileOutputDelegate>& delegate) {
  const std::lock_guard lock(mutex_);
  delegate_ = delegate;
}

std::vector<std::shared_ptr<CaptureConnection>> FakeMovieFileOutput::connections() const {
  std::shared_ptr<FakeCaptureSession> session;
  {
    const std::lock_guard lock(mutex_);
    session = session_.lock();
  }
  std::vector<std::shared_ptr<CaptureConnection>> all;
  if (session) {
    for (const auto& input : session->inputs()) {
      const auto connections = input->connections();
      all.insert(all.end(), connections.begin(), connections.end());
    }
  }
  return all;
}

void FakeMovieFileOutput::setCompressionOptions_forConnection(const CompressionOptions& options,
                                                              const std::shared_ptr<CaptureConnection>& connection) {
  const std::lock_guard lock(mutex_);
  compressionOptions_[connection.get()] = options;
}

void FakeMovieFileOutput::recordToOutputFileURL(const std::optional<std::filesystem::path>& file) {
  const std::lock_guard lock(mutex_);
  requests_.push_back(file ? "record " + file->string() : "finish");
  if (file && file == outputFileURL_) {
    return;
  }
  finish(nullptr);
  if (file) {
    state_ = State::Recording;
    outputFileURL_ = file;
    outcomes_.push_back({Event::Started, *file, nullptr});
  }
}

void FakeMovieFileOutput::pauseRecording() {
  const std::lock_guard lock(mutex_);
  requests_.emplace_back("pause");
  if (state_ == State::Recording) {
    state_ = State::Paused;
    outcomes_.push_back({Event::Paused, *outputFileURL_, nullptr});
  }
}

void FakeMovieFileOutput::resumeRecording() {
  const std::lock_guard lock(mutex_);
  requests_.emplace_back("resume");
  if (state_ == State::Paused) {
    state_ = State::Recording;
    outcomes_.push_back({Event::Resumed, *outputFileURL_, nullptr});
  }
}

void FakeMovieFileOutput::recordToOutputFileURL_atHostTime(const std::filesystem::path& file, HostTime time) {
  note(time);
  recordToOutputFileURL(file);
}

void FakeMovieFileOutput::pauseRecordingAtHostTime(HostTime time) {
  note(time);
  pauseRecording();
}

void FakeMovieFileOutput::resumeRecordingAtHostTime(HostTime time) {
  note(time);
  resumeRecording();
}

void FakeMovieFileOutput::note(HostTime time) {
  const std::lock_guard lock(mutex_);
  requestedHostTimes_.push_back(time);
}

std::uint64_t FakeMovieFileOutput::expectedBitRate() const {
  const std::lock_guard lock(mutex_);
  return expectedBitRate_;
}

void FakeMovieFileOutput::setExpectedBitRate(std::uint64_t bitRate) {
  const std::lock_guard lock(mutex_);
  expectedBitRate_ = bitRate;
}

std::optional<std::filesystem::path> FakeMovieFileOutput::outputFileURL() const {
  const std::lock_guard lock(mutex_);
  return outputFileURL_;
}

// With the lock held.
void FakeMovieFileOutput::finish(LMRErrorRef error) {
  if (state_ != State::Idle) {
    state_ = State::Idle;
    outcomes_.push_back({Event::Finished, *outputFileURL_, std::move(error)});
  }
}

void FakeMovieFileOutput::endWithError(LMRErrorRef error) {
  const std::lock_guard lock(mutex_);
  finish(std::move(error));
}

void FakeMovieFileOutput::runOutOfDiskSpace() {
  endWithError(captureError(CaptureErrorCode::DiskFull, "No space is left for the recording"));
}

bool FakeMovieFileOutput::emitSample(const SampleBuffer& sample, const std::shared_ptr<CaptureConnection>& connection) {
  std::shared_ptr<FakeCaptureSession> session;
  std::shared_ptr<MovieFileOutputDelegate> delegate;
  {
    const std::lock_guard lock(mutex_);
    session = session_.lock();
    delegate = delegate_.lock();
  }
  const auto all = connections();
  const bool isKnown = std::find(all.begin(), all.end(), connection) != all.end();
  if (!isKnown || !connection->isEnabled() || !delegate || !session->isRunning()) {
    return false;
  }
  delegate->captureOutput_didOutputSampleBuffer_fromConnection(*this, sample, *connection);
  return true;
}

bool FakeMovieFileOutput::emitSample(MediaType type, std::optional<HostTime> hostTime) {
  const auto all = connections();
  const auto found = std::find_if(all.begin(), all.end(), [type](const auto& connection) {
    return connection->mediaType() == type && connection->isEnabled();
  });
  return found != all.end() && emitSample(FakeSampleBuffer(hostTime), *found);
}

int FakeMovieFileOutput::deliverOutcomes() {
  std::unique_lock lock(mutex_);
  if (isDelivering_) {
    return 0;
  }
  isDelivering_ = true;
  int count = 0;
  while (!outcomes_.empty()) {
    const Outcome outcome = outcomes_.front();
    outcomes_.pop_front();
    lock.unlock();
    report(outcome);
    ++count;
    lock.lock();
  }
  isDelivering_ = false;
  return count;
}

std::size_t FakeMovieFileOutput::pendingOutcomes() const {
  const std::lock_guard lock(mutex_);
  return outcomes_.size();
}

void FakeMovieFileOutput::report(Outcome outcome) {
  if (outcome.event == Event::Started) {
    if (auto error = makeFile(outcome.file)) {
      outcome = {Event::Finished, outcome.file, std::move(error)};
    }
  }
  std::shared_ptr<MovieFileOutputDelegate> delegate;
  {
    const std::lock_guard lock(mutex_);
    delegate = delegate_.lock();
  }
  if (delegate) {
    tell(*delegate, outcome);
  }
}

// A file that cannot be made takes the outcomes of its later requests with it.
LMRErrorRef FakeMovieFileOutput::makeFile(const std::filesystem::path& file) {
  auto error = Platform::current().files->writeAtomically(file, "A fake movie.\n");
  const std::lock_guard lock(mutex_);
  if (error) {
    std::erase_if(outcomes_, [&](const Outcome& outcome) { return outcome.file == file; });
    if (outputFileURL_ == file) {
      state_ = State::Idle;
    }
  }
  return error;
}

void FakeMovieFileOutput::tell(MovieFileOutputDelegate& delegate, const Outcome& outcome) {
  const auto self = shared_from_this();
  const auto& file = outcome.file;
  const auto all = connections();
  switch (outcome.event) {
  case Event::Started:
    delegate.captureOutput_didStartRecordingToOutputFileAtURL_forConnections(self, file, all);
    break;
  case Event::Paused:
    delegate.captureOutput_didPauseRecordingToOutputFileAtURL_forConnections(self, file, all);
    break;
  case Event::Resumed:
    delegate.captureOutput_didResumeRecordingToOutputFileAtURL_forConnections(self, file, all);
    break;
  case Event::Finished:
    delegate.captureOutput_willFinishRecordingToOutputFileAtURL_forConnections_dueToError(self, file, all,
                                                                                          outcome.error);
    forget(file);
    delegate.captureOutput_didFinishRecordingToOutputFileAtURL_forConnections_dueToError(self, file, all,
                                                                                         outcome.error);
    break;
  }
}

// The file is written no more, unless it was asked for once again.
void FakeMovieFileOutput::forget(const std::filesystem::path& file) {
  const std::lock_guard lock(mutex_);
  if (state_ == State::Idle && outputFileURL_ == file) {
    outputFileURL_.reset();
  }
}

std::vector<std::string> FakeMovieFileOutput::requests() const {
  const std::lock_guard lock(mutex_);
  return requests_;
}

std::vector<HostTime> FakeMovieFileOutput::requestedHostTimes() const {
  const std::lock_guard lock(mutex_);
  return requestedHostTimes_;
}

std::optional<CompressionOptions> FakeMovieFileOutput::compressionOptions(const CaptureConnection& connection) const {
  const std::lock_guard lock(mutex_);
  const auto found = compressionOptions_.find(&connection);
  return found == compressionOptions_.end() ? std::nullopt : std::optional(found->second);
}

bool FakeMovieFileOutput::attachTo(std::weak_ptr<FakeCaptureSession> session) {
  const std::lock_guard lock(mutex_);
  const bool isFree = session_.expired();
  if (isFree) {
    session_ = std::move(session);
  }
  return isFree;
}

void FakeMovieFileOutput::detach() {
  const std::lock_guard lock(mutex_);
  finish(nullptr);
  session_.reset();
}

} // namespace lumora::fakes
