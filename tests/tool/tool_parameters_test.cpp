#include "tool/tool_parameters.h"

#include <gtest/gtest.h>

#include <cstring>
#include <limits>
#include <map>
#include <tuple>

#include "fileio/list_directed.h"
#include "fileio/runtime_fatal.h"
#include "support/test_support.h"
#include "tool/parameter_keys.h"

namespace pc {
namespace {

using K = ParamKind;

TEST(ParameterKeyTable, KindsAndNamesAtRangeBoundaries) {
  const std::pair<int, K> kinds[] = {
      {-1, K::None},     {0, K::None},      {581, K::None},    {1, K::Number},    {2, K::Number},
      {3, K::Length},    {7, K::Length},    {8, K::Number},    {17, K::Length},   {46, K::Number},
      {58, K::Length},   {60, K::Number},   {61, K::Text},     {69, K::Text},     {70, K::Number},
      {300, K::Length},  {315, K::Text},    {340, K::Text},    {420, K::Number},  {421, K::Integer},
      {440, K::Integer}, {441, K::Length},  {480, K::Length},  {481, K::Text},    {500, K::Text},
      {501, K::Integer}, {530, K::Integer}, {531, K::Number},  {540, K::Number},  {541, K::Integer},
      {560, K::Integer}, {561, K::Length},  {580, K::Length}};
  for (const auto& [slot, kind] : kinds) EXPECT_EQ(parameterKind(slot), kind) << slot;

  const std::pair<int, std::string_view> names[] = {
      {0, ""}, {1, "NumberOfLines"}, {8, "MachinineDirection"}, {46, "MachiningOrder"}, {58, "MinPocketWidth"},
      {86, "2DFeatureFileName"}, {465, "ApproximationSamplingTolerance"}, {466, "_UNUSED_"}, {500, "_UNUSED_"},
      {501, "UndercutArea"}, {531, "5AxisMaxMachiningCtxAngle"}, {532, "_UNUSED_"}, {541, "ProtectAllSurfaces"},
      {542, "_UNUSED_"}, {580, "_UNUSED_"}, {581, ""}};
  for (const auto& [slot, name] : names) EXPECT_EQ(parameterKeyName(slot), name) << slot;

  // Every slot is named, each name used once but the placeholder.
  int perKind[5] = {};  // None, Number, Length, Text, Integer
  std::map<std::string_view, int> uses;
  for (int s = 1; s <= kParameterSlots; ++s) {
    ++perKind[static_cast<int>(parameterKind(s)) + 1];
    ++uses[parameterKeyName(s)];
  }
  EXPECT_EQ(std::vector<int>(perKind, perKind + 5), (std::vector<int>{0, 201, 224, 85, 70}));
  EXPECT_EQ(uses["_UNUSED_"], 35 + 9 + 39);
  for (const auto& [name, n] : uses) EXPECT_TRUE(!name.empty() && (n == 1 || name == "_UNUSED_")) << name;
}

TEST(ToolParameterBlock, AllocationIsZeroFilledWithTheCount) {
  ToolParameters block;
  EXPECT_EQ(allocateToolParameters(block, 3), kParameterTextWidth);
  ASSERT_TRUE(block.values && block.texts);
  EXPECT_EQ(std::vector<float>(block.values.get(), block.values.get() + 5), (std::vector<float>{0, 0, 0, 580, 0}));
  EXPECT_EQ(block.texts[583 * 300 - 1], '\0');
}

class ParameterFile : public testing::Test {
 protected:
  test::TempDir dir;
  test::ScopedEnv tmp{"TRXTMPDIR", dir.path()};
  ToolParameters block;
  float scale = 1.0f;
  std::string zoneText;
  int zoneStatus = -23;

