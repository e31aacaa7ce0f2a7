#pragma once

#include <deque>
#include <optional>
#include <string>

namespace CommandLine {

/// Where the shell's lines come from.
class Input {
 public:
  virtual ~Input() = default;

  /// \return the next line that has come, if any.
  std::optional<std::string> TakeLine();

  /// \return whether no line comes any more.
  bool IsAtEnd() const { return ended_ && lines_.empty(); }

  /// Shows that a line is awaited.
  virtual void Prompt() {}

  /// \return a descriptor that is readable when `Receive` has something to do.
  virtual int Descriptor() const = 0;

  /// Takes in what there is; throws a `Failure` when that can't be read.
  virtual void Receive() = 0;

  /// \return whether the user sees the lines while they are typed.
  virtual bool IsTerminal() const { return false; }

  /// Drops the line that is being typed.
  virtual void Cancel() {}

  // Around printing while the user may be typing.
  virtual void HideLine() {}
  virtual void ShowLine() {}

 protected:
  std::deque<std::string> lines_;
  bool ended_ = false;
};

/// Lines of a file, a pipe or the like.
class FileInput : public Input {
 public:
  /// Opens a file, or standard input for ""; throws a `Failure` when that can't be done.
  explicit FileInput(const std::string& path);
  ~FileInput() override;
  FileInput(const FileInput&) = delete;
  FileInput& operator=(const FileInput&) = delete;

  int Descriptor() const override { return descriptor_; }
  void Receive() override;

 private:
  void SplitLines();

  const std::string path_;
  const int descriptor_;
  std::string rest_;  // behind the last line's end
};

}  // namespace CommandLine
