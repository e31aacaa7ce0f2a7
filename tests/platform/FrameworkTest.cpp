// What the library relies on in the application framework: results, log, assertions, capabilities.

#include <Host/Calls.h>
#include <Host/Log.h>
#include <Tizen/Base/Log.h>
#include <Tizen/Base/Result.h>
#include <Tizen/Base/String.h>
#include <Tizen/System/SystemInfo.h>

#include <gtest/gtest.h>

#include <string>
#include <thread>

namespace {

std::string Logged(void (*log)()) {
  testing::internal::CaptureStderr();
  log();
  return testing::internal::GetCapturedStderr();
}

TEST(LastResult, IsEachThreadsOwnAndRecordedByTheFailuresOfThePlatformFamilyOnly) {
  SetLastResult(E_SYSTEM);
  std::thread([] { EXPECT_EQ(GetLastResult(), E_SUCCESS); }).join();
  Logged([] { SysLogInternal(80, "", 1, "b"); });
  Logged([] { AppLogExceptionTagInternal("T", "f", 1, "c"); });
  EXPECT_EQ(GetLastResult(), E_SYSTEM);
  Logged([] { SysLogExceptionInternal(80, E_INVALID_ARG, "", 1, "d"); });
  EXPECT_EQ(GetLastResult(), E_INVALID_ARG);
  Logged([] { SysTryReturnResultInternal(80, E_INVALID_STATE, "", 1, "a"); });
  EXPECT_EQ(GetLastResult(), E_INVALID_STATE);
}

TEST(LogLine, TellsLevelFamilyResultFunctionLineAndMessageUnlessThatIsTooLong) {
  EXPECT_EQ(Logged([] { SysLogExceptionInternal(80, E_SYSTEM, "", 7, "[%s] %d", "x", 5); }),
            "zelkora error module=80 result=E_SYSTEM line=7: [x] 5\n");
  EXPECT_EQ(Logged([] { SysLogExceptionInternal(80, 0xA0ABCDEF, "", 7, "x"); }),
            "zelkora error module=80 result=result 0xA0ABCDEF line=7: x\n");
  EXPECT_EQ(Logged([] { AppLogExceptionTagInternal("TAG", "int f(int)", 9, "m"); }),
            "zelkora error tag=TAG function=\"int f(int)\" line=9: m\n");
  EXPECT_EQ(Logged([] { SysLogInternal(80, "", 1, "%s", std::string(100000, 'x').c_str()); }),
            "zelkora info module=80 line=1: " + std::string(1023, 'x') + "\n");
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

result Lookup(const wchar_t* key, bool& value) {
  return Tizen::System::SystemInfo::GetValue(Tizen::Base::String(key), value);
}

TEST(Features, OfAnyHostAreFoundAndUnknownKeysLeaveTheValue) {
  bool value = false;
  EXPECT_EQ(Lookup(L"http://any.host/tizen/feature/audio_manager", value), E_SUCCESS);
  EXPECT_TRUE(value);
  for (const wchar_t* key :
       {L"", L"http://", L"http://host", L"http://host/tizen/feature/",
        L"http://host/tizen/feature/audio_managers", L"http://host/tizen/feature/audio_manage",
        L"http://host/tizen/privilege/audio_manager", L"/tizen/feature/audio_manager"}) {
    EXPECT_EQ(Lookup(key, value), E_OBJ_NOT_FOUND);
    EXPECT_TRUE(value);
  }
}

TEST(FailingCalls, HitTheCallsAskedForAndNoOthers) {
  const auto expect = [](const std::vector<result>& expected) {
    bool value = false;
    for (const result r : expected)
      EXPECT_EQ(Lookup(L"http://h/tizen/feature/audio_manager", value), r);
  };
  Host::FailCall("SystemInfo::GetValue", E_SYSTEM, 2);
  Host::FailCall("another", E_INVALID_ARG);
  expect({E_SUCCESS, E_SYSTEM, E_SUCCESS});
  Host::FailCall("SystemInfo::GetValue", E_INVALID_STATE);
  expect({E_INVALID_STATE, E_INVALID_STATE});
  Host::ClearFailures();
  expect({E_SUCCESS});
}

}  // namespace
