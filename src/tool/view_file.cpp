#include "tool/view_file.h"

#include <cctype>
#include <cstdlib>
#include <vector>

namespace pc {

namespace {

constexpr int kViewLines = 9;  // title, 4 lines of the frame, 4 of its inverse

bool isDigit(char c) { return c >= '0' && c <= '9'; }

// The length of the decimal number at `p` (sign, digits with an optional
// point, optional exponent), 0 when none starts there.
std::size_t numberLength(const char* p) {
  std::size_t n = 0;
  if (p[n] == '+' || p[n] == '-') ++n;
  std::size_t digits = 0;
  while (isDigit(p[n])) ++n, ++digits;
  if (p[n] == '.') {
    ++n;
    while (isDigit(p[n])) ++n, ++digits;
  }
  if (digits == 0) return 0;
  if (p[n] == 'e' || p[n] == 'E') {
    std::size_t e = n + 1;
    if (p[e] == '+' || p[e] == '-') ++e;
    if (isDigit(p[e])) {
      while (isDigit(p[e])) ++e;
      n = e;
    }
  }
  return n;
}

}  // namespace

bool scanNumbers(const char* line, int k, double* out) {
  const char* p = line;
  for (int i = 0; i < k; ++i) {
    // Like a "%lf" conversion: any white space before the number.
    while (*p != '\0' && std::isspace(static_cast<unsigned char>(*p))) ++p;
    const std::size_t n = numberLength(p);
    if (n == 0) return false;
    // The matched text alone is converted, so strtod's wider syntax (hex,
    // nan, inf) cannot extend it; out of range gives ±HUGE_VAL or 0 as scanf.
    const std::string text(p, n);
    out[i] = std::strtod(text.c_str(), nullptr);
    p += n;
  }
  return true;
}

bool readViewLine(std::FILE* stream, std::string& line) {
  line.clear();
  int c = std::getc(stream);
  if (c == EOF) return false;
  for (; c != EOF && c != '\n'; c = std::getc(stream))
    if (line.size() < kViewLineLength) line.push_back(static_cast<char>(c));
  return true;
}

std::optional<ViewMatrices> readViewStream(std::FILE* stream) {
  // Only the first nine lines matter to either layout; reading them once
  // stands for reading the file again from its start.
  std::vector<std::string> lines;
  std::string line;
  while (static_cast<int>(lines.size()) < kViewLines && readViewLine(stream, line)) lines.push_back(line);
  const auto numbers = [&](int lineNumber, int k, double* out) {
    // A NUL byte ends the text that a conversion can see.
    return lineNumber <= static_cast<int>(lines.size()) &&
           scanNumbers(lines[static_cast<std::size_t>(lineNumber - 1)].c_str(), k, out);
  };

  ViewMatrices v{identityMatrix(), identityMatrix()};
  bool four = true;
  for (int i = 0; i < 8 && four; ++i) {
    double n[4];
    four = numbers(2 + i, 4, n);
    Matrix4& m = i < 4 ? v.mat : v.inv_mat;
    const int column = i % 4;
    for (int r = 0; r < 4 && four; ++r) m[static_cast<std::size_t>(4 * r + column)] = n[r];
  }
  if (four) {
    v.inv_mat = adjugateInverse(v.mat);
    return v;
  }

  v = ViewMatrices{identityMatrix(), identityMatrix()};
  for (int i = 0; i < 6; ++i) {
    double n[3];
    if (!numbers(2 + i, 3, n)) return std::nullopt;
    Matrix4& m = i < 3 ? v.mat : v.inv_mat;
    const int column = i % 3;
    for (int r = 0; r < 3; ++r) m[static_cast<std::size_t>(4 * r + column)] = n[r];
  }
  return v;
}

}  // namespace pc
