// What the library relies on in the application framework: results, log, assertions, capabilities.

#include "support/OwnProcess.h"

#include <Host/Calls.h>
#include <Host/Log.h>
#include <Tizen/Base/Log.h>
#include <Tizen/Base/Result.h>
#include <Tizen/Base/String.h>
#include <Tizen/System/SystemInfo.h>

#include <gtest/gtest.h>

#include <cstdlib>
#include <string>
#include <thread>

namespace {

std::string Logged(void (*log)()) {
  testing::internal::CaptureStderr();
  log();
  return testing::internal::GetCapturedStderr();
}

TEST(LogLine, TellsAllThereIsAndThePlatformFamilysFailureAloneIsTheThreadsLastResult) {
  SetLastResult(E_SYSTEM);
  std::thread([] { EXPECT_EQ(GetLastResult(), E_SUCCESS); }).join();
  EXPECT_EQ(Logged([] { SysLogInternal(80, "", 1, "%s", std::string(100000, 'x').c_str()); }),
            "zelkora info module=80 line=1: " + std::string(1023, 'x') + "\n");
  EXPECT_EQ(Logged([] { AppLogExceptionTagInternal("TAG", "int f(int)", 9, "m"); }),
            "zelkora error tag=TAG function=\"int f(int)\" line=9: m\n");
  EXPECT_EQ(GetLastResult(), E_SYSTEM);
  EXPECT_EQ(Logged([] { SysLogExceptionInternal(80, 0xA0ABCDEF, "", 7, "[%s] %d", "x", 5); }),
            "zelkora error module=80 result=result 0xA0ABCDEF line=7: [x] 5\n");
  EXPECT_EQ(GetLastResult(), 0xA0ABCDEF);
  Logged([] { SysTryReturnResultInternal(80, E_INVALID_STATE, "", 1, "a"); });
  EXPECT_EQ(GetLastResult(), E_INVALID_STATE);
}

TEST(LogReason, IsWrittenOnRequestOnlyAndTheLastResultStays) {
  const auto log = [] { Host::LogReason(60, E_INVALID_ARG, 3, "because of %s", "it"); };
  InOwnProcess([=] {
    setenv("ZELKORA_LOG", "debug", 1);
    EXPECT_EQ(Logged(log), "zelkora debug module=60 result=E_INVALID_ARG line=3: because of it\n");
  });
  SetLastResult(E_SYSTEM);
  EXPECT_EQ(Logged(log), "");
  EXPECT_EQ(GetLastResult(), E_SYSTEM);
}

TEST(LogSink, TakesTheLinesUntilItIsRemovedAndMayLogItself) {
  Host::SetLogSink([](const Host::LogRecord& record,
                      void*) { SysLogInternal(80, "", 2, "from the sink: %s", record.message); },
                   nullptr);
  EXPECT_EQ(Logged([] { SysLogInternal(80, "", 1, "a"); }),
            "zelkora info module=80 line=2: from the sink: a\n");
  Host::SetLogSink(nullptr, nullptr);
  EXPECT_EQ(Logged([] { SysLogInternal(80, "", 1, "b"); }), "zelkora info module=80 line=1: b\n");
}

TEST(Features, OfAnyHostAreFoundAndUnknownOrFailingOnesLeaveTheValue) {
  bool value = false;
  const auto lookup = [&](const wchar_t* key) {
    return Tizen::System::SystemInfo::GetValue(Tizen::Base::String(key), value);
  };
  constexpr wchar_t kKnown[] = L"http://any.host/tizen/feature/audio_manager";
  Host::FailCall("SystemInfo::GetValue", E_SYSTEM, 2);
  Host::FailCall("another", E_INVALID_ARG);
  EXPECT_EQ(lookup(kKnown), E_SUCCESS);
  for (const result expected : {E_SYSTEM, E_SUCCESS}) EXPECT_EQ(lookup(kKnown), expected);
  EXPECT_TRUE(value);
  for (const wchar_t* key :
       {L"", L"http://", L"http://host", L"http://host/tizen/feature/audio_managers",
        L"http://host/tizen/feature/audio_manage", L"http://host/tizen/privilege/audio_manager"}) {
    EXPECT_EQ(lookup(key), E_OBJ_NOT_FOUND);
    EXPECT_TRUE(value);
  }
  Host::FailCall("SystemInfo::GetValue", E_INVALID_STATE);
  for (int n = 0; n < 2; ++n) EXPECT_EQ(lookup(kKnown), E_INVALID_STATE);
  Host::ClearFailures();
  EXPECT_EQ(lookup(kKnown), E_SUCCESS);
}

}  // namespace
