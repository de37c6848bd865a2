#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/linux/gstreamer/BitRate.h>
#include <LumoraKit/platform/linux/gstreamer/CaptureError.h>
#include <LumoraKit/platform/linux/gstreamer/DelegateCall.h>
#include <LumoraKit/platform/linux/gstreamer/FileFlusher.h>
#include <LumoraKit/platform/linux/gstreamer/Recording.h>

#include <algorithm>
#include <utility>

namespace lumora::backend {
namespace {

using std::chrono::milliseconds;

// A track whose device has not given a sample by then is left out: an empty one makes the whole file unreadable.
constexpr milliseconds patienceForTracks{1500};
// The samples of the moment of the stop are still on their way.
constexpr milliseconds patienceForTail{400};
constexpr HostTime tailTicks = std::chrono::nanoseconds(patienceForTail).count();
constexpr std::chrono::seconds patienceForEnd{15};
constexpr milliseconds tick{20};

// Samples that wait until the file is open, before new ones are dropped: two seconds of video, five of sound.
constexpr std::size_t waitingPictures = 60;
constexpr std::size_t waitingSounds = 500;
// And those that wait for a slow encoder: six seconds of a camera.
constexpr std::uint64_t waitingBytes = 256'000'000;

std::size_t limitOf(MediaType type) {
  return type == MediaType::Video ? waitingPictures : waitingSounds;
}

LMRErrorRef nothingRecorded() {
  return captureError(CaptureErrorCode::NothingRecorded, "Nothing was recorded");
}

} // namespace

std::vector<std::shared_ptr<CaptureConnection>> RecordingPlan::connections() const {
  std::vector<std::shared_ptr<CaptureConnection>> result;
  for (const TrackPlan& track : tracks) {
    result.push_back(track.connection);
  }
  return result;
}

Recording::Recording(RecordingPlan plan, std::shared_ptr<Encoders> encoders, std::shared_ptr<Queues> queues,
                     Observer observer)
    : plan_(std::move(plan)), encoders_(std::move(encoders)), queues_(std::move(queues)),
      observer_(std::move(observer)), timeline_(plan_.start) {
  for (const TrackPlan& track : plan_.tracks) {
    tracks_.emplace_back().plan = track;
  }
}

bool Recording::uses(const std::shared_ptr<Connection>& connection) const {
  return std::ranges::count(plan_.tracks, connection, &TrackPlan::connection) != 0;
}

void Recording::offer(const CapturedSample& sample, const std::shared_ptr<Connection>& connection) {
  const std::lock_guard lock(mutex_);
  const auto track = std::ranges::find_if(tracks_, [&](const Track& t) { return t.plan.connection == connection; });
  if (closed_ || track == tracks_.end() || track->ended) {
    return;
  }
  const HostTime end = sample.time() + durationOf(connection->mediaType(), sample.sample());
  if (end <= plan_.start) {
    return;
  }
  track->newest = std::max(track->newest, end);
  if (pipeline_) {
    encode(*track, sample.sample(), sample.time());
  } else {
    keep(*track, sample);
  }
}

void Recording::keep(Track& track, const CapturedSample& sample) {
  if (track.waiting >= limitOf(track.plan.connection->mediaType())) {
    ++track.lost;
    return;
  }
  ++track.waiting;
  waiting_.push_back({&track, GstPtr<GstSample>(gst_sample_ref(&sample.sample())), sample.time()});
  changed_.notify_all();
}

void Recording::encode(Track& track, GstSample& sample, HostTime time) {
  if (pipeline_->waitingBytes(track.source) >= waitingBytes) {
    ++track.lost;
    return;
  }
  for (const auto& cut : track.media->cut(timeline_, sample, time)) {
    pipeline_->push(track.source, *cut);
    track.isEmpty = false;
  }
}

void Recording::pause(HostTime time) {
  {
    const std::lock_guard lock(mutex_);
    if (timeline_.isPaused() || timeline_.stopTime()) {
      return;
    }
    timeline_.pause(time);
  }
  tell(RecordingEvent::DidPause);
}

void Recording::resume(HostTime time) {
  {
    const std::lock_guard lock(mutex_);
    if (!timeline_.isPaused() || timeline_.stopTime()) {
      return;
    }
    timeline_.resume(time);
  }
  tell(RecordingEvent::DidResume);
}

void Recording::finish(HostTime time, const LMRErrorRef& error) {
  const std::lock_guard lock(mutex_);
  if (!timeline_.stopTime()) {
    queues_->runAfter(patienceForEnd, queues_->concurrentQueue(), [weak = weak_from_this()] {
      if (const auto self = weak.lock()) {
        self->giveUp();
      }
    });
  }
  timeline_.stop(time);
  reason_ = reason_ ? reason_ : error;
  changed_.notify_all();
}

// Without effect on a file that is complete. What hangs may hang for ever: nobody waits for it.
void Recording::giveUp() {
  givenUp_ = true;
  tell(RecordingEvent::DidFinish,
       captureError(CaptureErrorCode::FinishTimedOut, "The file could not be completed within 15 seconds"));
}

LMRErrorRef Recording::reason() const {
  const std::lock_guard lock(mutex_);
  return reason_;
}

void Recording::run() {
  LMRErrorRef error = write();
  close();
  if (!error) {
    error = reason();
  }
  for (const Track& track : tracks_) {
    if (track.lost != 0) {
      log("Recording to %@: the encoder was too slow, %u samples were lost", {text(plan_.file), text(track.lost)});
    }
  }
  tell(RecordingEvent::DidFinish, error);
}

LMRErrorRef Recording::write() {
  if (LMRErrorRef error = awaitSamples()) {
    return error;
  }
  if (LMRErrorRef error = chooseEncoders()) {
    return error;
  }
  auto pipeline = makePipeline();
  if (LMRErrorRef error = pipeline->start()) {
    return error;
  }
  open(std::move(pipeline));
  tell(RecordingEvent::DidStart);
  return follow();
}

LMRErrorRef Recording::awaitSamples() {
  std::unique_lock lock(mutex_);
  changed_.wait_for(lock, patienceForTracks, [this] { return haveAllTracks() || timeline_.stopTime(); });
  if (timeline_.stopTime()) {
    changed_.wait_for(lock, patienceForTail, [this] { return tailHasCome() || reason_; });
  }
  for (Track& track : tracks_) {
    track.ended = track.newest == 0;
  }
  if (!std::ranges::all_of(tracks_, &Track::ended)) {
    return nullptr;
  }
  return reason_ ? reason_ : nothingRecorded();
}

bool Recording::haveAllTracks() const {
  return std::ranges::all_of(tracks_, [](const Track& track) { return track.newest != 0; });
}

bool Recording::tailHasCome() const {
  return std::ranges::all_of(
      tracks_, [this](const Track& track) { return track.ended || track.newest >= *timeline_.stopTime(); });
}

// Without the lock: nobody else looks at the encoders before the pipeline is there.
LMRErrorRef Recording::chooseEncoders() {
  for (Track& track : tracks_) {
    const MediaType type = track.plan.connection->mediaType();
    const std::string codec = codecOf(type, track.plan.options);
    track.encoder = track.ended ? nullptr : encoders_->find(type, codec, track.plan.options.encoder);
    if (!track.ended && !track.encoder) {
      return captureError(CaptureErrorCode::EncoderMissing, format("No encoder for %@ works here", {codec}));
    }
  }
  return nullptr;
}

std::unique_ptr<RecordingPipeline> Recording::makePipeline() {
  const std::lock_guard lock(mutex_);
  std::vector<TrackFormat> formats;
  for (Track& track : tracks_) {
    if (track.ended) {
      continue;
    }
    const auto first = std::ranges::find(waiting_, &track, &WaitingSample::track);
    GstSample& sample = *first->sample;
    track.media = MediaTrack::make(track.plan.connection->mediaType(), sample, track.encoder->delay);
    track.source = formats.size();
    track.first.reset(gst_sample_ref(&sample));
    formats.push_back({track.encoder, track.plan.options, GstPtr<GstCaps>(gst_caps_ref(gst_sample_get_caps(&sample)))});
  }
  return std::make_unique<RecordingPipeline>(plan_.file, formats);
}

void Recording::open(std::unique_ptr<RecordingPipeline> pipeline) {
  const std::lock_guard lock(mutex_);
  pipeline_ = std::move(pipeline);
  for (const WaitingSample& waiting : waiting_) {
    encode(*waiting.track, *waiting.sample, waiting.time);
  }
  waiting_.clear();
}

LMRErrorRef Recording::follow() {
  const auto flusher = FileFlusher::start(plan_.file, queues_);
  bool isEnding = false;
  while (!givenUp_) {
    if (const auto outcome = pipeline_->awaitEnd(tick)) {
      if (!isEnding) {
        tell(RecordingEvent::WillFinish, outcome->error);
      }
      return outcome->error;
    }
    if (!isEnding && endTracks()) {
      isEnding = true;
      LMRErrorRef error = isEmpty() ? nothingRecorded() : reason();
      tell(RecordingEvent::WillFinish, error);
      if (isEmpty()) {
        return error;
      }
    }
  }
  return nullptr;
}

bool Recording::endTracks() {
  const std::lock_guard lock(mutex_);
  const auto stop = timeline_.stopTime();
  const bool all = stop && (reason_ || tailHasCome() || hostTimeNow() > *stop + tailTicks);
  for (Track& track : tracks_) {
    if (all || !track.plan.connection->isEnabled()) {
      endTrack(track);
    }
  }
  return all;
}

void Recording::endTrack(Track& track) {
  if (std::exchange(track.ended, true)) {
    return;
  }
  if (track.isEmpty) {
    pipeline_->push(track.source, *track.media->filler(*track.first));
  }
  pipeline_->endOfStream(track.source);
}

// Everything that came, came during a pause.
bool Recording::isEmpty() const {
  const std::lock_guard lock(mutex_);
  return std::ranges::all_of(tracks_, &Track::isEmpty);
}

// The pipeline is taken down without the lock: that may take a while, and the devices must not wait.
void Recording::close() {
  std::unique_ptr<RecordingPipeline> pipeline;
  const std::lock_guard lock(mutex_);
  closed_ = true;
  waiting_.clear();
  pipeline = std::move(pipeline_);
}

void Recording::tell(RecordingEvent event, const LMRErrorRef& error) {
  const std::lock_guard lock(eventMutex_);
  const bool waits = event == RecordingEvent::DidPause || event == RecordingEvent::DidResume;
  if (finished_) {
    return;
  }
  if (waits && !started_) {
    heldEvents_.push_back(event);
    return;
  }
  observer_(*this, event, error);
  if (event == RecordingEvent::DidStart) {
    started_ = true;
    for (const RecordingEvent held : std::exchange(heldEvents_, {})) {
      observer_(*this, held, nullptr);
    }
  }
  finished_ = event == RecordingEvent::DidFinish;
}

} // namespace lumora::backend
