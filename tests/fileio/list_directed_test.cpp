#include "fileio/list_directed.h"

#include <gtest/gtest.h>

#include <cfloat>
#include <cmath>
#include <cstdio>
#include <optional>
#include <utility>
#include <vector>

#include "fileio/record_runtime.h"

namespace pc::fileio {
namespace {

// Reads values until the record has no further one; a null value shows as
// the -1 it was preset to.
template <typename T = float>
std::vector<T> readAll(std::string_view text, int (*read)(std::string_view, std::size_t&, T&) = readListReal) {
  std::vector<T> out;
  std::size_t pos = 0;
  int r = 0;
  for (T v = -1; (r = read(text, pos, v)) == kListValue; v = -1) out.push_back(v);
  EXPECT_EQ(r, kListNoValue) << text;
  return out;
}

TEST(ListDirected, SeparatorsNullsAndForms) {
  using V = std::vector<float>;
  EXPECT_EQ(readAll("  1.5   2\t3"), (V{1.5f, 2, 3}));
  // A comma between blanks is one separator; two commas make a null value.
  EXPECT_EQ(readAll("1 , 2,,3 ,  , 4"), (V{1, 2, -1, 3, -1, 4}));
  EXPECT_EQ(readAll(",5"), (V{-1, 5}));
  EXPECT_EQ(readAll("   "), V{});
  // The slash ends the values, also for every later read.
  std::size_t pos = 0;
  float v = 0.0f;
  for (const int r : {kListValue, kListNoValue, kListNoValue}) EXPECT_EQ(readListReal("7 / 8", pos, v), r);
  EXPECT_EQ(v, 7.0f);

  // A conversion error (no expected value) leaves the variable as it was.
  const std::optional<float> bad;
  const std::pair<std::string_view, std::optional<float>> reals[] = {
      {"12.00000 trailing words", 12}, {"-3.", -3}, {".5", 0.5f}, {"+1.25e2", 125}, {"1.5D-1", 0.15f}, {"2d3", 2000},
      {"1.5+3", 1500}, {"3.4028235e38", FLT_MAX}, {"1e-400", 0}, {"0e999999999999", 0}, {"--3", bad}, {".", bad},
      {"1e400", bad}, {"3.4028236e38", bad}, {"nan", bad}, {"inf", bad}, {"12.5abc", bad}, {"1e-5x", bad},
      {"1e+", bad}, {std::string_view("1\0", 2), bad}};
  for (const auto& [text, expected] : reals) {
    float value = -7.0f;
    EXPECT_EQ(readListReal(text, pos = 0, value) > 0, !expected) << text;
    EXPECT_EQ(value, expected.value_or(-7.0f)) << text;
  }
  const std::string ints = "42 -7,+3 2147483647 -2147483648" + formatListInteger(-12);
  EXPECT_EQ(readAll<std::int32_t>(ints, readListInteger),
            (std::vector<std::int32_t>{42, -7, 3, INT32_MAX, INT32_MIN, -12}));
  std::int32_t i = 5;
  for (const char* wrong : {"2147483648", "-2147483649", "99999999999", "12.7", "1e5", "-", "--3"}) {
    EXPECT_GT(readListInteger(wrong, pos = 0, i), 0) << wrong;
  }
  EXPECT_EQ(i, 5);
}

TEST(ListDirected, FormattedValuesReadBackExactly) {
  for (const float f : {0.0f, -0.0f, 6.35f, 0.1f, -99999.0f, 1e20f, 123456789.0f, FLT_MAX, -FLT_MAX, FLT_MIN,
                        FLT_TRUE_MIN, 1.0f / 3.0f}) {
    const std::vector<float> back = readAll(formatListReal(f));
    ASSERT_EQ(back.size(), 1u) << f;
    EXPECT_EQ(back[0], f);
    EXPECT_EQ(std::signbit(back[0]), std::signbit(f)) << f;
  }
  EXPECT_EQ(formatListReal(6.35f), "6.35");
  EXPECT_EQ(formatListReal(25.0f), "25.0");
  EXPECT_EQ(formatListInteger(12), "         12");
  EXPECT_EQ(formatListInteger(INT32_MIN), "-2147483648");
  // A free-form record begins with one blank.
  testing::internal::CaptureStdout();
  EXPECT_EQ(writeListRecord(kStandardOutputUnit, "you are using " + formatListReal(1.0f)), kIoOk);
  std::fflush(stdout);
  EXPECT_EQ(testing::internal::GetCapturedStdout(), " you are using 1.0\n");
  EXPECT_GT(writeListRecord(8, "x"), 0);  // a unit that is not open
}

}  // namespace
}  // namespace pc::fileio
