// 4 x 4 matrices of the coordinate frames: products, the identity test and
// the adjugate inverse.
#pragma once

#include <array>

namespace pc {

// Row-major: element [r][c] at index 4r + c.
using Matrix4 = std::array<double, 16>;

Matrix4 identityMatrix();
// diag(s, s, s, 1).
Matrix4 scaleMatrix(double s);
// Ordinary row-by-column product a * b.
Matrix4 multiply(const Matrix4& a, const Matrix4& b);

// Every element matches the identity's: an element below 1e-6 in magnitude
// only where the identity holds 0, any other one within 1e-6 of its own
// magnitude. NaN matches nothing.
bool isIdentity(const Matrix4& m);

// The adjugate (transposed cofactors), every element divided by the
// adjugate's own [3][3]. When that element is 0 the result is non-finite;
// the division is avoided so that no floating-point trap can fire.
Matrix4 adjugateInverse(const Matrix4& m);

}  // namespace pc
