/// \file
/// What the host platform answers to questions for features and privileges.
///
/// At start every feature is present and every privilege is granted. May be called on any thread.
#pragma once

#include <Tizen/Base/Result.h>

#include <string_view>

/// What a program may ask and tell the application framework, on any device.
namespace Host {

/// The features known to the platform, by the last element of their keys' paths.
inline constexpr std::string_view kFeatures[] = {"audio_effector", "audio_manager",
                                                 "zelkora_extension_2.2"};

/// The privileges known to the platform, by the last element of their keys' paths.
inline constexpr std::string_view kPrivileges[] = {
    "audiomanager.session", "audiomanager.voipsession", "audiomanager.volume"};

/// Answer to the lookup of a feature that the device doesn't offer; with `E_SUCCESS` it does, and
/// with any other code the lookup fails.
inline constexpr result kFeatureAbsent = 1;

/// Sets what the lookup of a feature answers: `E_SUCCESS`, `kFeatureAbsent`, `E_OBJ_NOT_FOUND` for
/// a feature that isn't known, or any other code.
/// \return false, with nothing done, for a name not in `kFeatures`
bool SetFeature(std::string_view name, result answer) noexcept;

/// Sets what the check of a privilege answers; `E_SUCCESS` grants it.
/// \return false, with nothing done, for a name not in `kPrivileges`
bool SetPrivilege(std::string_view name, result answer) noexcept;

/// Makes every feature present and grants every privilege.
void ResetCapabilities() noexcept;

}  // namespace Host
