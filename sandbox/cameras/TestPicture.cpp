#include "TestPicture.h"

#include <array>
#include <stdexcept>
#include <vector>

#include <png.h>

namespace lumora::sandbox {

namespace {

using Colour = std::array<std::uint8_t, 3>;

constexpr Colour white{235, 235, 235};
constexpr Colour red{220, 30, 30};
constexpr std::array<Colour, 7> bars{
    {{191, 191, 191}, {191, 191, 0}, {0, 191, 191}, {0, 191, 0}, {191, 0, 191}, {191, 0, 0}, {0, 0, 191}}};

class Canvas {
public:
  Canvas() : pixels_(std::size_t{TestPicture::width} * TestPicture::height * 3) {}

  void fill(std::uint32_t left, std::uint32_t top, std::uint32_t width, std::uint32_t height, const Colour& colour) {
    for (std::uint32_t y = top; y < top + height; ++y) {
      for (std::uint32_t x = left; x < left + width; ++x) {
        std::copy(colour.begin(), colour.end(), pixels_.begin() + 3 * (std::ptrdiff_t{y} * TestPicture::width + x));
      }
    }
  }
  const std::uint8_t* pixels() const { return pixels_.data(); }

private:
  std::vector<std::uint8_t> pixels_;
};

void drawBars(Canvas& canvas) {
  constexpr auto barCount = static_cast<std::uint32_t>(bars.size());
  for (std::uint32_t index = 0; index < barCount; ++index) {
    const std::uint32_t left = index * TestPicture::width / barCount;
    const std::uint32_t right = (index + 1) * TestPicture::width / barCount;
    canvas.fill(left, 0, right - left, TestPicture::height, bars.at(index));
  }
}

void drawBox(Canvas& canvas, int frame) {
  constexpr std::uint32_t side = 24;
  constexpr std::uint32_t steps = 10;
  const std::uint32_t step = static_cast<std::uint32_t>(frame) % steps;
  canvas.fill(step * (TestPicture::width - side) / (steps - 1), TestPicture::height - 2 * side, side, side, white);
}

void drawMark(Canvas& canvas, TestPicture::Mark mark) {
  constexpr std::uint32_t side = 20;
  constexpr std::uint32_t margin = 12;
  if (mark == TestPicture::Mark::Recording) {
    canvas.fill(margin, margin, side, side, red);
  } else if (mark == TestPicture::Mark::Paused) {
    canvas.fill(margin, margin, side / 3, side, red);
    canvas.fill(margin + 2 * side / 3, margin, side / 3, side, red);
  }
}

std::string encode(const Canvas& canvas) {
  png_image image{};
  image.version = PNG_IMAGE_VERSION;
  image.width = TestPicture::width;
  image.height = TestPicture::height;
  image.format = PNG_FORMAT_RGB;
  std::string bytes(PNG_IMAGE_PNG_SIZE_MAX(image), '\0');
  image.flags |= PNG_IMAGE_FLAG_FAST;
  png_alloc_size_t size = bytes.size();
  if (png_image_write_to_memory(&image, bytes.data(), &size, 0, canvas.pixels(), 0, nullptr) == 0) {
    throw std::runtime_error(std::string("the picture could not be encoded: ") + static_cast<char*>(image.message));
  }
  bytes.resize(size);
  return bytes;
}

} // namespace

std::string makePNG(const TestPicture& picture) {
  Canvas canvas;
  drawBars(canvas);
  drawBox(canvas, picture.frame);
  drawMark(canvas, picture.mark);
  return encode(canvas);
}

} // namespace lumora::sandbox
