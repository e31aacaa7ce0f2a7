// What the player needs: plug-ins of GStreamer.

#include "Gst.h"

#include <Host/Needs.h>

#include <iterator>
#include <string>

namespace Host {
namespace {

/// An element of GStreamer, and the package that brings it.
struct Element {
  const char* factory;
  const char* what;
  const char* package;
};

constexpr const char* kBase = "gstreamer1.0-plugins-base";
constexpr const char* kGood = "gstreamer1.0-plugins-good";
constexpr const char* kBad = "gstreamer1.0-plugins-bad";
constexpr const char* kLibav = "gstreamer1.0-libav";

constexpr Element kElements[] = {
    {"playbin", "player", kBase},
    {"pulsesink", "sound to the sound server", kGood},
    {"equalizer-nbands", "effects: equalizer", kGood},
    {"freeverb", "effects: reverb", kBad},
    {"ladspa-fast-lookahead-limiter-1913-so-fastlookaheadlimiter", "effects: limiter",
     "swh-plugins gstreamer1.0-plugins-bad"},
    {"wavenc", "sound written to a file", kGood},
    {"qtdemux", "files: MP4, MOV", kGood},
    {"matroskademux", "files: Matroska, WebM", kGood},
    {"avidemux", "files: AVI", kGood},
    {"flvdemux", "files: FLV", kGood},
    {"oggdemux", "files: Ogg", kBase},
    {"tsdemux", "files: MPEG transport stream", kBad},
    {"mpegpsdemux", "files: MPEG program stream", kBad},
    {"avdec_h264", "video: H.264", kLibav},
    {"h264parse", "video: H.264 by key frame", kBad},
    {"avdec_h265", "video: H.265", kLibav},
    {"h265parse", "video: H.265 by key frame", kBad},
    {"avdec_mpeg4", "video: MPEG-4", kLibav},
    {"avdec_mpeg2video", "video: MPEG-2", kLibav},
    {"mpegvideoparse", "video: MPEG-2 by key frame", kBad},
    {"theoradec", "video: Theora", kBase},
    {"vp8dec", "video: VP8", kGood},
    {"vp9dec", "video: VP9", kGood},
    {"avdec_aac", "sound: AAC", kLibav},
    {"mpg123audiodec", "sound: MP3", kGood},
    {"opusdec", "sound: Opus", kBase},
    {"vorbisdec", "sound: Vorbis", kBase},
    {"flacdec", "sound: FLAC", kGood},
};

}  // namespace

std::vector<Need> ListPlayerNeeds() {
  if (gst_init_check(nullptr, nullptr, nullptr) == FALSE) {
    return {{"GStreamer", false, std::string("apt install ") + kBase}};
  }
  std::vector<Need> needs;
  for (const Element& element : kElements) {
    needs.push_back({element.what, Desktop::IsInstalled(element.factory),
                     std::string("apt install ") + element.package});
  }
  return needs;
}

}  // namespace Host
