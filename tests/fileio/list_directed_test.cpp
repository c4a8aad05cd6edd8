#include "fileio/list_directed.h"

#include <gtest/gtest.h>

#include <cfloat>
#include <climits>
#include <cmath>
#include <cstdio>
#include <vector>

#include "fileio/record_runtime.h"
#include "support/test_support.h"

namespace pc::fileio {
namespace {

// Reads reals until the record has no further value; a null value shows as
// the marker it was preset to.
std::vector<float> readAll(std::string_view text, float marker = -1.0f) {
  std::vector<float> out;
  std::size_t pos = 0;
  for (;;) {
    float v = marker;
    const int r = readListReal(text, pos, v);
    if (r == kListNoValue) return out;
    EXPECT_EQ(r, kListValue) << text;
    if (r != kListValue) return out;
    out.push_back(v);
  }
}

float readOne(std::string_view text, int expected = kListValue) {
  std::size_t pos = 0;
  float v = -7.0f;
  EXPECT_EQ(readListReal(text, pos, v), expected) << text;
  return v;
}

TEST(ListDirectedSeparators, BlanksCommasNullsAndSlash) {
  EXPECT_EQ(readAll("  1.5   2\t3"), (std::vector<float>{1.5f, 2.0f, 3.0f}));
  // A comma between blanks is one separator; two commas make a null value.
  EXPECT_EQ(readAll("1 , 2,,3 ,  , 4"), (std::vector<float>{1, 2, -1, 3, -1, 4}));
  EXPECT_EQ(readAll(",5"), (std::vector<float>{-1, 5}));
  // The slash ends the values, also for every later read.
  std::size_t pos = 0;
  float v = 0.0f;
  const std::string_view text = "7 / 8";
  EXPECT_EQ(readListReal(text, pos, v), kListValue);
  EXPECT_EQ(readListReal(text, pos, v), kListNoValue);
  EXPECT_EQ(readListReal(text, pos, v), kListNoValue);
  EXPECT_EQ(v, 7.0f);
  EXPECT_TRUE(readAll("").empty());
  EXPECT_TRUE(readAll("      ").empty());
}

TEST(ListDirectedReal, NumberForms) {
  EXPECT_EQ(readOne("12"), 12.0f);
  EXPECT_EQ(readOne("12.00000 trailing words"), 12.0f);
  EXPECT_EQ(readOne("-3."), -3.0f);
  EXPECT_EQ(readOne(".5"), 0.5f);
  EXPECT_EQ(readOne("+1.25e2"), 125.0f);
  EXPECT_EQ(readOne("1.5D-1"), 0.15f);
  EXPECT_EQ(readOne("2d3"), 2000.0f);
  EXPECT_EQ(readOne("1.5+3"), 1500.0f);
  EXPECT_EQ(readOne("6.35"), 6.35f);
  EXPECT_EQ(readOne("3.4028235e38"), FLT_MAX);
  EXPECT_EQ(readOne("1e-400"), 0.0f);  // below the float range: zero
  EXPECT_EQ(readOne("0e999999999999"), 0.0f);
  EXPECT_TRUE(std::signbit(readOne("-0.0")));
}

TEST(ListDirectedReal, ConversionErrorsLeaveTheValue) {
  for (const char* bad : {"--3", "1.2.3", "abc", "1e400", "-1e400", "3.4028236e38", "nan", "NaN", "inf",
                          "-Infinity", "12.5abc", "1e", "1e+", "+", ".", "1x5", "0x10", "1*2"}) {
    std::size_t pos = 0;
    float v = -7.0f;
    EXPECT_GT(readListReal(bad, pos, v), 0) << bad;
    EXPECT_EQ(v, -7.0f) << bad;
  }
  const std::string nul("1\0", 2);
  EXPECT_EQ(readOne(nul, 1), -7.0f);
}

TEST(ListDirectedInteger, RangeAndForm) {
  std::size_t pos = 0;
  std::int32_t v = 0;
  const std::string_view text = "42 -7,+3";
  std::vector<std::int32_t> got;
  while (readListInteger(text, pos, v) == kListValue) got.push_back(v);
  EXPECT_EQ(got, (std::vector<std::int32_t>{42, -7, 3}));

  auto one = [](std::string_view t, std::int32_t& out) {
    std::size_t p = 0;
    return readListInteger(t, p, out);
  };
  EXPECT_EQ(one("2147483647", v), kListValue);
  EXPECT_EQ(v, INT32_MAX);
  EXPECT_EQ(one("-2147483648", v), kListValue);
  EXPECT_EQ(v, INT32_MIN);
  for (const char* bad : {"99999999999", "2147483648", "-2147483649", "12.7", "1e5", "abc", "-", "--3"}) {
    v = 5;
    EXPECT_GT(one(bad, v), 0) << bad;
    EXPECT_EQ(v, 5) << bad;
  }
}

TEST(ListDirectedFormat, ReadsBackToTheSameValue) {
  for (const float f : {0.0f, -0.0f, 6.35f, 0.1f, -99999.0f, 25.4f, 1e20f, 123456789.0f, FLT_MAX, -FLT_MAX,
                        FLT_MIN, FLT_TRUE_MIN, 1.0f / 3.0f}) {
    const std::string text = formatListReal(f);
    std::size_t pos = 0;
    float back = 42.0f;
    ASSERT_EQ(readListReal(text, pos, back), kListValue) << text;
    EXPECT_EQ(back, f) << text;
    EXPECT_EQ(std::signbit(back), std::signbit(f)) << text;
  }
  EXPECT_EQ(formatListReal(6.35f), "6.35");
  EXPECT_EQ(formatListReal(25.0f), "25.0");
  EXPECT_EQ(formatListInteger(12), "         12");
  EXPECT_EQ(formatListInteger(INT32_MIN), "-2147483648");
  std::int32_t back = 0;
  std::size_t pos = 0;
  ASSERT_EQ(readListInteger(formatListInteger(-12), pos, back), kListValue);
  EXPECT_EQ(back, -12);
}

TEST(ListDirectedWrite, RecordBeginsWithOneBlank) {
  testing::internal::CaptureStdout();
  EXPECT_EQ(writeListRecord(kStandardOutputUnit, "you are using " + formatListReal(1.0f)), kIoOk);
  std::fflush(stdout);
  EXPECT_EQ(testing::internal::GetCapturedStdout(), " you are using 1.0\n");

  test::TempDir dir;
  const std::string name = dir.file("list.txt");
  ASSERT_EQ(openUnit(7, name, OpenDisposition::New, FileForm::Formatted), kIoOk);
  EXPECT_EQ(writeListRecord(7, formatListReal(-1.0f)), kIoOk);
  EXPECT_EQ(closeUnit(7), kIoOk);
  EXPECT_EQ(test::readFile(name), " -1.0\n");
  // A unit that is not open is an error, not a silent success.
  EXPECT_GT(writeListRecord(8, "x"), 0);
}

}  // namespace
}  // namespace pc::fileio
