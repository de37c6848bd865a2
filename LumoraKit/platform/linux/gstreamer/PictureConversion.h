#pragma once

#include <LumoraKit/platform/MediaCapture.h>
#include <LumoraKit/platform/linux/gstreamer/BitRate.h>

#include <gst/gst.h>

namespace lumora::backend {

/// The picture of a sample as a screen shows it, made smaller to fit into that size where it must be; nothing when the
/// sample holds no raw picture.
std::optional<Picture> convertedPicture(GstSample& sample, PictureSize maximum);

/// The size of such a picture: the proportions are kept, no side is 0, and nothing is made larger.
PictureSize fittedSize(PictureSize captured, PictureSize maximum);

} // namespace lumora::backend
