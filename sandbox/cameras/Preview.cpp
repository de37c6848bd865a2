#include "Preview.h"

#include "TestPicture.h"

#include <LumoraKit/platform/Files.h>

#include <fstream>
#include <iterator>
#include <stdexcept>

namespace lumora::sandbox {

namespace {

TestPicture::Mark markFor(CameraState state) {
  switch (state) {
  case CameraState::Recording:
    return TestPicture::Mark::Recording;
  case CameraState::Paused:
    return TestPicture::Mark::Paused;
  default:
    return TestPicture::Mark::None;
  }
}

[[noreturn]] void fail(const std::filesystem::path& path, const char* what) {
  throw std::runtime_error("the preview " + path.string() + " cannot be " + what);
}

} // namespace

void updatePreview(const Store& store, const Camera& camera) {
  constexpr std::int64_t frame = 100; // milliseconds
  const std::int64_t now = currentMilliseconds();
  const std::string png = makePNG({static_cast<int>(now / frame % 10), markFor(stateAt(camera, now))});

  const auto path = previewPath(store, camera);
  const auto temporary = store.previewsFolder() / (makeUUIDString() + ".tmp");
  std::ofstream stream(temporary, std::ios::binary);
  stream << png << std::flush;
  if (!stream) {
    fail(path, "written");
  }
  std::filesystem::rename(temporary, path);
}

Data readPreview(const Store& store, const Camera& camera) {
  const auto path = previewPath(store, camera);
  std::ifstream stream(path, std::ios::binary);
  if (!stream) {
    fail(path, "read");
  }
  return {std::istreambuf_iterator<char>(stream), {}};
}

} // namespace lumora::sandbox
