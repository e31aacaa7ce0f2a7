#include "frame/SoundManagerError.h"

#include <gtest/gtest.h>

#include <climits>

using Zelkora::Media::ConvertSoundManagerError;

TEST(SoundManagerError, KnownCodesHaveResultsAndAllOthersAreSystemErrors) {
  const struct {
    int error;
    result expected;
  } rows[] = {
      {0, E_SUCCESS}, {-12, E_OUT_OF_MEMORY}, {-22, E_INVALID_ARG}, {-38, E_INVALID_OPERATION},
      {-1, E_SYSTEM}, {5, E_SYSTEM},          {12, E_SYSTEM},       {INT_MIN, E_SYSTEM},
  };
  for (const auto& row : rows) {
    EXPECT_EQ(ConvertSoundManagerError(row.error), row.expected) << row.error;
  }
}
