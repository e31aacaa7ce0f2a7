// Memory that is short at any place of any public operation, in processes of their own: no exception,
// nothing leaked, a listed result, and the next attempt succeeds.

#include "support/Allocations.h"
#include "support/Operations.h"
#include "support/OwnProcess.h"

#include <sys/mman.h>

namespace Zelkora::Media {
namespace {

/// \return the result that an operation lists for short memory besides `E_OUT_OF_MEMORY`
result OtherResult(const std::string& name) {
  if (name.find("GetInstance") != name.npos) return E_SYSTEM;
  if (name == "AudioEffector::Construct") return E_UNSUPPORTED_OPERATION;  // an empty list
  return name == "AudioEffector::ResetAllToDefault" ? E_INVALID_ARG : E_OUT_OF_MEMORY;
}

constexpr int kNoneFailed = 3;

/// What a device may keep of its own, such as room in its queues; less than as many failures leak.
constexpr int kKeptByTheDevice = 8, kAttempts = 3 * kKeptByTheDevice;

/// Lets an operation fail where memory is short, and tries again.
/// \param spared how many allocations succeed before
/// \param times how many fail then
/// \param kept receives what the operation leaves behind when it doesn't come to a failure
/// \return whether it came to one
bool Try(const std::string& name, std::ptrdiff_t spared, std::ptrdiff_t times,
         std::ptrdiff_t& kept) noexcept {
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
  if (!hasFailed) kept = grown();
  EXPECT_LE(grown(), kept + kKeptByTheDevice);
  return hasFailed;
}

TEST(FailingMemory, IsAListedResultOfEachOperationLeaksNothingAndEndsWithTheShortage) {
  std::string failures;
  int sites = 0;
  void* shared = mmap(nullptr, sizeof(std::ptrdiff_t), PROT_READ | PROT_WRITE,
                      MAP_SHARED | MAP_ANONYMOUS, -1, 0);
  auto& kept = *static_cast<std::ptrdiff_t*>(shared);
  for (const auto& [name, operation] : kOperations) {
    (void)operation;
    const auto tried = [&, &named = name](std::ptrdiff_t spared, std::ptrdiff_t times) {
      return StatusOfOwnProcess([&] {
        const bool hasFailed = Try(named, spared, times, kept);
        if (!HasFailure() && !hasFailed) std::exit(kNoneFailed);
      });
    };
    EXPECT_EQ(tried(FailingAllocation::kForEver, 1), kNoneFailed);
    for (const std::ptrdiff_t times : {std::ptrdiff_t{1}, FailingAllocation::kForEver}) {
      int spared = 0, status = 0;
      while ((status = tried(spared, times)) == 0) ++spared;
      sites += spared;
      if (status == kNoneFailed) continue;
      failures += name + " without allocation " + std::to_string(spared + 1) +
                  (times == 1 ? " alone\n" : " and all that follow\n");
    }
  }
  munmap(shared, sizeof(std::ptrdiff_t));
  EXPECT_EQ(failures, "");
  EXPECT_GT(sites, 40);
  std::printf("%d sites\n", sites);
}

}  // namespace
}  // namespace Zelkora::Media
