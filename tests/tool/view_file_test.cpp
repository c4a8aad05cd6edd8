#include "tool/view_file.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstdio>
#include <string>
#include <vector>

#include "platform/platform.h"
#include "tool/frame_matrix.h"

namespace pc {
namespace {

std::optional<ViewMatrices> parse(const std::string& bytes) {
  std::FILE* f = platform::openMemoryStream(bytes.data(), bytes.size());
  if (f == nullptr) {
    ADD_FAILURE() << "no memory stream";
    return std::nullopt;
  }
  auto v = readViewStream(f);
  std::fclose(f);
  return v;
}

double at(const Matrix4& m, int r, int c) { return m[static_cast<std::size_t>(4 * r + c)]; }

TEST(ViewNumbers, ReadLikeScanfWithoutNanOrInfinity) {
  double n[4] = {};
  ASSERT_TRUE(scanNumbers("  1 -2.5\t3e2 .25 trailing text", 4, n));
  EXPECT_EQ((std::vector<double>{n[0], n[1], n[2], n[3]}), (std::vector<double>{1.0, -2.5, 300.0, 0.25}));
  // A sign starts the next conversion even without a blank before it.
  ASSERT_TRUE(scanNumbers("1-2+3", 3, n));
  EXPECT_EQ(n[1], -2.0);
  // An exponent without digits is not part of the number.
  ASSERT_TRUE(scanNumbers("2e+ 4", 1, n));
  EXPECT_EQ(n[0], 2.0);
  ASSERT_TRUE(scanNumbers("1e400", 1, n));
  EXPECT_TRUE(std::isinf(n[0]));
  for (const char* bad : {"2e+ 4", "nan 1", "1 inf", "1", "1, 2", ". 1", "0x10 1", ""})
    EXPECT_FALSE(scanNumbers(bad, 2, n)) << bad;
}

TEST(ViewFile, FourColumnsGiveTheFrameAndItsComputedInverse) {
  // Each line is one column: a translation by (10, 20, 30) in the last one.
  const auto v = parse(
      "title\n1 0 0 0\n0 1 0 0\n0 0 1 0\n10 20 30 1\n"
      "9 9 9 9\n9 9 9 9\n9 9 9 9\n9 9 9 9\n");
  ASSERT_TRUE(v);
  EXPECT_EQ(v->mat, (Matrix4{1, 0, 0, 10, 0, 1, 0, 20, 0, 0, 1, 30, 0, 0, 0, 1}));
  // The lines 6 to 9 are checked but the inverse is the computed one.
  EXPECT_EQ(v->inv_mat, (Matrix4{1, 0, 0, -10, 0, 1, 0, -20, 0, 0, 1, -30, 0, 0, 0, 1}));
}

TEST(ViewFile, ThreeColumnsKeepTheirOwnInverse) {
  const auto v = parse("title\r\n2 0 0\r\n0 3 0\r\n0 0 4\r\n7 0 0\r\n0 8 0\r\n0 0 9\r\n");
  ASSERT_TRUE(v);
  EXPECT_EQ(v->mat, (Matrix4{2, 0, 0, 0, 0, 3, 0, 0, 0, 0, 4, 0, 0, 0, 0, 1}));
  const Matrix4 inverse = {7, 0, 0, 0, 0, 8, 0, 0, 0, 0, 9, 0, 0, 0, 0, 1};
  EXPECT_EQ(v->inv_mat, inverse);
  // Columns: line 3 is the second column of mat.
  const auto w = parse("t\n1 2 3\n4 5 6\n7 8 9\n1 0 0\n0 1 0\n0 0 1\n");
  ASSERT_TRUE(w);
  const Matrix4 columns = {1, 4, 7, 0, 2, 5, 8, 0, 3, 6, 9, 0, 0, 0, 0, 1};
  EXPECT_EQ(w->mat, columns);
}

TEST(ViewFile, AShortFourColumnFileFallsBackToThreeColumns) {
  // Four numbers on lines 2 to 8 only: the three-column reading of the same
  // lines takes the first three numbers of each.
  const auto v = parse("t\n1 0 0 5\n0 1 0 5\n0 0 1 5\n2 0 0 5\n0 2 0 5\n0 0 2 5\n9 9 9 9\n");
  ASSERT_TRUE(v);
  EXPECT_TRUE(isIdentity(v->mat));
  EXPECT_EQ(at(v->inv_mat, 0, 0), 2.0);
  EXPECT_EQ(at(v->inv_mat, 3, 3), 1.0);
}

TEST(ViewFile, UnreadableContentsGiveNothing) {
  EXPECT_FALSE(parse(""));
  EXPECT_FALSE(parse("title\n1 0 0\n0 1 0\n0 0 1\n"));  // only three lines of numbers
  EXPECT_FALSE(parse("t\n1 0 0\n0 1 0\n0 0 1\n1 0 0\n0 nan 0\n0 0 1\n"));
  EXPECT_FALSE(parse(std::string("t\n1 0\0 0\n0 1 0\n0 0 1\n1 0 0\n0 1 0\n0 0 1\n", 40)));
  std::string binary;
  for (int i = 0; i < 4096; ++i) binary.push_back(static_cast<char>((i * 131 + 7) % 256));
  EXPECT_FALSE(parse(binary));
}

TEST(ViewFile, LongLinesAreCutButCountAsOneLine) {
  // The numbers of line 2 come after 600 blanks: beyond the 511 characters
  // read, so the line gives nothing; the rest of it is not a line of its own.
  const std::string body = "1 0 0\n0 1 0\n0 0 1\n1 0 0\n0 1 0\n0 0 1\n";
  EXPECT_FALSE(parse("t\n" + std::string(600, ' ') + body));
  EXPECT_TRUE(parse(std::string(1 << 20, 'x') + "\n" + body));
  // 10,000 columns: only the first numbers count.
  std::string wide;
  for (int i = 0; i < 10000; ++i) wide += "1 ";
  const auto v = parse("t\n" + wide + "\n" + wide + "\n" + wide + "\n" + wide + "\n" + wide + "\n" + wide + "\n");
  ASSERT_TRUE(v);
  EXPECT_EQ(at(v->mat, 2, 2), 1.0);
  EXPECT_EQ(at(v->mat, 0, 3), 0.0);
}

}  // namespace
}  // namespace pc
