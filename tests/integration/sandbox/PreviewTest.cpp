#include "Requests.h"

#include <LumoraKit/platform/Platform.h>

#include <array>

#include <png.h>

using namespace lumora;
using namespace lumora::tests;

namespace {

struct Picture {
  std::uint32_t width = 0;
  std::uint32_t height = 0;
  std::vector<std::uint8_t> pixels;

  std::array<int, 3> at(std::uint32_t x, std::uint32_t y) const {
    const std::size_t first = 3 * (std::size_t{y} * width + x);
    return {pixels.at(first), pixels.at(first + 1), pixels.at(first + 2)};
  }
};

/// Nothing when the bytes are no PNG file.
std::optional<Picture> decode(const std::string& bytes) {
  png_image image{};
  image.version = PNG_IMAGE_VERSION;
  if (png_image_begin_read_from_memory(&image, bytes.data(), bytes.size()) == 0) {
    return std::nullopt;
  }
  image.format = PNG_FORMAT_RGB;
  Picture picture{image.width, image.height, std::vector<std::uint8_t>(PNG_IMAGE_SIZE(image))};
  if (png_image_finish_read(&image, nullptr, picture.pixels.data(), 0, nullptr) == 0) {
    return std::nullopt;
  }
  return picture;
}

class Preview : public testing::Test {
protected:
  Preview() { EXPECT_THAT(server.administrate({"camera", "add"}, {"Studio A"}), Succeeded()); }

  Dictionary status(const Array& flags) const {
    Array elements(1, Value(Array{"status", "Studio A"}));
    elements.insert(elements.end(), flags.begin(), flags.end());
    return replyTo(server.request(asUser(server, elements)));
  }
  std::optional<Picture> picture(const Array& flags) const {
    const auto reply = status(flags);
    const auto* value = reply.find("preview_image_data");
    if (value == nullptr || value->data() == nullptr) {
      return std::nullopt;
    }
    return decode({value->data()->begin(), value->data()->end()});
  }

  SandboxServer server;
  const std::array<int, 3> red{220, 30, 30};
};

} // namespace

TEST_F(Preview, isInTheStatusOnlyWhenAskedFor) {
  EXPECT_FALSE(status({}).contains("preview_image_data"));
  EXPECT_FALSE(status({"update_preview_image"}).contains("preview_image_data"));
  EXPECT_TRUE(status({"include_preview_image"}).contains("preview_image_data"));
}

TEST_F(Preview, isAPNGFile) {
  const auto taken = picture({"update_preview_image", "include_preview_image"});
  ASSERT_TRUE(taken);
  EXPECT_EQ(taken->width, 320U);
  EXPECT_EQ(taken->height, 180U);
  EXPECT_NE(taken->at(5, 5), taken->at(315, 5));
}

TEST_F(Preview, showsTheRecordingOnlyOnceUpdated) {
  ASSERT_THAT(server.request(asUser(server, {Array{"start", "Studio A"}, Array{"delay", 0}})), Succeeded());
  EXPECT_NE(picture({"include_preview_image"}).value().at(20, 20), red);
  EXPECT_EQ(picture({"update_preview_image", "include_preview_image"}).value().at(20, 20), red);
  EXPECT_EQ(picture({"include_preview_image"}).value().at(20, 20), red);
}

TEST_F(Preview, isAtItsURL) {
  const auto url = status({}).string("preview").value();
  ASSERT_EQ(url.substr(0, 7), "file://");
  EXPECT_TRUE(decode(contentOf(url.substr(7))));
}

TEST_F(Preview, urlIsEscaped_whenTheRootHasOtherLetters) {
  const auto moved = server.folder() / "se rver\xC3\xBC%";
  std::filesystem::rename(server.root(), moved);
  std::string output;
  std::string error;
  ASSERT_EQ(Platform::current().toolRunner->run(
                (moved / "usr/bin/lumctl").string(), {"--plistin"},
                xmlDescription(asUser(server, Array(1, Value(Array{"status", "Studio A"})))).value(), output, error),
            0)
      << error;
  EXPECT_THAT(output, testing::HasSubstr("/se%20rver%C3%BC%25/var/lib/lumora/previews/"));
}
