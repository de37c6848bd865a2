#pragma once

#include <LumoraKit/platform/linux/gstreamer/CapturedSample.h>
#include <LumoraKit/platform/linux/gstreamer/Connection.h>
#include <LumoraKit/platform/linux/gstreamer/MediaTrack.h>
#include <LumoraKit/platform/linux/gstreamer/RecordingPipeline.h>

#include <atomic>
#include <condition_variable>
#include <deque>
#include <functional>

namespace lumora::backend {

struct TrackPlan {
  std::shared_ptr<Connection> connection;
  CompressionOptions options;
};

/// What is to be recorded.
struct RecordingPlan {
  std::filesystem::path file;
  HostTime start;
  std::vector<TrackPlan> tracks;

  std::vector<std::shared_ptr<CaptureConnection>> connections() const;
};

enum class RecordingEvent { DidStart, DidPause, DidResume, WillFinish, DidFinish };

/// One movie file, from the request to its end. Samples are offered by the devices' threads; those that come before
/// the encoders are ready wait. Any thread, except run().
///
/// Its end is told within 15 seconds of finish(), also when the encoder or the disk hangs: the file is then given up,
/// and the thread inside run() is left alone until what it waits for returns.
class Recording : public std::enable_shared_from_this<Recording> {
public:
  /// Told what happened, in the order of the events; the error only with the last two.
  using Observer = std::function<void(const Recording&, RecordingEvent, const LMRErrorRef&)>;

  Recording(RecordingPlan plan, std::shared_ptr<Encoders> encoders, std::shared_ptr<Queues> queues, Observer observer);
  Recording(const Recording&) = delete;
  Recording& operator=(const Recording&) = delete;
  ~Recording() = default;

  const RecordingPlan& plan() const { return plan_; }
  bool uses(const std::shared_ptr<Connection>& connection) const;

  void offer(const CapturedSample& sample, const std::shared_ptr<Connection>& connection);
  void pause(HostTime time);
  void resume(HostTime time);
  /// Ends the file at that moment. Only the first time counts, but the first error is kept.
  void finish(HostTime time, const LMRErrorRef& error);

  /// Writes the file: blocks until it is complete or has failed, and for as long as an encoder or the disk hangs.
  void run();

private:
  struct Track {
    TrackPlan plan;
    const Encoder* encoder = nullptr;
    std::unique_ptr<MediaTrack> media;
    // Its number in the pipeline.
    std::size_t source = 0;
    // When its newest sample ended; 0 before the first one.
    HostTime newest = 0;
    std::size_t waiting = 0;
    unsigned lost = 0;
    // For a track that stays empty.
    GstPtr<GstSample> first;
    bool isEmpty = true;
    bool ended = false;
  };
  struct WaitingSample {
    Track* track;
    GstPtr<GstSample> sample;
    HostTime time;
  };

  LMRErrorRef write();
  LMRErrorRef awaitSamples();
  bool haveAllTracks() const;
  bool tailHasCome() const;
  LMRErrorRef chooseEncoders();
  std::unique_ptr<RecordingPipeline> makePipeline();
  void open(std::unique_ptr<RecordingPipeline> pipeline);
  LMRErrorRef follow();
  bool endTracks();
  void endTrack(Track& track);
  bool isEmpty() const;
  void close();
  LMRErrorRef reason() const;
  void giveUp();

  void keep(Track& track, const CapturedSample& sample);
  void encode(Track& track, GstSample& sample, HostTime time);
  void tell(RecordingEvent event, const LMRErrorRef& error = nullptr);

  const RecordingPlan plan_;
  const std::shared_ptr<Encoders> encoders_;
  const std::shared_ptr<Queues> queues_;
  const Observer observer_;

  mutable std::mutex mutex_;
  std::condition_variable changed_;
  Timeline timeline_;
  std::vector<Track> tracks_;
  std::deque<WaitingSample> waiting_;
  std::unique_ptr<RecordingPipeline> pipeline_;
  LMRErrorRef reason_;
  bool closed_ = false;
  std::atomic<bool> givenUp_{false};

  // Keeps the events in order: they are told with it held, and before the start they wait here.
  std::mutex eventMutex_;
  bool started_ = false;
  bool finished_ = false;
  std::vector<RecordingEvent> heldEvents_;
};

} // namespace lumora::backend
