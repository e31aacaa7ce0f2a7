#include "Connection.h"

#include "Log.h"

#include <algorithm>

namespace Desktop {
namespace {

/// How long to wait before the next attempt to connect: doubled each time. An attempt costs a
/// refused `connect`.
constexpr std::chrono::milliseconds kFirstPause{25};
constexpr std::chrono::milliseconds kLongestPause{800};

}  // namespace

void Connection::Connect() {
  if (state_ != State::kDown) return;
  retry_.Stop();
  state_ = State::kConnecting;
  ++number_;
  context_.reset(pa_context_new(loop_.GetApi(), "zelkora"));
  if (context_ == nullptr) return OnFailed(PA_ERR_INTERNAL);
  pa_context_set_state_callback(context_.get(), OnStateChanged, this);
  if (pa_context_connect(context_.get(), nullptr, PA_CONTEXT_NOAUTOSPAWN, nullptr) < 0) {
    OnFailed(pa_context_errno(context_.get()));
  }
}

void Connection::Close() {
  retry_.Stop();
  state_ = State::kClosed;
  error_ = PA_ERR_CONNECTIONTERMINATED;
  if (context_ != nullptr) {
    pa_context_set_state_callback(context_.get(), nullptr, nullptr);
    pa_context_disconnect(context_.get());
  }
  owner_.OnDisconnected(false);
  context_.reset();
}

void Connection::OnStateChanged(pa_context* context, void* self) {
  auto& connection = *static_cast<Connection*>(self);
  const pa_context_state_t state = pa_context_get_state(context);
  if (state == PA_CONTEXT_READY) connection.OnReady();
  if (!PA_CONTEXT_IS_GOOD(state)) connection.OnFailed(pa_context_errno(context));
}

void Connection::OnReady() {
  state_ = State::kUp;
  pause_ = kFirstPause;
  if (isLossLogged_) LogChange("The sound server is back.");
  isLossLogged_ = false;
  owner_.OnConnected(context_.get());
}

void Connection::OnFailed(int error) {
  if (IsDown()) return;  // told already
  const bool wasConnected = state_ == State::kUp;
  state_ = State::kDown;
  error_ = error;
  if (!isLossLogged_) {
    LogFailure(wasConnected ? "The sound server is gone" : "The sound server can't be reached",
               pa_strerror(error));
  }
  isLossLogged_ = true;
  owner_.OnDisconnected(wasConnected);
  ScheduleRetry();
}

void Connection::ScheduleRetry() {
  retry_.Start(pause_);
  pause_ = std::clamp(2 * pause_, kFirstPause, kLongestPause);
}

}  // namespace Desktop
