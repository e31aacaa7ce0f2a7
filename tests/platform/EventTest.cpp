// What the library relies on in the platform's asynchronous events.

#include <Host/Calls.h>
#include <Host/Events.h>
#include <Host/Log.h>
#include <Tizen/Base/Runtime/Event.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <pthread.h>
#include <unistd.h>

#include <atomic>
#include <cstdlib>
#include <functional>
#include <future>
#include <limits>
#include <mutex>
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
  ~Number() override { --livingArguments; }
  const int value;
};

struct Listener : IEventListener {
  Listener() = default;
  explicit Listener(std::function<void(int)> function) : onNumber(std::move(function)) {}
  std::function<void(int)> onNumber;
  std::vector<int> heard;
};

class NumberEvent : public _Event {
 public:
  result Fire(int value) { return FireAsync(*new Number(value)); }

 protected:
  void FireToListener(IEventListener& listener, const IEventArg& arg) override {
    auto& target = static_cast<Listener&>(listener);
    const int value = static_cast<const Number&>(arg).value;
    target.heard.push_back(value);
    if (target.onNumber) target.onNumber(value);
  }
};

struct ReadyEvent : NumberEvent {
  ReadyEvent() { EXPECT_EQ(Initialize(), E_SUCCESS); }
};

/// Keeps who passes waiting until it is opened, and tells when somebody has come.
class Gate {
 public:
  void Pass() {
    come_.set_value();
    open_.get_future().wait();
  }
  void AwaitVisitor() { come_.get_future().wait(); }
  void Open() { open_.set_value(); }

 private:
  std::promise<void> come_, open_;
};

/// Holds the dispatcher up in a listener's call of an event of its own.
class BusyDispatcher {
 public:
  BusyDispatcher() {
    event_.AddListener(listener_, false);
    event_.Fire(0);
    gate_.AwaitVisitor();
  }
  ~BusyDispatcher() { Release(); }

  void Release() {
    if (!released_) gate_.Open();
    released_ = true;
    Host::WaitUntilDelivered();
  }

 private:
  Gate gate_;
  Listener listener_{[this](int) { gate_.Pass(); }};
  ReadyEvent event_;
  bool released_ = false;
};

/// A call that is running leaves time for who ought to wait for its end.
void Linger() {
  for (int i = 0; i < 1000; ++i) std::this_thread::yield();
}

class EventTest : public testing::Test {
 protected:
  ~EventTest() override {
    Host::WaitUntilDelivered();
    Host::ClearFailures();
    EXPECT_EQ(livingArguments, 0);
  }
};

using EventOperations = EventTest;
using Delivery = EventTest;
using ListenersInsideACall = EventTest;
using RemovingAListener = EventTest;
using DestroyingAnEvent = EventTest;

TEST_F(EventOperations, BeforeInitializeFailAndFreeTheArgument) {
  Listener listener;
  NumberEvent event;
  EXPECT_EQ(event.AddListener(listener, false), E_INVALID_STATE);
  EXPECT_EQ(event.RemoveListener(listener), E_INVALID_STATE);
  EXPECT_EQ(event.Fire(1), E_INVALID_STATE);
  EXPECT_EQ(livingArguments, 0);
}

TEST_F(EventOperations, RefuseWhatWasDoneAlreadyAndUnknownListeners) {
  Listener listener, stranger;
  ReadyEvent event;
  EXPECT_EQ(event.Initialize(), E_INVALID_OPERATION);
  EXPECT_EQ(event.AddListener(listener, false), E_SUCCESS);
  EXPECT_EQ(event.AddListener(listener, true), E_INVALID_OPERATION);
  EXPECT_EQ(event.RemoveListener(stranger), E_OBJ_NOT_FOUND);
  event.Fire(1);
  Host::WaitUntilDelivered();
  EXPECT_THAT(listener.heard, ElementsAre(1));
  EXPECT_EQ(event.RemoveListener(listener), E_SUCCESS);
  EXPECT_EQ(event.RemoveListener(listener), E_OBJ_NOT_FOUND);
}

