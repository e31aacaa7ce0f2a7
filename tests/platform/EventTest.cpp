// What the library relies on in the platform's asynchronous events.

#include "support/Gate.h"
#include "support/OwnProcess.h"

#include <Host/Calls.h>
#include <Host/Events.h>
#include <Tizen/Base/Runtime/Event.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

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

using testing::ElementsAre;
using testing::IsEmpty;
using Tizen::Base::Runtime::_Event;
using Tizen::Base::Runtime::IEventArg;
using Tizen::Base::Runtime::IEventListener;

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
  }
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
  EXPECT_EQ(event.RemoveListener(listener), E_SUCCESS);
  EXPECT_EQ(event.RemoveListener(listener), E_OBJ_NOT_FOUND);
}

TEST_F(Delivery, IsInTheOrderOfFiringOverAllEventsOnOneThreadOfItsOwn) {
  std::vector<std::string> heard;
  std::set<std::thread::id> threads;
  const auto hear = [&](const char* name) {
    return [&, name](int value) {
      heard.push_back(name + std::to_string(value));
      threads.insert(std::this_thread::get_id());
    };
  };
  Listener a(hear("a")), b(hear("b"));
  ReadyEvent first({&b, &a}), second({&b});
  WhileBusy([&] {
    first.Fire(1);
    second.Fire(2);
    first.Fire(3);
    EXPECT_THAT(heard, IsEmpty());
  });
  EXPECT_THAT(heard, ElementsAre("b1", "a1", "b2", "b3", "a3"));
  EXPECT_THAT(threads, ElementsAre(testing::Ne(std::this_thread::get_id())));
}

TEST_F(Delivery, ReachesAListenerForWhatIsFiredWhileItIsAdded) {
  Listener listener;
  ReadyEvent event;
  WhileBusy([&] {
    event.Fire(1);
    event.AddListener(listener, false);
    event.Fire(2);
    event.RemoveListener(listener);
    event.Fire(3);
    event.AddListener(listener, false);
    event.Fire(4);
  });
  EXPECT_THAT(listener.heard, ElementsAre(4));
}

TEST_F(Delivery, GoesOnAfterAListenerLetAnExceptionOut) {
  testing::internal::CaptureStderr();
  Listener thrower([](int) { throw std::runtime_error("no cake"); });
  Listener listener, strangeThrower([](int) { throw 5; });
  ReadyEvent event({&thrower, &strangeThrower, &listener});
  event.Fire(1);
  Host::WaitUntilDelivered();
  EXPECT_THAT(testing::internal::GetCapturedStderr(),
              testing::ContainsRegex("let an exception out: no cake.*\n.*let an exception out\\."));
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

TEST_F(Delivery, FromTwoThreadsKeepsEachOnesOrderWhileListenersComeAndGo) {
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
    EXPECT_EQ(event.AddListener(passing, false), E_SUCCESS);
    event.Fire(n);
    event.RemoveListener(passing);
  }
  other.join();
  Host::WaitUntilDelivered();
  std::vector<int> all(kEvents);
  std::iota(all.begin(), all.end(), 1);
  EXPECT_THAT(heard, testing::Each(all));
}

TEST_F(EventTest, EndOfAListenerWaitsForItsCall) {
  enum End { kRemoved, kDestroyed };
  for (const End end : {kRemoved, kDestroyed}) {
    SCOPED_TRACE(end);
    Gate gate;
    bool finished = false;  // plain, so that a race shows
    auto event = std::make_unique<ReadyEvent>();
    Listener next, listener([&](int) {
      gate.Pass();
      for (int i = 0; i < 1000; ++i) std::this_thread::yield();  // time for who doesn't wait
      finished = true;
    });
    event->AddListener(listener, false);
    event->AddListener(next, false);
    for (const int value : {1, 2}) event->Fire(value);
    gate.AwaitVisitor();
    std::thread opener([&] { gate.Open(); });
    if (end == kDestroyed) {
      event.reset();
      EXPECT_EQ(livingArguments, 0);
    } else {
      EXPECT_EQ(event->RemoveListener(listener), E_SUCCESS);
    }
    EXPECT_TRUE(finished);
    opener.join();
    Host::WaitUntilDelivered();
    EXPECT_THAT(listener.heard, ElementsAre(1));
    EXPECT_EQ(next.heard, end == kDestroyed ? std::vector<int>{} : (std::vector{1, 2}));
  }
}

TEST_F(RemovingAListener, DoesNotWaitForTheCallsOfOthers) {
  Gate gate;
  Listener next, busy([&](int) { gate.Pass(); });
  ReadyEvent event({&busy, &next}), sameListenersEvent({&busy});
  event.Fire(1);
  gate.AwaitVisitor();
  EXPECT_EQ(event.RemoveListener(next), E_SUCCESS);
  EXPECT_EQ(sameListenersEvent.RemoveListener(busy), E_SUCCESS);
  gate.Open();
  Host::WaitUntilDelivered();
  EXPECT_THAT(next.heard, IsEmpty());
}

TEST_F(DestroyingAnEvent, AlsoInsideItsCallFreesWhatIsQueuedForItAndNothingElse) {
  std::unique_ptr<ReadyEvent> outside, inside;
  Listener listener, bystander, destroyer([&](int) { inside.reset(); });
  ReadyEvent other({&bystander});
  outside = std::make_unique<ReadyEvent>(std::vector{&listener});
  inside = std::make_unique<ReadyEvent>(std::vector{&destroyer, &listener});
  WhileBusy([&] {
    for (const int value : {1, 2}) {
      for (ReadyEvent* event : {&other, inside.get(), outside.get()}) event->Fire(value);
    }
    outside.reset();
    EXPECT_EQ(livingArguments, 1 + 4);
  });
  EXPECT_EQ(inside, nullptr);
  EXPECT_THAT(destroyer.heard, ElementsAre(1));
  EXPECT_THAT(listener.heard, IsEmpty());
  EXPECT_THAT(bystander.heard, ElementsAre(1, 2));
}

TEST_F(DestroyingAnEvent, WhileItsEventsAreDeliveredIsSafe) {
  Listener listener;
  for (int i = 0; i < 500; ++i) {
    auto event = std::make_unique<ReadyEvent>(std::vector{&listener});
    for (int n = 0; n < 5; ++n) event->Fire(n);
    if (i % 2 == 0) std::this_thread::yield();
    event.reset();
    ASSERT_EQ(livingArguments, 0);
  }
}

// What follows is the end of a process, in one of its own each.

void FireMany(NumberEvent& event) {
  for (int i = 0; i < 1000; ++i) event.Fire(i);
}

TEST(ProcessDeathTest, EndsCleanlyWithAnEventThatOutlivesTheDispatcher) {
  InOwnProcess([] {
    static NumberEvent event;
    static Listener listener;
    std::atexit([] {
      Host::WaitUntilDelivered();
      if (event.Fire(1) != E_SYSTEM || event.RemoveListener(listener) != E_SUCCESS) _exit(1);
    });
    event.Initialize();
    event.AddListener(listener, false);
    FireMany(event);
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
    EXPECT_EQ(WithoutThreads([&] { return event.Initialize(); }), E_SYSTEM);
    EXPECT_EQ(event.Initialize(), E_SUCCESS);
  });
}

}  // namespace
