/// \file
#pragma once

#include "Gst.h"

#include <chrono>
#include <condition_variable>
#include <mutex>
#include <string>

namespace Desktop {

/// Hears what a pipeline says. Messages are read on the thread that posts them and dropped there,
/// so that no main loop is needed and none pile up.
class PipelineWatch {
 public:
  enum class Answer { kNone, kDone, kFailed };

  /// What went wrong first; what comes after it is only its consequence.
  struct Failure {
    bool atMedia = false;  ///< the file is to blame, not the framework
    std::string reason;
  };

  explicit PipelineWatch(GstElement* pipeline);

  /// The pipeline must have been stopped: then no thread posts any more.
  ~PipelineWatch();

  PipelineWatch(const PipelineWatch&) = delete;
  PipelineWatch& operator=(const PipelineWatch&) = delete;

  /// To be called before each order to the pipeline, so that the next answer is the order's.
  void ExpectAnswer();

  /// Waits until the pipeline has prerolled, reached its end or failed. A failure stays for good.
  /// \return `kNone` when nothing of this happened within \p limit
  Answer WaitForAnswer(std::chrono::milliseconds limit);

  /// Waits until everything has been played, or played no further because of a failure.
  /// \return false when neither happened within \p limit
  bool WaitForEnd(std::chrono::milliseconds limit);

  /// \return whether everything has been played since the last `ForgetEnd`.
  bool HasEnded() const;

  /// To be called before what begins elsewhere in the file.
  void ForgetEnd();

  bool HasFailed() const;
  Failure GetFailure() const;

 private:
  static GstBusSyncReply OnMessage(GstBus*, GstMessage* message, gpointer watch);
  void Read(GstMessage* message);
  void ReadError(GstMessage* message);
  void ReadMissingPlugin(GstMessage* message);
  void SetDone(bool isEnd);

  const BusPtr bus_;
  mutable std::mutex mutex_;  // never held while GStreamer is called
  std::condition_variable answered_;
  Answer answer_ = Answer::kNone;
  bool hasEnded_ = false;
  Failure failure_;
  std::string missingPlugin_;
};

}  // namespace Desktop