TEST_F(EventOperations, MadeToFailDoNothingButFreeTheArgument) {
  Listener listener, other;
  NumberEvent event;
  Host::RecordCalls(true);
  Host::FailCall("_Event::Initialize", E_SYSTEM, 1);
  EXPECT_EQ(event.Initialize(), E_SYSTEM);
  EXPECT_EQ(event.Initialize(), E_SUCCESS);
  event.AddListener(listener, false);
  for (const char* operation :
       {"_Event::AddListener", "_Event::RemoveListener", "_Event::FireAsync"}) {
    Host::FailCall(operation, E_OUT_OF_MEMORY, 1);
  }
  EXPECT_EQ(event.AddListener(other, false), E_OUT_OF_MEMORY);
  EXPECT_EQ(event.RemoveListener(listener), E_OUT_OF_MEMORY);
  EXPECT_EQ(event.Fire(1), E_OUT_OF_MEMORY);
  EXPECT_EQ(livingArguments, 0);
  event.Fire(2);
  Host::WaitUntilDelivered();
  EXPECT_THAT(listener.heard, ElementsAre(2));
  EXPECT_THAT(other.heard, IsEmpty());
  EXPECT_THAT(Host::TakeCalls(),
              ElementsAre("_Event::Initialize()", "_Event::Initialize()", "_Event::AddListener()",
                          "_Event::AddListener()", "_Event::RemoveListener()",
                          "_Event::FireAsync()", "_Event::FireAsync()"));
  Host::RecordCalls(false);
}

TEST_F(Delivery, IsInTheOrderOfFiringOverAllEventsOnOneThreadOfItsOwn) {
  std::vector<std::string> heard;
  std::vector<std::thread::id> threads;
  Listener a([&](int value) { heard.push_back("a" + std::to_string(value)); });
  Listener b([&](int value) {
    heard.push_back("b" + std::to_string(value));
    threads.push_back(std::this_thread::get_id());
  });
  ReadyEvent first, second;
  first.AddListener(b, false);
  first.AddListener(a, false);
  second.AddListener(b, false);
  {
    BusyDispatcher busy;
    first.Fire(1);
    second.Fire(2);
    first.Fire(3);
    EXPECT_THAT(heard, IsEmpty());
  }
  EXPECT_THAT(heard, ElementsAre("b1", "a1", "b2", "b3", "a3"));
  EXPECT_THAT(threads, testing::Each(threads[0]));
  EXPECT_NE(threads[0], std::this_thread::get_id());
}

TEST_F(Delivery, FromSeveralThreadsKeepsTheOrderOfEachAndLosesNothing) {
  constexpr int kThreads = 4, kEvents = 2000;
  Listener listener;
  ReadyEvent event;
  event.AddListener(listener, false);
  std::vector<std::thread> threads;
  for (int i = 0; i < kThreads; ++i) {
    threads.emplace_back([&event, i] {
      for (int n = 0; n < kEvents; ++n) event.Fire(n * kThreads + i);
    });
  }
  for (std::thread& thread : threads) thread.join();
  Host::WaitUntilDelivered();
  EXPECT_EQ(listener.heard.size(), std::size_t{kThreads * kEvents});
  std::vector<int> next{0, 1, 2, 3};
  for (const int value : listener.heard) {
    EXPECT_EQ(std::exchange(next[static_cast<std::size_t>(value % kThreads)], value + kThreads),
              value);
  }
}

TEST_F(Delivery, ReachesAListenerForWhatIsFiredWhileItIsAdded) {
  Listener listener;
  ReadyEvent event;
  BusyDispatcher busy;
  event.Fire(1);
  event.AddListener(listener, false);
  event.Fire(2);
  event.RemoveListener(listener);
  event.Fire(3);
  event.AddListener(listener, false);
  event.Fire(4);
  busy.Release();
  EXPECT_THAT(listener.heard, ElementsAre(4));
}

