// What the sound manager needs: a server, and modules of it.

#include <Host/Needs.h>
#include <pulse/pulseaudio.h>

#include <chrono>
#include <cstring>
#include <memory>
#include <set>
#include <string>

namespace Host {
namespace {

using Clock = std::chrono::steady_clock;

constexpr std::chrono::seconds kPatience{2};

struct LoopDeleter {
  void operator()(pa_mainloop* loop) const { pa_mainloop_free(loop); }
};

struct ContextDeleter {
  void operator()(pa_context* context) const {
    pa_context_disconnect(context);
    pa_context_unref(context);
  }
};

/// What the server says of itself; asked once.
class Server {
 public:
  bool Ask() {
    if (pa_context_connect(context_.get(), nullptr, PA_CONTEXT_NOAUTOSPAWN, nullptr) < 0)
      return false;
    if (!WaitUntil([this] { return pa_context_get_state(context_.get()) == PA_CONTEXT_READY; })) {
      return false;
    }
    pa_operation_unref(pa_context_get_server_info(context_.get(), OnServer, this));
    pa_operation_unref(pa_context_get_module_info_list(context_.get(), OnModule, this));
    return WaitUntil([this] { return hasModules_; });
  }

  bool HasSink() const { return hasSink_; }
  bool IsPipeWire() const { return isPipeWire_; }
  bool HasModule(const char* name) const { return modules_.count(name) > 0; }

 private:
  template <typename Condition>
  bool WaitUntil(Condition isDone) {
    const Clock::time_point end = Clock::now() + kPatience;
    while (!isDone()) {
      constexpr int kMicroseconds = 100000;
      if (Clock::now() > end || !PA_CONTEXT_IS_GOOD(pa_context_get_state(context_.get())))
        return false;
      if (pa_mainloop_prepare(loop_.get(), kMicroseconds) < 0 ||
          pa_mainloop_poll(loop_.get()) < 0 || pa_mainloop_dispatch(loop_.get()) < 0) {
        return false;
      }
    }
    return true;
  }

  static void OnServer(pa_context*, const pa_server_info* info, void* self) {
    if (info == nullptr) return;
    auto* server = static_cast<Server*>(self);
    server->hasSink_ = info->default_sink_name != nullptr && *info->default_sink_name != '\0';
    server->isPipeWire_ =
        info->server_name != nullptr && std::strstr(info->server_name, "PipeWire") != nullptr;
  }

  static void OnModule(pa_context*, const pa_module_info* info, int end, void* self) {
    auto* server = static_cast<Server*>(self);
    if (end != 0) {
      server->hasModules_ = true;
    } else {
      server->modules_.insert(info->name);
    }
  }

  const std::unique_ptr<pa_mainloop, LoopDeleter> loop_{pa_mainloop_new()};
  const std::unique_ptr<pa_context, ContextDeleter> context_{
      pa_context_new(pa_mainloop_get_api(loop_.get()), "zelkora")};
  bool hasSink_ = false;
  bool isPipeWire_ = false;
  bool hasModules_ = false;
  std::set<std::string> modules_;
};

}  // namespace

std::vector<Need> ListSoundManagerNeeds() {
  Server server;
  std::vector<Need> needs{
      {"sound server", server.Ask(), "apt install pulseaudio; pulseaudio --start"}};
  if (!needs.front().isMet) return needs;
  needs.push_back({"sound output", server.HasSink(), "pactl load-module module-null-sink"});
  if (server.IsPipeWire()) return needs;  // which keeps volumes, and pauses others, by itself
  needs.push_back({"volumes that are kept", server.HasModule("module-stream-restore"),
                   "pactl load-module module-stream-restore"});
  needs.push_back({"other programs pause during a call", server.HasModule("module-role-cork"),
                   "pactl load-module module-role-cork"});
  return needs;
}

}  // namespace Host
