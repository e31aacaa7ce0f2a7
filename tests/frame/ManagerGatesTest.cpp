#include "support/LibraryTest.h"
#include "support/Managers.h"

#include <algorithm>

namespace {

using testing::ElementsAre;
using testing::IsEmpty;

template <typename Manager>
class Gates : public LibraryTest {
 protected:
  Gates() { EXPECT_NE(manager, nullptr); }

  /// A refused `GetInstance` gives null, whether there is an instance or not.
  void ExpectNoInstance(result expected, const std::string& line) {
    SetLastResult(E_INVALID_STATE);
    EXPECT_EQ(Manager::GetInstance(), nullptr);
    EXPECT_EQ(GetLastResult(), expected);
    EXPECT_THAT(this->log.Take(), ElementsAre(line));
  }

  Manager* const manager = Manager::GetInstance();
};
TYPED_TEST_SUITE(Gates, Managers, ManagerNames);

/// Whatever else than `E_SUCCESS` the platform answers is a denial.
constexpr result kDenials[] = {E_PRIVILEGE_DENIED, E_SYSTEM, E_OBJ_NOT_FOUND, 1};

TYPED_TEST(Gates, OperationWithoutPrivilegeIsRefusedAndReachesNothingBehind) {
  for (const auto& operation : Facts<TypeParam>::Operations()) {
    for (const result denial : kDenials) {
      SCOPED_TRACE(operation.name + ", " + GetErrorMessage(denial));
      Host::SetPrivilege(Facts<TypeParam>::kPrivilege, denial);
      ClearLastResult();
      Host::RecordCalls(true);
      EXPECT_EQ(operation.call(*this->manager), operation.Refused(E_PRIVILEGE_DENIED));
      EXPECT_EQ(GetLastResult(), E_PRIVILEGE_DENIED);
      EXPECT_THAT(Host::TakeCalls(), ElementsAre(PrivilegeQuery<TypeParam>()));
      EXPECT_THAT(this->log.Take(), ElementsAre(Sys(E_PRIVILEGE_DENIED, kDenied)));
    }
  }
}

/// \return the calls but those by which the device's thread passes a change on
std::vector<std::string> TakeCallsOfThisThread() {
  Simulated::WaitUntilDelivered();
  std::vector<std::string> calls = Host::TakeCalls();
  calls.erase(std::remove(calls.begin(), calls.end(), "_Event::FireAsync()"), calls.end());
  return calls;
}

TYPED_TEST(Gates, OperationWithItsOwnPrivilegeAloneSucceedsAndLeavesTheLastResult) {
  Host::SetFeature("audio_manager", Host::kFeatureAbsent);  // asked for by GetInstance only
  for (const auto privilege : Host::kPrivileges) Host::SetPrivilege(privilege, E_SYSTEM);
  Host::SetPrivilege(Facts<TypeParam>::kPrivilege, E_SUCCESS);
  for (const auto& operation : Facts<TypeParam>::Operations()) {
    SCOPED_TRACE(operation.name);
    SetLastResult(E_INVALID_STATE);
    Host::RecordCalls(true);
    const std::int64_t answer = operation.call(*this->manager);
    EXPECT_TRUE(operation.givesValue ? answer > 0 : answer == E_SUCCESS) << answer;
    EXPECT_EQ(GetLastResult(), E_INVALID_STATE);
    std::vector<std::string> calls = {PrivilegeQuery<TypeParam>()};
    if (!operation.platformCall.empty()) calls.push_back(operation.platformCall);
    EXPECT_EQ(TakeCallsOfThisThread(), calls);
    EXPECT_THAT(this->log.Take(), IsEmpty());
  }
}

TYPED_TEST(Gates, InstanceIsTheSameAtEveryCallAndBothGatesAreAskedInOrder) {
  SetLastResult(E_SYSTEM);
  Host::RecordCalls(true);
  EXPECT_EQ(TypeParam::GetInstance(), this->manager);
  EXPECT_EQ(GetLastResult(), E_SUCCESS);
  EXPECT_THAT(Host::TakeCalls(), ElementsAre(PrivilegeQuery<TypeParam>(), kFeatureQuery));
  EXPECT_THAT(this->log.Take(), IsEmpty());
}

TYPED_TEST(Gates, InstanceIsWithheldWhileThePrivilegeIsGone) {
  for (const result denial : kDenials) {
    Host::SetPrivilege(Facts<TypeParam>::kPrivilege, denial);
    Host::SetFeature("audio_manager", E_SYSTEM);
    Host::RecordCalls(true);
    this->ExpectNoInstance(E_PRIVILEGE_DENIED, Sys(E_PRIVILEGE_DENIED, kDenied));
    EXPECT_THAT(Host::TakeCalls(), ElementsAre(PrivilegeQuery<TypeParam>()));
  }
  Host::ResetCapabilities();
  EXPECT_EQ(TypeParam::GetInstance(), this->manager);
}

TYPED_TEST(Gates, InstanceIsWithheldWhileTheFeatureIsGone) {
  const std::string name = "Zelkora::Media::" + std::string(Facts<TypeParam>::kName);
  const std::string signature = "static " + name + "* " + name + "::GetInstance()";
  const struct {
    result answer, expected;
  } rows[] = {
      {Host::kFeatureAbsent, E_UNSUPPORTED_OPERATION},
      {E_OBJ_NOT_FOUND, E_UNSUPPORTED_OPERATION},
      {E_SYSTEM, E_SYSTEM},
      {0xA0001234, 0xA0001234},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(GetErrorMessage(row.answer));
    Host::SetFeature("audio_manager", row.answer);
    Host::RecordCalls(true);
    this->ExpectNoInstance(row.expected, App(signature, Named(row.expected, " Propagating.")));
    EXPECT_THAT(Host::TakeCalls(), ElementsAre(PrivilegeQuery<TypeParam>(), kFeatureQuery));
  }
  Host::ResetCapabilities();
  Host::FailCall("SystemInfo::GetValue", 0, 1);  // succeeds without an answer
  this->ExpectNoInstance(E_UNSUPPORTED_OPERATION,
                         App(signature, "[E_UNSUPPORTED_OPERATION] Propagating."));
  EXPECT_EQ(TypeParam::GetInstance(), this->manager);
}

}  // namespace