TEST_F(Delivery, ReachesAnOnceListenerOnceAndThenItMayBeAddedAgain) {
  ReadyEvent event;
  Listener once([&](int value) {
    if (value == 1) event.AddListener(once, true);
  });
  event.AddListener(once, true);
  event.Fire(1);
  Host::WaitUntilDelivered();
  for (const int value : {2, 3}) event.Fire(value);
  Host::WaitUntilDelivered();
  EXPECT_THAT(once.heard, ElementsAre(1, 2));
  EXPECT_EQ(event.RemoveListener(once), E_OBJ_NOT_FOUND);
}

TEST_F(Delivery, GoesOnAfterAListenerLetAnExceptionOut) {
  std::vector<std::string> lines;
  Host::SetLogSink(
      [](const Host::LogRecord& record, void* context) {
        static_cast<std::vector<std::string>*>(context)->push_back(record.message);
      },
      &lines);
  Listener thrower([](int) { throw std::runtime_error("no cake"); });
  Listener strangeThrower([](int) { throw 5; });
  Listener listener;
  ReadyEvent event;
  for (Listener* added : {&thrower, &strangeThrower, &listener}) event.AddListener(*added, false);
  event.Fire(1);
  Host::WaitUntilDelivered();
  Host::SetLogSink(nullptr, nullptr);
  EXPECT_THAT(listener.heard, ElementsAre(1));
  EXPECT_THAT(lines, ElementsAre("[E_SYSTEM] A listener let an exception out: no cake",
                                 "[E_SYSTEM] A listener let an exception out."));
}

TEST_F(Delivery, IsNotWaitedForInsideAListener) {
  ReadyEvent event;
  int argumentsLeft = 0;
  Listener listener([&](int) {
    Host::WaitUntilDelivered();
    argumentsLeft = livingArguments;
  });
  event.AddListener(listener, false);
  event.Fire(1);
  Host::WaitUntilDelivered();
  EXPECT_EQ(argumentsLeft, 1);
  EXPECT_EQ(livingArguments, 0);
}

TEST_F(ListenersInsideACall, ChangeWhoHearsTheSameEventAndTheNext) {
  ReadyEvent event;
  Listener self, removed, added, last;
  self.onNumber = [&](int) {
    EXPECT_EQ(event.RemoveListener(self), E_SUCCESS);
    EXPECT_EQ(event.RemoveListener(removed), E_SUCCESS);
    EXPECT_EQ(event.AddListener(added, false), E_SUCCESS);
  };
  last.onNumber = [&](int value) {
    // A listener that replaces itself hears an event once all the same.
    EXPECT_EQ(event.RemoveListener(last), E_SUCCESS);
    EXPECT_EQ(event.AddListener(last, false), E_SUCCESS);
    if (value == 1) event.Fire(2);
  };
  for (Listener* listener : {&self, &removed, &last}) event.AddListener(*listener, false);
  event.Fire(1);
  while (livingArguments > 0) Host::WaitUntilDelivered();
  EXPECT_THAT(self.heard, ElementsAre(1));
  EXPECT_THAT(removed.heard, IsEmpty());
  EXPECT_THAT(added.heard, ElementsAre(2));
  EXPECT_THAT(last.heard, ElementsAre(1, 2));
}

TEST_F(RemovingAListener, WaitsForItsCallAlsoWhenThatRemovedIt) {
  for (const bool once : {false, true}) {
    SCOPED_TRACE(once);
    Gate gate;
    bool finished = false;  // plain, so that a race shows
    ReadyEvent event;
    Listener listener([&](int) {
      gate.Pass();
      Linger();
      finished = true;
    });
    event.AddListener(listener, once);
    event.Fire(1);
    event.Fire(2);
    gate.AwaitVisitor();
    std::thread opener([&] { gate.Open(); });
    EXPECT_EQ(event.RemoveListener(listener), once ? E_OBJ_NOT_FOUND : E_SUCCESS);
    EXPECT_TRUE(finished);
    opener.join();
    Host::WaitUntilDelivered();
    EXPECT_THAT(listener.heard, ElementsAre(1));
  }
}

