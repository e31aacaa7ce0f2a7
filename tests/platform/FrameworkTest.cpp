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
  testing::internal::CaptureStderr();
  SysLogInternal(80, "", 1, "b");
  AppLogExceptionTagInternal("T", "f", 1, "c");
  EXPECT_EQ(GetLastResult(), E_SYSTEM);
  SysLogExceptionInternal(80, E_INVALID_ARG, "", 1, "d");
  EXPECT_EQ(GetLastResult(), E_INVALID_ARG);
  SysTryReturnResultInternal(80, E_INVALID_STATE, "", 1, "a");
  EXPECT_EQ(GetLastResult(), E_INVALID_STATE);
  testing::internal::GetCapturedStderr();
  ClearLastResult();
  EXPECT_EQ(GetLastResult(), E_SUCCESS);
}

TEST(ErrorMessage, NamesACodeOrShowsItsNumber) {
  EXPECT_STREQ(GetErrorMessage(E_UNSUPPORTED_OPERATION), "E_UNSUPPORTED_OPERATION");
  EXPECT_STREQ(GetErrorMessage(0xA0ABCDEF), "result 0xA0ABCDEF");
}

TEST(LogLine, TellsLevelFamilyResultFunctionLineAndMessage) {
  EXPECT_EQ(Logged([] { SysLogExceptionInternal(80, E_SYSTEM, "", 7, "[%s] %d", "x", 5); }),
            "zelkora error module=80 result=E_SYSTEM line=7: [x] 5\n");
  EXPECT_EQ(Logged([] { SysLogInternal(80, "", 8, "plain"); }),
            "zelkora info module=80 line=8: plain\n");
  EXPECT_EQ(Logged([] { AppLogExceptionTagInternal("TAG", "int f(int)", 9, "m"); }),
            "zelkora error tag=TAG function=\"int f(int)\" line=9: m\n");
}

TEST(LogLine, TooLongIsCutOffButNeverDropped) {
  const std::string line =
      Logged([] { SysLogInternal(80, "", 1, "%s", std::string(100000, 'x').c_str()); });
  EXPECT_EQ(line, "zelkora info module=80 line=1: " + std::string(1023, 'x') + "\n");
}

TEST(LogSink, TakesTheLinesUntilItIsRemovedAndMayLogItself) {
  static int received;
  received = 0;
  Host::SetLogSink(
      [](const Host::LogRecord& record, void*) {
        ++received;
        SysLogInternal(80, "", 2, "from the sink: %s", record.message);
      },
      nullptr);
  EXPECT_EQ(Logged([] { SysLogInternal(80, "", 1, "a"); }),
            "zelkora info module=80 line=2: from the sink: a\n");
  Host::SetLogSink(nullptr, nullptr);
  EXPECT_EQ(Logged([] { SysLogInternal(80, "", 1, "b"); }), "zelkora info module=80 line=1: b\n");
  EXPECT_EQ(received, 1);
}

TEST(Assertions, StopUnlessThePlatformWasBuiltWithoutThem) {
#ifdef NDEBUG
  EXPECT_EQ(Host::GetAssertionAction(), Host::AssertionAction::kReturn);
#else
  EXPECT_EQ(Host::GetAssertionAction(), Host::AssertionAction::kStop);
#endif
}

TEST(Features, UnknownKeysAndOtherUrisAreNotFoundAndLeaveTheValue) {
  using Tizen::Base::String;
  for (const wchar_t* key :
       {L"", L"http://", L"http://host", L"http://host/tizen/feature/",
        L"http://host/tizen/feature/audio_managers", L"http://host/tizen/feature/audio_manage",
        L"http://host/tizen/privilege/audio_manager", L"/tizen/feature/audio_manager"}) {
    bool value = true;
    EXPECT_EQ(Tizen::System::SystemInfo::GetValue(String(key), value), E_OBJ_NOT_FOUND);
    EXPECT_TRUE(value);
  }
  bool value = false;
  EXPECT_EQ(Tizen::System::SystemInfo::GetValue(
                String(L"http://any.host/tizen/feature/audio_manager"), value),
            E_SUCCESS);
  EXPECT_TRUE(value);
}

TEST(FailingCalls, HitTheCallsAskedForAndNoOthers) {
  const auto query = [] {
    bool value = false;
    return Tizen::System::SystemInfo::GetValue(
        Tizen::Base::String(L"http://h/tizen/feature/audio_manager"), value);
  };
  Host::FailCall("SystemInfo::GetValue", E_SYSTEM, 2);
  Host::FailCall("another", E_INVALID_ARG);
  EXPECT_EQ(query(), E_SUCCESS);
  EXPECT_EQ(query(), E_SYSTEM);
  EXPECT_EQ(query(), E_SUCCESS);
  Host::FailCall("SystemInfo::GetValue", E_INVALID_STATE);
  EXPECT_EQ(query(), E_INVALID_STATE);
  EXPECT_EQ(query(), E_INVALID_STATE);
  Host::ClearFailures();
  EXPECT_EQ(query(), E_SUCCESS);
}

}  // namespace
