#include "support/Managers.h"

namespace Zelkora::Media {
namespace {

template <typename Manager>
class Gates : public ManagerTest<Manager> {
 protected:
  const std::string privilegeQuery = PrivilegeQuery<Manager>();
  const std::string denied = SysNamed(
      E_PRIVILEGE_DENIED, " This application does not have the privilege to call this method.");
};
TYPED_TEST_SUITE(Gates, Managers, ManagerNames);

/// Whatever else than `E_SUCCESS` the platform answers is a denial.
constexpr result kDenials[] = {E_PRIVILEGE_DENIED, E_SYSTEM, E_OBJ_NOT_FOUND, 1};

TYPED_TEST(Gates, OperationNeedsItsOwnPrivilegeAndReachesNothingBehindWithoutIt) {
  Host::SetFeature("audio_manager", Host::kFeatureAbsent);  // asked for by GetInstance only
  for (const auto privilege : Host::kPrivileges) Host::SetPrivilege(privilege, E_SYSTEM);
  for (const auto& operation : Facts<TypeParam>::Operations()) {
    SCOPED_TRACE(operation.name);
    for (const result denial : kDenials) {
      Host::SetPrivilege(Facts<TypeParam>::kPrivilege, denial);
      EXPECT_EQ(operation.call(this->manager), operation.Refused(E_PRIVILEGE_DENIED));
      this->ExpectLeft(E_PRIVILEGE_DENIED, {this->denied}, {this->privilegeQuery});
    }
    Host::SetPrivilege(Facts<TypeParam>::kPrivilege, E_SUCCESS);
    const std::int64_t answer = operation.call(this->manager);
    EXPECT_TRUE(operation.givesValue ? answer > 0 : answer == E_SUCCESS) << answer;
    const std::string& call = operation.platformCall;
    this->ExpectLeftBehindGate(kUntouched, {}, call.empty() ? Lines{} : Lines{call});
  }
}

TYPED_TEST(Gates, InstanceIsTheSameAtEveryCallAndWithheldWhileAGateIsShut) {
  const Lines bothQueries = {this->privilegeQuery, kFeatureQuery};
  const auto expectNone = [&](result expected, const std::string& line, const Lines& calls) {
    EXPECT_EQ(TypeParam::GetInstance(), nullptr);
    this->ExpectLeft(expected, {line}, calls);
  };
  Host::SetFeature("audio_manager", E_SYSTEM);
  Host::SetPrivilege(Facts<TypeParam>::kPrivilege, E_OBJ_NOT_FOUND);
  expectNone(E_PRIVILEGE_DENIED, this->denied, {this->privilegeQuery});
  Host::ResetCapabilities();

  const std::string name = "Zelkora::Media::" + std::string(Facts<TypeParam>::kName);
  const std::string signature = "static " + name + "* " + name + "::GetInstance()";
  for (const auto& [answer, expected] : kFeatureRefusals) {
    Host::SetFeature("audio_manager", answer);
    expectNone(expected, App(signature, Named(expected, " Propagating.")), bothQueries);
  }
  Host::ResetCapabilities();
  Host::FailCall("SystemInfo::GetValue", 0, 1);  // succeeds without an answer
  const result unsupported = E_UNSUPPORTED_OPERATION;
  expectNone(unsupported, App(signature, Named(unsupported, " Propagating.")), bothQueries);

  EXPECT_EQ(TypeParam::GetInstance(), &this->manager);
  this->ExpectLeft(E_SUCCESS, {}, bothQueries);
}

}  // namespace
}  // namespace Zelkora::Media
