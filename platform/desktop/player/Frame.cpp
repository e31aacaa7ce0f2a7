#include "Frame.h"

#include "native/PlayerError.h"

#include <gst/video/video.h>

#include <algorithm>
#include <memory>
#include <vector>

namespace Desktop {
namespace {

constexpr GstClockTime kConversionLimit = 5 * GST_SECOND;

/// \return a frame in packed red, green, blue with square pixels.
SamplePtr ConvertToRgb(GstSample* frame) {
  const CapsPtr rgb(gst_caps_new_simple("video/x-raw", "format", G_TYPE_STRING, "RGB",
                                        "pixel-aspect-ratio", GST_TYPE_FRACTION, 1, 1, nullptr));
  GError* reason = nullptr;
  SamplePtr converted(gst_video_convert_sample(frame, rgb.get(), kConversionLimit, &reason));
  const ErrorPtr error(reason);
  if (converted != nullptr) return converted;
  throw Host::PlayerFailure(PLAYER_ERROR_IO, __LINE__, "the frame can't be converted: %s",
                            error == nullptr ? "no reason given" : error->message);
}

/// How a picture is turned upright: its rows become columns, then it is mirrored.
struct Turn {
  bool swapsAxes = false;
  bool mirrorsX = false;
  bool mirrorsY = false;
};

Turn FindTurn(const GstTagList* tags) {
  GstVideoOrientationMethod method = GST_VIDEO_ORIENTATION_IDENTITY;
  if (tags != nullptr) gst_video_orientation_from_tag(const_cast<GstTagList*>(tags), &method);
  switch (method) {
    case GST_VIDEO_ORIENTATION_90R: return {true, false, true};
    case GST_VIDEO_ORIENTATION_180: return {false, true, true};
    case GST_VIDEO_ORIENTATION_90L: return {true, true, false};
    case GST_VIDEO_ORIENTATION_HORIZ: return {false, true, false};
    case GST_VIDEO_ORIENTATION_VERT: return {false, false, true};
    case GST_VIDEO_ORIENTATION_UL_LR: return {true, false, false};
    case GST_VIDEO_ORIENTATION_UR_LL: return {true, true, true};
    default: return {};
  }
}

constexpr int kPixelSize = 3;

struct Picture {
  const unsigned char* pixels;
  int width;
  int height;
  int stride;
};

/// \return the pixels of the turned picture, without padding.
std::vector<unsigned char> Apply(const Turn& turn, const Picture& picture) {
  const int width = turn.swapsAxes ? picture.height : picture.width;
  const int height = turn.swapsAxes ? picture.width : picture.height;
  std::vector<unsigned char> turned(static_cast<std::size_t>(width) *
                                    static_cast<std::size_t>(height) * kPixelSize);
  auto target = turned.begin();
  for (int y = 0; y < height; ++y) {
    for (int x = 0; x < width; ++x, target += kPixelSize) {
      const int column = turn.swapsAxes ? y : x, row = turn.swapsAxes ? x : y;
      const int fromX = turn.mirrorsX ? picture.width - 1 - column : column;
      const int fromY = turn.mirrorsY ? picture.height - 1 - row : row;
      std::copy_n(picture.pixels + static_cast<std::ptrdiff_t>(fromY) * picture.stride +
                      static_cast<std::ptrdiff_t>(fromX) * kPixelSize,
                  kPixelSize, target);
    }
  }
  return turned;
}

void HandOver(const Picture& picture, const Turn& turn, player_frame_cb callback, void* userData) {
  if (!turn.swapsAxes && !turn.mirrorsX && !turn.mirrorsY) {
    callback(picture.pixels, picture.width, picture.height, picture.stride, userData);
    return;
  }
  const auto turned = Apply(turn, picture);
  const int width = turn.swapsAxes ? picture.height : picture.width;
  const int height = turn.swapsAxes ? picture.width : picture.height;
  callback(turned.data(), width, height, width * kPixelSize, userData);
}

}  // namespace

void HandOver(GstSample* frame, const GstTagList* tags, player_frame_cb callback, void* userData) {
  const SamplePtr converted = ConvertToRgb(frame);
  GstVideoInfo info;
  GstVideoFrame picture;
  if (!gst_video_info_from_caps(&info, gst_sample_get_caps(converted.get())) ||
      !gst_video_frame_map(&picture, &info, gst_sample_get_buffer(converted.get()), GST_MAP_READ)) {
    throw Host::PlayerFailure(PLAYER_ERROR_IO, __LINE__, "the frame can't be read");
  }
  const std::unique_ptr<GstVideoFrame, FreeWith<gst_video_frame_unmap>> mapped(&picture);
  HandOver(Picture{static_cast<const unsigned char*>(GST_VIDEO_FRAME_PLANE_DATA(&picture, 0)),
                   GST_VIDEO_FRAME_WIDTH(&picture), GST_VIDEO_FRAME_HEIGHT(&picture),
                   GST_VIDEO_FRAME_PLANE_STRIDE(&picture, 0)},
           FindTurn(tags), callback, userData);
}

}  // namespace Desktop
