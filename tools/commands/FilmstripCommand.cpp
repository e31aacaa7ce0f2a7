#include "Commands.h"
#include "base/Failure.h"
#include "base/Output.h"
#include "base/OutputFile.h"
#include "base/Progress.h"
#include "base/Quantities.h"
#include "media/Movie.h"
#include "pictures/Filmstrip.h"

#include <fmt/format.h>

#include <memory>
#include <set>
#include <string>

namespace CommandLine {
namespace {

struct Options {
  std::string file;
  std::string output = "strip.png";
  int count = 12;
};

/// The middle of one of \p count equal parts: neither the black start nor the very end.
long MiddleOfPart(long duration, int part, int count) {
  return static_cast<long>(static_cast<double>(duration) * (2 * part + 1) / (2 * count));
}

Filmstrip CollectKeyFrames(Movie& movie, int count) {
  Filmstrip strip;
  std::set<long> seen;
  Progress progress(static_cast<std::size_t>(count));
  const long duration = movie.Duration();
  for (int part = 0; part < count; ++part, progress.Advance()) {
    const long position = MiddleOfPart(duration, part, count);
    long landed = 0;
    Check(movie.SeekTo(position, landed), fmt::format("move to {} ms", position));
    if (seen.insert(landed).second) strip.Add(movie.Capture(), landed);
  }
  return strip;
}

int MakeFilmstrip(const Options& options) {
  Movie movie(options.file);
  OutputFile output(options.output);  // before the work, which may take long
  const Filmstrip strip = CollectKeyFrames(movie, options.count);
  const Filmstrip::Size size = strip.Write(output);
  const char* frames = strip.Count() == 1 ? "frame" : "frames";
  if (strip.Count() < static_cast<std::size_t>(options.count)) {
    PrintError(fmt::format("note: the video has only {} key {} near the {} positions",
                           strip.Count(), frames, options.count));
  }
  if (output.IsStandardOutput()) return 0;
  Print(fmt::format("{}: {} {}, {} x {} pixels\n", options.output, strip.Count(), frames,
                    size.width, size.height));
  return 0;
}

}  // namespace

void AddFilmstripCommand(CLI::App& program, Command& chosen) {
  auto options = std::make_shared<Options>();
  auto* command = program.add_subcommand("filmstrip", "Write a picture of a video's key frames");
  command->add_option("FILE", options->file, "The video")->required()->type_name("");
  command->add_option("-n,--frames", options->count, "Number of frames, 1 to 500, evenly spread")
      ->check(IsWholeNumber(1, 500))
      ->type_name("N")
      ->capture_default_str();
  command
      ->add_option("-o,--output", options->output,
                   "The picture to write, a PNG file; an older one is replaced")
      ->check(EndsIn({".png"}))
      ->type_name("FILE")
      ->capture_default_str();
  command->footer("Example: zelkora filmstrip movie.mp4 -n 20 -o movie.png");
  command->callback([options, &chosen] {
    RefuseSameFile(options->output, options->file);
    chosen = [options] { return MakeFilmstrip(*options); };
  });
}

}  // namespace CommandLine
