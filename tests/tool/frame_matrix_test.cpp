#include "tool/frame_matrix.h"

#include <gtest/gtest.h>

#include <cmath>

namespace pc {
namespace {

TEST(FrameMatrix, IdentityTestIsRelativeOnTheDiagonalAndAbsoluteOffIt) {
  Matrix4 m = identityMatrix();
  EXPECT_TRUE(isIdentity(m));
  m[5] = 1.0000001;
  EXPECT_TRUE(isIdentity(m));
  m[5] = 1.000002;
  EXPECT_FALSE(isIdentity(m));
  m = identityMatrix();
  m[1] = 0.0000005;  // below 1e-6: counts as 0
  EXPECT_TRUE(isIdentity(m));
  m[1] = 0.000002;
  EXPECT_FALSE(isIdentity(m));
  m = identityMatrix();
  m[10] = 5e-7;  // a diagonal element that small is no 1
  EXPECT_FALSE(isIdentity(m));
  m = identityMatrix();
  m[15] = std::nan("");
  EXPECT_FALSE(isIdentity(m));
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

TEST(FrameMatrix, ProductsAreRowByColumn) {
  const Matrix4 a = {1, 2, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1};
  const Matrix4 b = {1, 0, 0, 0, 3, 1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1};
  const Matrix4 p = multiply(a, b);
  EXPECT_EQ(p[0], 7.0);  // 1*1 + 2*3
  EXPECT_EQ(p[1], 2.0);
  EXPECT_EQ(p[4], 3.0);
  EXPECT_EQ(multiply(scaleMatrix(2.0), identityMatrix())[10], 2.0);
  EXPECT_EQ(scaleMatrix(2.0)[15], 1.0);
}

}  // namespace
}  // namespace pc
