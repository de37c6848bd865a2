#pragma once

#include <LumoraKit/platform/MediaCapture.h>
#include <LumoraKit/platform/Queues.h>

#include <map>
#include <mutex>
#include <optional>
#include <string>
#include <vector>

namespace lumora::backend {

/// One way to encode a track.
struct Encoder {
  /// "h264", "mjpeg", "aac" or "pcm".
  const char* codec;
  MediaType type;
  /// The element that does it; empty for none.
  const char* element;
  /// For the user.
  const char* name;
  bool isHardware;
  /// Its launch line and what follows it up to the muxer; BITS, KBITS and GOP stand for numbers.
  const char* launch;
  /// The raw format it is given.
  const char* rawFormat;
  /// Frames by which it delays sound without saying so in the file.
  std::uint32_t delay;

  /// The launch line with its numbers. `keyInterval` is in frames.
  std::string launchLine(std::uint32_t bitRate, std::uint32_t keyInterval) const;
};

/// The encoders of this machine: for each codec the first of a fixed list that was seen to work, hardware first, unless
/// another one is wanted. (The rank that plug-ins give themselves says nothing about that.) Any thread.
class Encoders {
public:
  explicit Encoders(std::shared_ptr<Queues> queues) : queues_(std::move(queues)) {}

  /// The wanted one if it works, else the first that does; null when none works. Tries candidates out when they are
  /// needed for the first time, 3 seconds each at most: for a worker.
  const Encoder* find(MediaType type, const std::string& codec, const std::optional<std::string>& wanted);
  /// All that work, in the order of preference; for a worker as well.
  std::vector<MediaEncoder> list(const std::string& codec);

private:
  bool works(const Encoder& encoder);
  void forgetFailures();
  bool tryOut(const Encoder& encoder) const;

  const std::shared_ptr<Queues> queues_;
  std::mutex mutex_;
  std::map<const Encoder*, bool> tried_;
};

} // namespace lumora::backend