TEST_F(RemovingAListener, DoesNotWaitForTheCallsOfOthers) {
  Gate gate;
  ReadyEvent event, sameListenersEvent;
  Listener busy([&](int) { gate.Pass(); }), next;
  for (Listener* listener : {&busy, &next}) event.AddListener(*listener, false);
  sameListenersEvent.AddListener(busy, false);
  event.Fire(1);
  gate.AwaitVisitor();
  EXPECT_EQ(event.RemoveListener(next), E_SUCCESS);
  EXPECT_EQ(sameListenersEvent.RemoveListener(busy), E_SUCCESS);
  gate.Open();
  Host::WaitUntilDelivered();
  EXPECT_THAT(next.heard, IsEmpty());
}

TEST_F(RemovingAListener, WhileEventsPourInEndsItsCalls) {
  ReadyEvent event;
  std::vector<Listener> others(20);
  for (Listener& other : others) event.AddListener(other, false);
  std::atomic<bool> over{false};
  std::thread source([&] {
    while (!over) {
      event.Fire(1);
      Host::WaitUntilDelivered();
    }
  });
  for (int i = 0; i < 500; ++i) {
    Listener passing;  // destroyed as soon as it is removed
    EXPECT_EQ(event.AddListener(passing, i % 2 == 0), E_SUCCESS);
    event.Fire(2);
    event.RemoveListener(passing);
  }
  over = true;
  source.join();
  Host::WaitUntilDelivered();
  for (const Listener& other : others) EXPECT_EQ(other.heard, others[0].heard);
}

TEST_F(DestroyingAnEvent, FreesWhatIsQueuedForItAndNothingElse) {
  Listener listener, bystander;
  ReadyEvent other;
  other.AddListener(bystander, false);
  auto event = std::make_unique<ReadyEvent>();
  event->AddListener(listener, false);
  BusyDispatcher busy;
  for (const int value : {1, 2}) {
    event->Fire(value);
    other.Fire(value);
  }
  event.reset();
  EXPECT_EQ(livingArguments, 1 + 2);
  busy.Release();
  EXPECT_THAT(listener.heard, IsEmpty());
  EXPECT_THAT(bystander.heard, ElementsAre(1, 2));
}

TEST_F(DestroyingAnEvent, WaitsForTheCallThatRunsAndForItsArgumentAndEndsThere) {
  Gate gate;
  bool finished = false;
  auto event = std::make_unique<ReadyEvent>();
  Listener listener([&](int) {
    gate.Pass();
    Linger();
    finished = true;
  });
  Listener next;
  event->AddListener(listener, false);
  event->AddListener(next, false);
  event->Fire(1);
  event->Fire(2);
  gate.AwaitVisitor();
  std::thread opener([&] { gate.Open(); });
  event.reset();
  EXPECT_TRUE(finished);
  EXPECT_EQ(livingArguments, 0);
  opener.join();
  EXPECT_THAT(listener.heard, ElementsAre(1));
}

TEST_F(DestroyingAnEvent, InsideACallOfItIsSafeAndTheOthersHearNothingMore) {
  auto event = std::make_unique<ReadyEvent>();
  Listener destroyer([&](int) { event.reset(); }), next;
  event->AddListener(destroyer, false);
  event->AddListener(next, false);
  {
    BusyDispatcher busy;
    event->Fire(1);
    event->Fire(2);
  }
  Host::WaitUntilDelivered();
  EXPECT_EQ(event, nullptr);
  EXPECT_THAT(destroyer.heard, ElementsAre(1));
  EXPECT_THAT(next.heard, IsEmpty());
}

