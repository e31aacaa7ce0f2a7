#include "StereoSound.h"

#include "base/Failure.h"

#include <fmt/format.h>
#include <sndfile.h>

#include <memory>

namespace CommandLine {
namespace {

struct FileCloser {
  void operator()(SNDFILE* file) const { sf_close(file); }
};
using SoundFile = std::unique_ptr<SNDFILE, FileCloser>;

SoundFile OpenSound(const std::string& path, int mode, SF_INFO& info) {
  SoundFile file(sf_open(path.c_str(), mode, &info));
  if (file == nullptr) throw Failure(fmt::format("cannot open {}: {}", path, sf_strerror(nullptr)));
  return file;
}

}  // namespace

void WriteStereoSound(const std::string& path, const StereoSound& recording) {
  SF_INFO info{};
  info.samplerate = recording.rate;
  info.channels = 2;
  info.format = SF_FORMAT_WAV | SF_FORMAT_PCM_16;
  const SoundFile file = OpenSound(path, SFM_WRITE, info);
  std::vector<double> frames;
  for (std::size_t i = 0; i < recording.left.size(); ++i) {
    frames.insert(frames.end(), {recording.left[i], recording.right[i]});
  }
  const auto count = static_cast<sf_count_t>(recording.left.size());
  if (sf_writef_double(file.get(), frames.data(), count) != count) {
    throw Failure(fmt::format("cannot write {}: {}", path, sf_strerror(file.get())));
  }
}

StereoSound ReadStereoSound(const std::string& path) {
  SF_INFO info{};
  const SoundFile file = OpenSound(path, SFM_READ, info);
  if (info.channels != 2) throw Failure(fmt::format("{} is not stereo", path));
  std::vector<double> frames(static_cast<std::size_t>(info.frames) * 2);
  sf_readf_double(file.get(), frames.data(), info.frames);
  StereoSound recording;
  recording.rate = info.samplerate;
  for (std::size_t i = 0; i < frames.size(); i += 2) {
    recording.left.push_back(frames[i]);
    recording.right.push_back(frames[i + 1]);
  }
  return recording;
}

}  // namespace CommandLine
