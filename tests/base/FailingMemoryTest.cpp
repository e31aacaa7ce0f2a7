// Memory that is short at any place of any public operation, in processes of their own: no
// exception, nothing leaked, a listed result, and the next attempt succeeds.

#include "support/Allocations.h"
#include "support/Operations.h"
#include "support/OwnProcess.h"

namespace {

using namespace Zelkora::Media;

/// \return the result that an operation lists for short memory besides `E_OUT_OF_MEMORY`
result OtherResult(const std::string& name) {
  if (name.find("GetInstance") != name.npos) return E_SYSTEM;
  if (name == "AudioEffector::Construct") return E_UNSUPPORTED_OPERATION;  // an empty list
  return name == "AudioEffector::ResetAllToDefault" ? E_INVALID_ARG : E_OUT_OF_MEMORY;
}

/// The exit status of an operation that came to no failure; what it left behind is added.
constexpr int kNoneFailed = 100;

/// What a device may keep of its own, such as room in its queues; less than as many failures leak.
constexpr int kKeptByTheDevice = 8, kAttempts = 3 * kKeptByTheDevice;

/// Lets an operation fail where memory is short, and tries again.
/// \param spared how many allocations succeed before
/// \param times how many fail then
/// \param kept what the operation leaves behind when it doesn't come to a failure
/// \return 0, or `kNoneFailed` and what it has left behind when it didn't come to one
int Try(const std::string& name, std::ptrdiff_t spared, std::ptrdiff_t times, int kept) noexcept {
  Host::SetLogSink([](const Host::LogRecord&, void*) {}, nullptr);
  const std::string operation = name.substr(name.find("::") + 2);
  const bool isRepeated = operation != "GetInstance";
  const auto perform = [call = kOperations.at(name)] {
    SetLastResult(E_SUCCESS);
    return call().Result();
  };
  Prepare(operation);
  if (isRepeated) MakeReady(operation);
  Host::WaitUntilDelivered();
  const std::ptrdiff_t before = CountLiveAllocations();
  const auto grown = [&] { return CountLiveAllocations() - before; };
  bool hasFailed = false;
  result r = E_OUT_OF_MEMORY;
  for (int i = 0; i < (isRepeated ? kAttempts : 1) && r != E_SUCCESS; ++i) {
    FailingAllocation failing(spared, FailingAllocation::kAnyones, times);
    r = perform();
    hasFailed = failing.HasFailed();
    EXPECT_TRUE(r == E_SUCCESS || r == E_OUT_OF_MEMORY || r == OtherResult(name))
        << GetErrorMessage(r);
  }
  if (r != E_SUCCESS) {
    // A manager, its implementation and its event leave nothing; a device that has started does.
    EXPECT_TRUE(isRepeated || spared >= 3 || grown() == 0) << grown();
    // A manager isn't created again: the last result is that of no attempt then.
    EXPECT_EQ(perform(), E_SUCCESS);
  }
  Host::WaitUntilDelivered();
  EXPECT_LE(grown(), kept + kKeptByTheDevice);
  return hasFailed ? 0 : kNoneFailed + static_cast<int>(grown());
}

TEST(FailingMemory, IsAListedResultOfEachOperationLeaksNothingAndEndsWithTheShortage) {
  std::string failures;
  int sites = 0;
  for (const auto& [name, operation] : kOperations) {
    (void)operation;
    const auto tried = [&named = name](std::ptrdiff_t spared, std::ptrdiff_t times, int kept) {
      return StatusOfOwnProcess([&] {
        const int status = Try(named, spared, times, kept);
        if (!HasFailure() && status != 0) std::exit(status);
      });
    };
    const int kept = tried(FailingAllocation::kForEver, 1, kNoneFailed) - kNoneFailed;
    EXPECT_LT(std::abs(kept), kNoneFailed / 2) << name;
    for (const std::ptrdiff_t times : {std::ptrdiff_t{1}, FailingAllocation::kForEver}) {
      int spared = 0, status = 0;
      while ((status = tried(spared, times, kept)) == 0) ++spared;
      sites += spared;
      if (status > kNoneFailed / 2) continue;
      failures += name + " without allocation " + std::to_string(spared + 1) +
                  (times == 1 ? " alone\n" : " and all that follow\n");
    }
  }
  EXPECT_EQ(failures, "");
  EXPECT_GT(sites, 40);
}

}  // namespace
