#include "tool/frame_matrix.h"

#include <cmath>
#include <limits>

namespace pc {

namespace {

constexpr double kIdentityTolerance = 1e-6;

double at(const Matrix4& m, int r, int c) { return m[static_cast<std::size_t>(4 * r + c)]; }

// Determinant of the 3 x 3 minor of `m` without row `skipRow` and column
// `skipColumn`.
double minor3(const Matrix4& m, int skipRow, int skipColumn) {
  int rows[3];
  int cols[3];
  for (int i = 0, r = 0; i < 4; ++i)
    if (i != skipRow) rows[r++] = i;
  for (int i = 0, c = 0; i < 4; ++i)
    if (i != skipColumn) cols[c++] = i;
  const auto e = [&](int r, int c) { return at(m, rows[r], cols[c]); };
  return e(0, 0) * (e(1, 1) * e(2, 2) - e(1, 2) * e(2, 1)) - e(0, 1) * (e(1, 0) * e(2, 2) - e(1, 2) * e(2, 0)) +
         e(0, 2) * (e(1, 0) * e(2, 1) - e(1, 1) * e(2, 0));
}

}  // namespace

Matrix4 identityMatrix() {
  Matrix4 m{};
  for (int i = 0; i < 4; ++i) m[static_cast<std::size_t>(5 * i)] = 1.0;
  return m;
}

Matrix4 scaleMatrix(double s) {
  Matrix4 m = identityMatrix();
  for (int i = 0; i < 3; ++i) m[static_cast<std::size_t>(5 * i)] = s;
  return m;
}

Matrix4 multiply(const Matrix4& a, const Matrix4& b) {
  Matrix4 p{};
  for (int r = 0; r < 4; ++r)
    for (int c = 0; c < 4; ++c) {
      double sum = 0.0;
      for (int k = 0; k < 4; ++k) sum += at(a, r, k) * at(b, k, c);
      p[static_cast<std::size_t>(4 * r + c)] = sum;
    }
  return p;
}

bool isIdentity(const Matrix4& m) {
  for (int r = 0; r < 4; ++r)
    for (int c = 0; c < 4; ++c) {
      const double x = at(m, r, c);
      const double e = r == c ? 1.0 : 0.0;
      const bool matches =
          std::fabs(x) < kIdentityTolerance ? e == 0.0 : std::fabs(x - e) < kIdentityTolerance * std::fabs(x);
      if (!matches) return false;
    }
  return true;
}

Matrix4 adjugateInverse(const Matrix4& m) {
  Matrix4 adj{};
  for (int r = 0; r < 4; ++r)
    for (int c = 0; c < 4; ++c) {
      // adj[r][c] is the cofactor of m[c][r].
      const double sign = (r + c) % 2 == 0 ? 1.0 : -1.0;
      adj[static_cast<std::size_t>(4 * r + c)] = sign * minor3(m, c, r);
    }
  const double d = adj[15];
  if (d != 0.0) {
    for (double& x : adj) x /= d;
  } else {
    // x / ±0 without dividing: ±inf for x != 0, NaN for 0 (0 * inf).
    const double infinity = std::copysign(std::numeric_limits<double>::infinity(), d);
    for (double& x : adj) x *= infinity;
  }
  return adj;
}

}  // namespace pc
