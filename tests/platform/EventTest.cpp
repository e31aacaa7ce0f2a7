// What the library relies on in the platform's asynchronous events.

#include "support/Allocations.h"
#include "support/Gate.h"
#include "support/OwnProcess.h"

#include <Host/Calls.h>
#include <Host/Events.h>
#include <Tizen/Base/Runtime/Event.h>

#include <gmock/gmock.h>
#include <sound_manager.h>

#include <atomic>
#include <functional>
#include <memory>
#include <numeric>
#include <set>
#include <stdexcept>
#include <string>
#include <thread>
#include <vector>

namespace {

using namespace testing;
using namespace Tizen::Base::Runtime;

std::atomic<int> livingArguments{0};

struct Number : IEventArg {
  explicit Number(int number) : value(number) { ++livingArguments; }
  ~Number() override {
    for (int i = 0; i < 100; ++i) std::this_thread::yield();  // time for who doesn't wait
    --livingArguments;
  }
  const int value;
};

struct Listener : IEventListener {
  explicit Listener(std::function<void(int)> function = [](int) {})
      : onNumber(std::move(function)) {}
  std::function<void(int)> onNumber;
  std::vector<int> heard;
};

struct NumberEvent : _Event {
  result Fire(int value) { return FireAsync(*new Number(value)); }

  void FireToListener(IEventListener& listener, const IEventArg& arg) override {
    auto& target = static_cast<Listener&>(listener);
    target.heard.push_back(static_cast<const Number&>(arg).value);
    target.onNumber(target.heard.back());
  }
};

struct ReadyEvent : NumberEvent {
  explicit ReadyEvent(const std::vector<Listener*>& listeners = {}) {
    EXPECT_EQ(Initialize(), E_SUCCESS);
    for (Listener* listener : listeners) EXPECT_EQ(AddListener(*listener, false), E_SUCCESS);
  }
};

/// Runs \p body while the dispatcher is held up in a listener's call of another event.
void WhileBusy(const std::function<void()>& body) {
  Gate gate;
  Listener listener([&](int) { gate.Pass(); });
  ReadyEvent event({&listener});
  event.Fire(0);
  gate.AwaitVisitor();
  body();
  gate.Open();
  Host::WaitUntilDelivered();
}

class EventTest : public testing::Test {
 protected:
  ~EventTest() override {
    Host::WaitUntilDelivered();
    EXPECT_EQ(livingArguments, 0);
    EXPECT_LT(CountLiveAllocations(), before_ + 8);  // such as room in the queues
  }