TEST_F(DestroyingAnEvent, WhileItsEventsAreDeliveredIsSafe) {
  Listener listener([](int) {});
  for (int i = 0; i < 500; ++i) {
    ReadyEvent event;
    event.AddListener(listener, false);
    for (int n = 0; n < 5; ++n) event.Fire(n);
    if (i % 2 == 0) std::this_thread::yield();
  }
  EXPECT_EQ(livingArguments, 0);
}

// How the process ends is what is tested here, in a child each.

/// Stands for a library that makes its event in an object of its own, and deletes that by a handler
/// registered after `Initialize`.
struct Service {
  Listener listener;  // outlives the event
  ReadyEvent event;
};
Service* service = nullptr;

void StartService(std::function<void(int)> onNumber) {
  service = new Service;
  service->listener.onNumber = std::move(onNumber);
  service->event.AddListener(service->listener, false);
  std::atexit([] { delete service; });
}

void ExitWithEventsInFlight() {
  StartService([](int) {});
  for (int i = 0; i < 1000; ++i) service->event.Fire(i);
  std::exit(0);
}

void ExitWithAnEventThatIsNeverDestroyed() {
  NumberEvent& event = *new ReadyEvent;
  event.AddListener(*new Listener, false);
  for (int i = 0; i < 1000; ++i) event.Fire(i);
  std::exit(0);
}

void ExitWithAnEventThatOutlivesTheDispatcher() {
  static NumberEvent event;
  static Listener listener;
  std::atexit([] {
    Host::WaitUntilDelivered();
    if (event.Fire(1) != E_SYSTEM || event.RemoveListener(listener) != E_SUCCESS) _exit(1);
  });
  event.Initialize();
  event.AddListener(listener, false);
  for (int i = 0; i < 1000; ++i) event.Fire(i);
  std::exit(0);
}

void ExitInsideAListener() {
  static auto& fired = *new std::promise<void>;  // outlives the thread that sets it
  StartService([](int) {
    fired.get_future().wait();
    std::exit(0);
  });
  for (int i = 0; i < 10; ++i) service->event.Fire(i);
  fired.set_value();
  for (;;) pause();
}

void ExitWhileAnotherThreadFires() {
  static ReadyEvent& event = *new ReadyEvent;
  event.AddListener(*new Listener, false);
  static auto& fired = *new std::promise<void>;  // outlives the thread that sets it
  std::thread([] {
    event.Fire(0);
    fired.set_value();
    for (;;) event.Fire(1);
  }).detach();
  fired.get_future().wait();
  std::exit(0);
}

void TryToInitializeWithoutAndWithThreads() {
  pthread_attr_t normal, huge;
  pthread_getattr_default_np(&normal);
  pthread_getattr_default_np(&huge);
  pthread_attr_setstacksize(&huge, std::numeric_limits<std::size_t>::max() / 8 * 7);
  pthread_setattr_default_np(&huge);
  NumberEvent event;
  const result withoutThreads = event.Initialize();
  pthread_setattr_default_np(&normal);
  std::exit(withoutThreads == E_SYSTEM && event.Initialize() == E_SUCCESS ? 0 : 1);
}

TEST(ProcessDeathTest, EndsCleanlyWhateverTheEventsAreDoing) {
  constexpr struct {
    const char* name;
    void (*run)();
  } kCases[] = {
      {"events in flight", ExitWithEventsInFlight},
      {"an event that is never destroyed", ExitWithAnEventThatIsNeverDestroyed},
      {"an event that outlives the dispatcher", ExitWithAnEventThatOutlivesTheDispatcher},
      {"inside a listener", ExitInsideAListener},
      {"while another thread fires", ExitWhileAnotherThreadFires},
      {"without threads", TryToInitializeWithoutAndWithThreads},
  };
  for (const auto& test : kCases) {
    SCOPED_TRACE(test.name);
    const auto run = [&] {
      alarm(120);  // a process that hangs is a failure, not a wait
      test.run();
    };
    EXPECT_EXIT(run(), testing::ExitedWithCode(0), "");
  }
}

}  // namespace
