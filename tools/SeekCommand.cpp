#include "Commands.h"
#include "Failure.h"
#include "Movie.h"
#include "Output.h"

#include <fmt/format.h>

#include <algorithm>
#include <charconv>
#include <memory>
#include <string>
#include <vector>

namespace CommandLine {
namespace {

struct Options {
  std::string file;
  std::vector<long> positions;  // in milliseconds
};

/// \return an error text, "" for a position, as CLI11 wants it.
std::string CheckPosition(const std::string& text) {
  long position = 0;
  const char* end = text.data() + text.size();
  const auto [rest, error] = std::from_chars(text.data(), end, position);
  if (rest == end && error == std::errc()) return "";
  return fmt::format("'{}' is no number of milliseconds", text);
}

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

int Seek(const Options& options) {
  Movie movie(options.file);
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
  command->add_option("MS", options->positions, "Positions to move to, in milliseconds")
      ->required()
      ->check(CheckPosition)
      ->type_name("");
  command->footer("Example: zelkora seek movie.mp4 0 4200 90000");
  command->callback([options, &chosen] { chosen = [options] { return Seek(*options); }; });
}

}  // namespace CommandLine