 private:
  const std::ptrdiff_t before_ = CountLiveAllocations();
};

using Delivery = EventTest;
using RemovingAListener = EventTest;
using DestroyingAnEvent = EventTest;

TEST_F(EventTest, RefusedOperationSaysWhyAndDoesNothingButFreeTheArgument) {
  Listener listener, other;
  NumberEvent event;
  EXPECT_EQ(event.AddListener(listener, false), E_INVALID_STATE);
  EXPECT_EQ(event.RemoveListener(listener), E_INVALID_STATE);
  EXPECT_EQ(event.Fire(1), E_INVALID_STATE);
  EXPECT_EQ(event.Initialize(), E_SUCCESS);
  EXPECT_EQ(event.Initialize(), E_INVALID_OPERATION);
  EXPECT_EQ(event.AddListener(listener, false), E_SUCCESS);
  EXPECT_EQ(event.AddListener(listener, false), E_INVALID_OPERATION);
  EXPECT_EQ(event.AddListener(other, true), E_UNSUPPORTED_OPERATION);
  EXPECT_EQ(event.RemoveListener(other), E_OBJ_NOT_FOUND);
  Host::FailCall("_Event::FireAsync", E_OUT_OF_MEMORY, 1);
  EXPECT_EQ(event.Fire(2), E_OUT_OF_MEMORY);
  EXPECT_EQ(livingArguments, 0);
  event.Fire(3);
  Host::WaitUntilDelivered();
  EXPECT_THAT(listener.heard, ElementsAre(3));
}

TEST_F(Delivery, IsInTheOrderOfFiringOverAllEventsOnOneThreadToWhoIsThereAllTheTime) {
  std::vector<std::string> heard;
  std::set<std::thread::id> threads;
  const auto hear = [&](const char* name) {
    return [&, name](int value) {
      heard.push_back(name + std::to_string(value));
      threads.insert(std::this_thread::get_id());
    };
  };
  Listener a(hear("a")), b(hear("b")), late(hear("late"));
  ReadyEvent first({&b, &a}), second({&b});
  WhileBusy([&] {
    first.Fire(1);
    first.AddListener(late, false);
    first.Fire(2);
    first.RemoveListener(late);
    second.Fire(3);
    first.AddListener(late, false);
    first.Fire(4);
    EXPECT_THAT(heard, IsEmpty());
  });
  EXPECT_THAT(heard, ElementsAre("b1", "a1", "b2", "a2", "b3", "b4", "a4", "late4"));
  EXPECT_THAT(threads, ElementsAre(Ne(std::this_thread::get_id())));
}

TEST_F(Delivery, GoesOnAfterAListenerLetAnExceptionOut) {
  testing::internal::CaptureStderr();
  Listener thrower([](int) { throw std::runtime_error("no cake"); });
  Listener listener, strangeThrower([](int) { throw 5; });
  ReadyEvent event({&thrower, &strangeThrower, &listener});
  event.Fire(1);
  Host::WaitUntilDelivered();
  EXPECT_THAT(testing::internal::GetCapturedStderr(),
              ContainsRegex("let an exception out: no cake.*\n.*let an exception out\\."));
  EXPECT_THAT(listener.heard, ElementsAre(1));
}

TEST_F(Delivery, FollowsTheListenersThatACallAddsAndRemoves) {
  Listener self, removed, added;
  ReadyEvent event({&self, &removed});
  self.onNumber = [&](int) {
    Host::WaitUntilDelivered();  // not for this call
    EXPECT_EQ(livingArguments, 1);
    EXPECT_EQ(event.RemoveListener(self), E_SUCCESS);
    EXPECT_EQ(event.RemoveListener(removed), E_SUCCESS);
    EXPECT_EQ(event.AddListener(added, false), E_SUCCESS);
    EXPECT_EQ(event.Fire(2), E_SUCCESS);
  };
  added.onNumber = [&](int value) {
    if (value < 3) event.Fire(value + 1);
  };
  event.Fire(1);
  while (livingArguments > 0) Host::WaitUntilDelivered();
  EXPECT_THAT(self.heard, ElementsAre(1));
  EXPECT_THAT(removed.heard, IsEmpty());
  EXPECT_THAT(added.heard, ElementsAre(2, 3));
}

TEST_F(Delivery, FromTwoThreadsKeepsEachOnesOrderWhileListenersAndEventsComeAndGo) {
  constexpr int kEvents = 2000;
  std::vector<int> heard[2];
  Listener steady([&](int value) { heard[value < 0].push_back(std::abs(value)); });
  ReadyEvent event({&steady});
  std::thread other([&] {
    for (int n = 1; n <= kEvents; ++n) {
      event.Fire(-n);
      if (n % 4 == 0) Host::WaitUntilDelivered();
    }
  });
  for (int n = 1; n <= kEvents; ++n) {
    Listener passing;  // destroyed as soon as it is removed
    ReadyEvent brief({&passing});
    EXPECT_EQ(event.AddListener(passing, false), E_SUCCESS);
    for (ReadyEvent* both : {&brief, &event}) both->Fire(n);
    event.RemoveListener(passing);
  }
  other.join();
  Host::WaitUntilDelivered();
  std::vector<int> all(kEvents);
  std::iota(all.begin(), all.end(), 1);
  EXPECT_THAT(heard, Each(all));
}

struct SlowListener : Listener {
  SlowListener() : Listener([this](int) { call(); }) {}
  SlowCall call;
};

TEST_F(RemovingAListener, WaitsForItsOwnCallOnly) {
  Gate gate;
  SlowListener listener;
  Listener next([&](int) { gate.Pass(); }), removed;
  ReadyEvent event({&listener, &next, &removed}), sameListenersEvent({&listener});
  event.Fire(1);
  listener.call.gate.AwaitVisitor();
  EXPECT_EQ(event.RemoveListener(removed), E_SUCCESS);
  EXPECT_EQ(sameListenersEvent.RemoveListener(listener), E_SUCCESS);
  listener.call.ExpectAwaitedBy([&] { EXPECT_EQ(event.RemoveListener(listener), E_SUCCESS); });
  gate.Open();
  Host::WaitUntilDelivered();
  EXPECT_THAT(removed.heard, IsEmpty());
  EXPECT_THAT(next.heard, ElementsAre(1));
}

TEST_F(DestroyingAnEvent, WaitsForItsCallAndMakesNoOther) {
  SlowListener listener;
  Listener next;
  auto event = std::make_unique<ReadyEvent>(std::vector<Listener*>{&listener, &next});
  for (const int value : {1, 2}) event->Fire(value);
  listener.call.gate.AwaitVisitor();
  listener.call.ExpectAwaitedBy([&] {
    event.reset();
    EXPECT_EQ(livingArguments, 0);
  });
  EXPECT_THAT(next.heard, IsEmpty());
}

TEST_F(DestroyingAnEvent, AlsoInsideItsCallFreesWhatIsQueuedForItAndNothingElse) {
  constexpr int kMany = 200;
  for (int i = 0; i < 10; ++i) {
    std::unique_ptr<ReadyEvent> inside;
    Listener listener, bystander, destroyer([&](int) { inside.reset(); });
    ReadyEvent other({&bystander});
    auto outside = std::make_unique<ReadyEvent>(std::vector{&listener});
    inside = std::make_unique<ReadyEvent>(std::vector{&destroyer, &listener});
    WhileBusy([&] {
      for (int value = 0; value < kMany; ++value) {
        for (ReadyEvent* event : {&other, inside.get(), outside.get()}) event->Fire(value);
      }
      outside.reset();
      EXPECT_EQ(livingArguments, 1 + 2 * kMany);
    });
    EXPECT_EQ(inside, nullptr);
    EXPECT_THAT(destroyer.heard, ElementsAre(0));
    EXPECT_THAT(listener.heard, IsEmpty());
    EXPECT_EQ(bystander.heard.size(), std::size_t{kMany});
  }
}

// What follows is the end of a process, in one of its own each.

void FireMany(NumberEvent& event) {
  for (int i = 0; i < 1000; ++i) event.Fire(i);
}

TEST(ProcessDeathTest, EndsAfterTheCallThatIsRunningWithAnEventThatOutlivesTheDispatcher) {
  InOwnProcess([] {
    static std::atomic<bool> isCalled{false};
    static NumberEvent event;
    static Listener listener([](int) {
      isCalled = true;
      usleep(20000);
      isCalled = false;
    });
    static std::thread waiting;
    CheckAtExit([] {
      EXPECT_FALSE(isCalled);
      EXPECT_EQ(event.Fire(1), E_SYSTEM);
      EXPECT_EQ(event.RemoveListener(listener), E_SUCCESS);
      waiting.join();
    });
    event.Initialize();
    event.AddListener(listener, false);
    FireMany(event);
    waiting = std::thread(Host::WaitUntilDelivered);
    while (!isCalled) std::this_thread::yield();
  });
}

TEST(ProcessDeathTest, EndsCleanlyInsideAListenerOfAnEventThatIsDeletedThen) {
  InOwnProcess([] {
    static auto& gate = *new Gate;  // outlives the thread that opens it
    static Listener listener([](int) {
      gate.Pass();
      std::exit(0);
    });
    static auto* event = new ReadyEvent({&listener});
    std::atexit([] { delete event; });
    FireMany(*event);
    gate.Open();
    for (;;) pause();
  });
}

TEST(ProcessDeathTest, GoesOnWhenThreadsCanBeStartedAtLast) {
  InOwnProcess([] {
    NumberEvent event;
    const auto listen = [] {
      return sound_manager_set_volume_changed_cb([](int, int, void*) {}, nullptr);
    };
    EXPECT_EQ(WithoutThreads([&] { return event.Initialize(); }), E_SYSTEM);
    EXPECT_EQ(WithoutThreads(listen), SOUND_MANAGER_ERROR_OUT_OF_MEMORY);
    EXPECT_EQ(event.Initialize(), E_SUCCESS);
    EXPECT_EQ(listen(), 0);
  });
}

}  // namespace
