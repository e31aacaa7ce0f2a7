#include "Commands.h"
#include "base/Failure.h"
#include "base/Output.h"
#include "base/Quantities.h"
#include "media/Movie.h"

#include <fmt/format.h>

#include <algorithm>
#include <memory>
#include <string>
#include <vector>

namespace CommandLine {
namespace {

struct Options {
  std::string file;
  std::vector<std::string> wanted;
  std::vector<long> positions;  // the same in milliseconds
  bool listsKeyFrames = false;
};

/// Prints one row after the other; failures are kept for the end, so that the table stays whole.
class Table {
 public:
  explicit Table(const std::vector<long>& positions) {
    for (long position : positions) width_ = std::max(width_, fmt::formatted_size("{}", position));
    Print(fmt::format("{:>{}}  {:>{}}  key frame\n", "asked", width_, "landed", width_));
  }

  void AddLanding(long asked, long landed, bool keyFrame) {
    Print(fmt::format("{:>{}}  {:>{}}  {}\n", asked, width_, landed, width_,
                      keyFrame ? "yes" : "no"));
  }

  void AddFailure(long asked, result r) {
    Print(fmt::format("{:>{}}  {:>{}}  {}\n", asked, width_, "-", width_, GetErrorMessage(r)));
    failures_.push_back(Describe(fmt::format("move to {} ms", asked), r));
  }

  /// \return the exit code.
  int Finish() const {
    for (const std::string& failure : failures_) PrintError(failure);
    return failures_.empty() ? 0 : 1;
  }

 private:
  std::size_t width_ = 6;  // of the word "landed"
  std::vector<std::string> failures_;
};

int ListKeyFrames(const Movie& movie) {
  std::string lines;
  for (long keyFrame : movie.KeyFrames()) lines += fmt::format("{}\n", keyFrame);
  Print(lines);
  return 0;
}

int Seek(const Options& options) {
  Movie movie(options.file);
  if (options.listsKeyFrames) return ListKeyFrames(movie);
  Table table(options.positions);
  for (long position : options.positions) {
    long landed = 0;
    const result r = movie.SeekTo(position, landed);
    if (r == E_SUCCESS) {
      table.AddLanding(position, landed, movie.IsOnKeyFrame());
    } else {
      table.AddFailure(position, r);
    }
  }
  return table.Finish();
}

}  // namespace

void AddSeekCommand(CLI::App& program, Command& chosen) {
  auto options = std::make_shared<Options>();
  auto* command = program.add_subcommand("seek", "Move to key frames and tell where they are");
  command->add_option("FILE", options->file, "The video")->required()->type_name("");
  auto* positions = command
                        ->add_option("POSITION", options->wanted,
                                     "Where to move to: 1500 or 1500ms, 90s, 1.5s, 1:30 or "
                                     "1:02:03.5")
                        ->check(IsPosition())
                        ->type_name("");
  command->add_flag("--keys", options->listsKeyFrames, "List the positions of all key frames")
      ->excludes(positions);
  command->footer("Example: zelkora seek movie.mp4 0 4200 1:30");
  command->callback([options, &chosen] {
    if (options->wanted.empty() && !options->listsKeyFrames) throw CLI::RequiredError("POSITION");
    for (const std::string& text : options->wanted) {
      options->positions.push_back(*ToMilliseconds(text));
    }
    chosen = [options] { return Seek(*options); };
  });
}

}  // namespace CommandLine
