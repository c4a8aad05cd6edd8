#include "tool/frame_matrix.h"

#include <gtest/gtest.h>

#include <cmath>

namespace pc {
namespace {

TEST(FrameMatrix, IdentityTestIsRelativeOnTheDiagonalAndAbsoluteOffIt) {
  EXPECT_TRUE(isIdentity(identityMatrix()));
  const auto with = [](std::size_t i, double x) {
    Matrix4 m = identityMatrix();
    m[i] = x;
    return isIdentity(m);
  };
  EXPECT_TRUE(with(5, 1.0000001));
  EXPECT_FALSE(with(5, 1.000002));
  EXPECT_TRUE(with(1, 0.0000005));  // below 1e-6: counts as 0
  EXPECT_FALSE(with(1, 0.000002));
  EXPECT_FALSE(with(10, 5e-7));  // a diagonal element that small is no 1
  EXPECT_FALSE(with(15, std::nan("")));
}

TEST(FrameMatrix, AdjugateInverseIsNormalisedOnItsLastElement) {
  // A rotation about z by 90 degrees with a translation, scaled by 2.
  const Matrix4 m = {0, -2, 0, 5, 2, 0, 0, 6, 0, 0, 2, 7, 0, 0, 0, 1};
  const Matrix4 inv = adjugateInverse(m);
  EXPECT_EQ(inv[15], 1.0);
  EXPECT_TRUE(isIdentity(multiply(m, inv)));
  EXPECT_TRUE(isIdentity(multiply(inv, m)));
  EXPECT_DOUBLE_EQ(inv[1], 0.5);
  EXPECT_DOUBLE_EQ(inv[3], -3.0);
}

TEST(FrameMatrix, SingularLastAdjugateElementGivesNonFiniteInverse) {
  // The upper 3 x 3 block is singular, so adjugate [3][3] is 0.
  const Matrix4 m = {1, 0, 0, 0, 0, 0, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1};
  const Matrix4 inv = adjugateInverse(m);
  bool nonFinite = false;
  for (double x : inv) nonFinite = nonFinite || !std::isfinite(x);
  EXPECT_TRUE(nonFinite);
}

}  // namespace
}  // namespace pc
