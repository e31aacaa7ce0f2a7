#include "Frame.h"

#include "../media/PlayerError.h"

#include <gst/video/video.h>

namespace Desktop {
namespace {

constexpr GstClockTime kConversionLimit = 5 * GST_SECOND;

/// A frame in packed red, green, blue, or null with \p error set.
SamplePtr ConvertToRgb(GstSample* frame, ErrorPtr* error) {
  const CapsPtr rgb(gst_caps_new_simple("video/x-raw", "format", G_TYPE_STRING, "RGB", nullptr));
  GError* reason = nullptr;
  SamplePtr converted(gst_video_convert_sample(frame, rgb.get(), kConversionLimit, &reason));
  error->reset(reason);
  return converted;
}

/// Gives reading access to a sample's pixels.
class MappedFrame {
 public:
  explicit MappedFrame(GstSample* sample) {
    GstVideoInfo info;
    isMapped_ = gst_video_info_from_caps(&info, gst_sample_get_caps(sample)) &&
                gst_video_frame_map(&frame_, &info, gst_sample_get_buffer(sample), GST_MAP_READ);
  }
  ~MappedFrame() {
    if (isMapped_) gst_video_frame_unmap(&frame_);
  }

  MappedFrame(const MappedFrame&) = delete;
  MappedFrame& operator=(const MappedFrame&) = delete;

  bool IsMapped() const { return isMapped_; }
  const GstVideoFrame& Get() const { return frame_; }

 private:
  GstVideoFrame frame_;
  bool isMapped_ = false;
};

}  // namespace

int HandOver(GstSample* frame, player_frame_cb callback, void* userData) {
  ErrorPtr error;
  const SamplePtr converted = ConvertToRgb(frame, &error);
  if (converted == nullptr) {
    return Host::PlayerFailure(PLAYER_ERROR_IO, __LINE__, "the frame can't be converted: %s",
                               error == nullptr ? "no reason given" : error->message);
  }
  const MappedFrame mapped(converted.get());
  if (!mapped.IsMapped()) {
    return Host::PlayerFailure(PLAYER_ERROR_IO, __LINE__, "the frame can't be read");
  }
  const GstVideoFrame& picture = mapped.Get();
  callback(static_cast<const unsigned char*>(GST_VIDEO_FRAME_PLANE_DATA(&picture, 0)),
           GST_VIDEO_FRAME_WIDTH(&picture), GST_VIDEO_FRAME_HEIGHT(&picture),
           GST_VIDEO_FRAME_PLANE_STRIDE(&picture, 0), userData);
  return PLAYER_ERROR_NONE;
}

}  // namespace Desktop
