#pragma once

#include <LumoraKit/platform/MediaCapture.h>

#include <functional>
#include <memory>
#include <string>

namespace lumora::bench {

/// A PipeWire camera, 1280 x 720 at 30 pictures a second in packed YUY2, while the object lives.
class Camera {
public:
  /// Paints the picture of a moment.
  using Painter = std::function<void(std::uint8_t* pixels, HostTime time)>;

  static constexpr std::size_t width = 1280;
  static constexpr std::size_t height = 720;
  static constexpr std::size_t stride = width * 2;
  static constexpr HostTime interval = 33'333'333;

  /// Pictures are taken at multiples of the interval, and `phase` later. The painter is called on a thread of the
  /// camera's.
  Camera(const std::string& name, HostTime phase, Painter painter);
  Camera(const Camera&) = delete;
  Camera& operator=(const Camera&) = delete;
  ~Camera();

private:
  struct Stream;
  std::unique_ptr<Stream> stream_;
};

} // namespace lumora::bench
