#include "RenderAudio.h"

#include "Chain.h"
#include "desktop/player/Gst.h"
#include "desktop/player/PipelineWatch.h"
#include "native/PlayerError.h"

#include <sys/stat.h>
#include <unistd.h>

#include <atomic>
#include <cerrno>
#include <chrono>
#include <cstdio>
#include <cstring>
#include <string>

namespace Desktop {
namespace {

using Answer = PipelineWatch::Answer;
using Host::PlayerFailure;

/// Longer than a decoder pauses, on a slow device too.
constexpr std::chrono::seconds kStandstillLimit{10};

/// A file beside the one to be written, so that nobody sees that half done.
class TemporaryFile {
 public:
  explicit TemporaryFile(const std::string& path) : path_(path) {
    static std::atomic<unsigned> count{0};
    name_ = path + "." + std::to_string(getpid()) + "-" + std::to_string(++count) + ".part";
  }
  ~TemporaryFile() { std::remove(name_.c_str()); }

  TemporaryFile(const TemporaryFile&) = delete;
  TemporaryFile& operator=(const TemporaryFile&) = delete;

  const char* GetName() const { return name_.c_str(); }

  /// Gives it its final name.
  void Keep() const {
    if (std::rename(name_.c_str(), path_.c_str()) == 0) return;
    throw PlayerFailure(PLAYER_ERROR_IO, __LINE__, "\"%s\" can't be written: %s", path_.c_str(),
                        std::strerror(errno));
  }

 private:
  const std::string path_;
  std::string name_;
};

ElementPtr MakePipeline(GstElement* effects) {
  // Sound that isn't changed comes out as it was: without dither, which is noise.
  ElementPtr pipeline = MakeElement(
      "uridecodebin name=source caps=audio/x-raw expose-all-streams=false "
      "audioconvert name=converter dithering=none ! audio/x-raw,format=S16LE,channels=2 "
      "! wavenc ! filesink name=sink");
  if (pipeline == nullptr || effects == nullptr) {
    throw PlayerFailure(PLAYER_ERROR_IO, __LINE__, "GStreamer's base or good plug-ins are missing");
  }
  gst_bin_add(GST_BIN(pipeline.get()), effects);
  return pipeline;
}

/// A pipeline from a file to a file: decoder, effects, 16-bit stereo, WAV.
class Rendering {
 public:
  Rendering(const char* uri, const EffectSettings& settings, const char* path);

  void Run();

 private:
  ElementPtr Find(const char* name) const;
  static void OnDecoded(GstElement*, GstPad* sound, gpointer effects);
  void Await(GstState state);
  gint64 GetBytesWritten() const;

  const SharedSettings settings_;
  const EffectChain effects_{settings_};
  const ElementPtr pipeline_{MakePipeline(effects_.GetElement())};
  const ElementPtr sink_{Find("sink")};
  PipelineWatch watch_{pipeline_.get()};
  const StreamingPtr streaming_{pipeline_.get()};  // uses the chain and the watch
};

Rendering::Rendering(const char* uri, const EffectSettings& settings, const char* path)
    : settings_(settings) {
  gst_element_link(effects_.GetElement(), Find("converter").get());
  const ElementPtr source = Find("source");
  g_object_set(source.get(), "uri", uri, nullptr);
  g_signal_connect(source.get(), "pad-added", G_CALLBACK(OnDecoded), effects_.GetElement());
  g_object_set(sink_.get(), "location", path, nullptr);
}

ElementPtr Rendering::Find(const char* name) const {
  return ElementPtr(gst_bin_get_by_name(GST_BIN(pipeline_.get()), name));
}

/// Of several sounds the first is taken.
void Rendering::OnDecoded(GstElement*, GstPad* sound, gpointer effects) {
  const PadPtr input(gst_element_get_static_pad(static_cast<GstElement*>(effects), "sink"));
  if (!gst_pad_is_linked(input.get())) gst_pad_link(sound, input.get());
}

/// Prerolls first, so that what is answered after that is the end.
void Rendering::Run() {
  Await(GST_STATE_PAUSED);
  Await(GST_STATE_PLAYING);
}

void Rendering::Await(GstState state) {
  watch_.ExpectAnswer();
  gst_element_set_state(pipeline_.get(), state);
  Answer answer = Answer::kNone;
  gint64 written = 0;
  do {
    written = GetBytesWritten();
    answer = watch_.WaitForAnswer(kStandstillLimit);
  } while (answer == Answer::kNone && GetBytesWritten() != written);
  if (answer == Answer::kDone) return;
  const std::string reason = watch_.GetFailure().reason;
  throw PlayerFailure(PLAYER_ERROR_IO, __LINE__, "the sound can't be written: %s",
                      reason.empty() ? "GStreamer stands still" : reason.c_str());
}

gint64 Rendering::GetBytesWritten() const {
  gint64 bytes = 0;
  gst_element_query_position(sink_.get(), GST_FORMAT_BYTES, &bytes);
  return bytes;
}

}  // namespace

void RenderAudio(const char* uri, const EffectSettings& settings, const char* path) {
  struct stat status;
  // A device or a pipe would be replaced by a plain file.
  if (stat(path, &status) == 0 && !S_ISREG(status.st_mode)) {
    throw PlayerFailure(PLAYER_ERROR_IO, __LINE__, "\"%s\" is not a plain file", path);
  }
  const TemporaryFile file(path);
  Rendering(uri, settings, file.GetName()).Run();
  file.Keep();
}

}  // namespace Desktop
