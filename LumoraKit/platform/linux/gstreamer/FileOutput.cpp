#include <LumoraKit/platform/linux/gstreamer/DelegateCall.h>
#include <LumoraKit/platform/linux/gstreamer/FileOutput.h>
#include <LumoraKit/platform/linux/gstreamer/Worker.h>

#include <algorithm>

namespace lumora::backend {
FileOutput::FileOutput(std::shared_ptr<Queues> queues, std::shared_ptr<Encoders> encoders)
    : queues_(std::move(queues)), encoders_(std::move(encoders)),
      messages_(queues_->makeSerialQueue("movie file output")) {}

FileOutput::~FileOutput() {
  if (current_) {
    current_->finish(DelegateCall::requestTime(), nullptr);
  }
}

void FileOutput::setDelegate(const std::weak_ptr<MovieFileOutputDelegate>& delegate) {
  delegate_.replace(delegate);
}

std::vector<std::shared_ptr<CaptureConnection>> FileOutput::connections() const {
  const std::lock_guard lock(mutex_);
  return {connections_.begin(), connections_.end()};
}

void FileOutput::setCompressionOptions_forConnection(const CompressionOptions& options,
                                                     const std::shared_ptr<CaptureConnection>& connection) {
  const std::lock_guard lock(mutex_);
  options_.insert_or_assign(connection, options);
}

bool FileOutput::join() {
  const std::lock_guard lock(mutex_);
  return !std::exchange(inSession_, true);
}

void FileOutput::attach(std::vector<std::shared_ptr<Connection>> connections) {
  const std::lock_guard lock(mutex_);
  connections_ = std::move(connections);
}

void FileOutput::leave() {
  recordToOutputFileURL(std::nullopt);
  const std::lock_guard lock(mutex_);
  inSession_ = false;
  connections_.clear();
}

void FileOutput::recordToOutputFileURL(const std::optional<std::filesystem::path>& file) {
  record(file, DelegateCall::requestTime());
}

void FileOutput::recordToOutputFileURL_atHostTime(const std::filesystem::path& file, HostTime time) {
  record(file, time);
}

void FileOutput::record(const std::optional<std::filesystem::path>& file, HostTime time) {
  std::shared_ptr<Recording> next;
  {
    const std::lock_guard lock(mutex_);
    if (current_ && file == current_->plan().file) {
      return;
    }
    if (current_) {
      current_->finish(time, nullptr);
    }
    if (file) {
      next = begin(*file, time);
    }
  }
  if (next) {
    startOnWorker(*queues_, [next] { next->run(); });
  }
}

std::shared_ptr<Recording> FileOutput::begin(const std::filesystem::path& file, HostTime time) {
  auto observer = [weak = weak_from_this()](const Recording& recording, RecordingEvent event,
                                            const LMRErrorRef& error) {
    if (const auto self = weak.lock()) {
      self->recordingTold(recording, event, error);
    }
  };
  current_ = std::make_shared<Recording>(RecordingPlan{file, time, planTracks()}, encoders_, queues_, observer);
  for (const TrackPlan& track : current_->plan().tracks) {
    if (const LMRErrorRef failure = track.connection->failure()) {
      current_->finish(time, failure);
    }
  }
  recordings_.push_back(current_);
  offered_.replace(recordings_);
  return current_;
}

std::vector<TrackPlan> FileOutput::planTracks() const {
  std::vector<TrackPlan> tracks;
  for (const auto& connection : connections_) {
    if (connection->isEnabled()) {
      const auto options = options_.find(connection);
      tracks.push_back({connection, options == options_.end() ? CompressionOptions{} : options->second});
    }
  }
  return tracks;
}

void FileOutput::pauseRecording() {
  pauseRecordingAtHostTime(DelegateCall::requestTime());
}

void FileOutput::resumeRecording() {
  resumeRecordingAtHostTime(DelegateCall::requestTime());
}

void FileOutput::pauseRecordingAtHostTime(HostTime time) {
  if (const auto recording = current()) {
    recording->pause(time);
  }
}

void FileOutput::resumeRecordingAtHostTime(HostTime time) {
  if (const auto recording = current()) {
    recording->resume(time);
  }
}

std::shared_ptr<Recording> FileOutput::current() const {
  const std::lock_guard lock(mutex_);
  return current_;
}

std::optional<std::filesystem::path> FileOutput::outputFileURL() const {
  const auto recording = current();
  return recording ? std::optional(recording->plan().file) : std::nullopt;
}

std::uint64_t FileOutput::expectedBitRate() const {
  const std::lock_guard lock(mutex_);
  std::uint64_t sum = 0;
  for (const TrackPlan& track : planTracks()) {
    sum += backend::expectedBitRate(track.connection->mediaType(), track.options, track.connection->pictureSize());
  }
  return sum;
}

void FileOutput::take(const CapturedSample& sample, const std::shared_ptr<Connection>& connection) {
  {
    const DelegateCall call(sample.time());
    if (const auto delegate = delegate_.read()->lock()) {
      delegate->captureOutput_didOutputSampleBuffer_fromConnection(*this, sample, *connection);
    }
  }
  const auto recordings = offered_.read();
  for (const auto& recording : *recordings) {
    recording->offer(sample, connection);
  }
}

void FileOutput::deviceFailed(const std::shared_ptr<Connection>& connection, const LMRErrorRef& error) {
  const auto recording = current();
  if (recording && recording->uses(connection)) {
    recording->finish(hostTimeNow(), error);
  }
}

void FileOutput::recordingTold(const Recording& recording, RecordingEvent event, const LMRErrorRef& error) {
  if (event == RecordingEvent::DidFinish) {
    forget(recording);
  }
  messages_->async([weak = weak_from_this(), plan = recording.plan(), event, error] {
    if (const auto self = weak.lock()) {
      self->tellDelegate(plan, event, error);
    }
  });
}

void FileOutput::forget(const Recording& recording) {
  const std::lock_guard lock(mutex_);
  std::erase_if(recordings_, [&recording](const auto& entry) { return entry.get() == &recording; });
  offered_.replace(recordings_);
  if (current_.get() == &recording) {
    current_.reset();
  }
}

void FileOutput::tellDelegate(const RecordingPlan& plan, RecordingEvent event, const LMRErrorRef& error) {
  const DelegateCall call(std::nullopt);
  const auto delegate = delegate_.read()->lock();
  if (!delegate) {
    return;
  }
  const auto self = shared_from_this();
  const auto connections = plan.connections();
  switch (event) {
  case RecordingEvent::DidStart:
    delegate->captureOutput_didStartRecordingToOutputFileAtURL_forConnections(self, plan.file, connections);
    break;
  case RecordingEvent::DidPause:
    delegate->captureOutput_didPauseRecordingToOutputFileAtURL_forConnections(self, plan.file, connections);
    break;
  case RecordingEvent::DidResume:
    delegate->captureOutput_didResumeRecordingToOutputFileAtURL_forConnections(self, plan.file, connections);
    break;
  case RecordingEvent::WillFinish:
    delegate->captureOutput_willFinishRecordingToOutputFileAtURL_forConnections_dueToError(self, plan.file, connections,
                                                                                           error);
    break;
  case RecordingEvent::DidFinish:
    delegate->captureOutput_didFinishRecordingToOutputFileAtURL_forConnections_dueToError(self, plan.file, connections,
                                                                                          error);
    break;
  }
}

} // namespace lumora::backend