  void SetUp() override { ASSERT_EQ(allocateToolParameters(block, 0), 300); }
  void read(int count = 580) {
    const ParameterSources sources{[this](int code, std::span<char> text) {
                                     EXPECT_EQ(code, 31);
                                     std::fill(text.begin(), text.end(), ' ');
                                     zoneText.copy(text.data(), text.size());
                                     return zoneStatus;
                                   },
                                   [this](float* s) { *s = scale; }};
    readToolParameters(block.values.get(), block.texts.get(), 300, &count, sources);
  }
  void write(const std::string& bytes) { test::writeFile(dir.file("outil.par"), bytes); }
  float v(int s) { return block.slot(s); }
  std::string text(int s) { return std::string(block.texts.get() + 300 * (s - 1), 300); }
  static std::string padded(const std::string& t) { return t + std::string(300 - t.size(), ' '); }
};

TEST_F(ParameterFile, EveryKindIsConverted) {
  // Numbers s.25, texts "name : text<s>", integers s.7, but for a few
  // special lines; more lines than slots.
  const std::map<int, std::string> special = {{61, "0.00000   :  a comment"},  // blank text
                                              {63, "no colon here"}, {64, "x:" + std::string(400, 'y')},
                                              {422, ""}, {423, "-3 trailing"}};
  std::string file;
  for (int s = 1; s <= 600; ++s) {
    const std::string n = std::to_string(s);
    file += (special.count(s)                ? special.at(s)
             : parameterKind(s) == K::Text    ? "name : text" + n
             : parameterKind(s) == K::Integer ? n + ".7 comment"
                                              : n + ".25000") + "\n";
  }
  write(file);
  read();
  // Slot, value and text; slot 1 holds the outcome, whatever line 1 held.
  const std::tuple<int, float, std::string> expected[] = {
      {1, 580.0f, ""}, {3, 3.25f, ""}, {580, 580.25f, ""}, {61, 0.0f, ""}, {62, 0.0f, " text62"},
      {63, 0.0f, "no colon here"}, {64, 0.0f, std::string(300, 'y')}, {422, 0.0f, ""},  // 422: no value, no text
      {421, 421.7f, fileio::formatListInteger(421)}, {423, -3.0f, fileio::formatListInteger(-3)}};
  for (const auto& [slot, value, t] : expected) {
    EXPECT_EQ(v(slot), value) << slot;
    EXPECT_EQ(text(slot), padded(t)) << slot;
  }

  // Only the slots asked for are cleared and read; an unknown count reads none.
  block.slot(12) = 5.0f;
  read(10);
  EXPECT_EQ(std::tuple(v(1), v(10), v(12)), std::tuple(10.0f, 10.25f, 5.0f));
  read(600);
  EXPECT_EQ(std::tuple(v(1), v(10)), std::tuple(0.0f, 10.25f));
}

TEST_F(ParameterFile, ShortAndBadFiles) {
  struct Row { std::string content; float outcome; std::vector<std::pair<int, float>> slots; };
  std::vector<Row> rows = {
      {"", 580.0f, {{2, 0.0f}}},
      {"1\n2\n3", 0.0f, {{2, 2.0f}, {3, 0.0f}}},  // no final line feed
      {"1\n" + std::string(5000, '7') + "\n3\n", 0.0f, {{2, 0.0f}, {3, 0.0f}}},
      {"1\n5" + std::string(1021, ' ') + "\n3\n", 580.0f, {{2, 5.0f}, {3, 3.0f}}},  // 1022 bytes is a line
      {std::string(420, '\n') + "99999999999\n8\n", 0.0f, {{421, 99999999999.0f}, {422, 0.0f}}}};
  for (const std::string bad : {"1e400", "nan", "inf", "--3", "1.2.3", "abc", "\x01\xff"}) {
    rows.push_back({"1\n2\n3\n4\n" + bad + "\n6\n", 0.0f, {{4, 4.0f}, {5, 0.0f}, {6, 0.0f}}});
  }
  rows.push_back({std::string("1\n\0\0\n", 5), 0.0f, {{2, 0.0f}}});
  std::string garbage;
  for (int i = 0; i < 20000; ++i) garbage += static_cast<char>((i * 37 + 11) % 256);
  rows.push_back({garbage, 0.0f, {}});

  for (const Row& row : rows) {
    std::fill_n(block.values.get(), 580, 7.0f);
    std::memset(block.texts.get(), 'z', 580 * 300);
    write(row.content);
    read();
    EXPECT_EQ(v(1), row.outcome) << row.content.substr(0, 40);
    for (const auto& [slot, value] : row.slots) EXPECT_EQ(v(slot), value) << row.content.substr(0, 40);
    EXPECT_EQ(text(61), padded("")) << row.content.substr(0, 40);  // cleared to blanks
  }
}

TEST_F(ParameterFile, ZoneIncrementThenUnitScale) {
  zoneStatus = 1;
  zoneText = " 0.5   ";
  scale = 25.4f;
  // Without a file no slot is cleared, yet both still apply, to lengths only.
  block.slot(2) = 3.0f;
  block.slot(3) = 0.25f;
  block.slot(10) = 1.0f;
  read();
  EXPECT_EQ(std::tuple(v(1), v(2), v(3), v(10)), std::tuple(0.0f, 3.0f, 6.35f, 1.5f * 25.4f));

  // An open lower window bound stays open; unusable factors scale nothing.
  const std::tuple<const char*, float, float> windowMinZ[] = {
      {"-99998.0", 25.4f, -99999.0f}, {"-90000", 25.4f, -99999.0f}, {"-89999", 2.0f, -179998.0f},
      {"-10.0", 25.4f, -254.0f},      {"-99998.0", 1.0f, -99998.0f}, {"-10", 0.0f, -10.0f},
      {"-10", -2.0f, -10.0f},         {"-10", std::numeric_limits<float>::quiet_NaN(), -10.0f}};
  for (const auto& [line, factor, expected] : windowMinZ) {
    scale = factor;
    write(std::string(16, '\n') + line + "\n");
    read();
    EXPECT_EQ(std::tuple(v(17), v(10)), std::tuple(expected, 0.5f * (factor > 0.0f ? factor : 1.0f))) << line;
  }

  // A zone text found must be a number; one not found is not even looked at.
  write("1\n");
  zoneText = "junk";
  for (const int notFound : {-23, 0}) {
    zoneStatus = notFound;
    read();
    EXPECT_EQ(v(10), 0.0f);
  }
  zoneStatus = 2;
  for (const char* bad : {"", "abc", ",", "nan"}) {
    zoneText = bad;
    EXPECT_EXIT(read(), testing::ExitedWithCode(fileio::kFatalStopStatus), "") << bad;
  }
}

}  // namespace
}  // namespace pc
