// SPDX-License-Identifier: MIT
// The scope codes are part of the public interface of the number-and-indent command.
#include "transform/progmode.h"

#include <gtest/gtest.h>

namespace transform {
namespace {

TEST(ProgMode, ScopeCodesHaveTheirPublicValues) {
  EXPECT_EQ(int(PROG_PROJECT), 1);
  EXPECT_EQ(int(PROG_MODULE), 2);
  EXPECT_EQ(int(PROG_PROCEDURE), 3);
}

}  // namespace
}  // namespace transform
