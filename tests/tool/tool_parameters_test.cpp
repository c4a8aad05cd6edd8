#include "tool/tool_parameters.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <functional>
#include <map>
#include <set>
#include <string>
#include <vector>

#include "fileio/list_directed.h"
#include "fileio/runtime_fatal.h"
#include "support/test_support.h"
#include "tool/parameter_keys.h"

namespace pc {
namespace {

TEST(ParameterKeyTable, KindsAndNamesAtRangeBoundaries) {
  const std::map<int, ParamKind> kinds = {
      {-1, ParamKind::None},     {0, ParamKind::None},      {581, ParamKind::None},
      {1, ParamKind::Number},    {2, ParamKind::Number},    {3, ParamKind::Length},
      {7, ParamKind::Length},    {8, ParamKind::Number},    {17, ParamKind::Length},
      {46, ParamKind::Number},   {58, ParamKind::Length},   {60, ParamKind::Number},
      {61, ParamKind::Text},     {69, ParamKind::Text},     {70, ParamKind::Number},
      {300, ParamKind::Length},  {315, ParamKind::Text},    {340, ParamKind::Text},
      {420, ParamKind::Number},  {421, ParamKind::Integer}, {440, ParamKind::Integer},
      {441, ParamKind::Length},  {480, ParamKind::Length},  {481, ParamKind::Text},
      {500, ParamKind::Text},    {501, ParamKind::Integer}, {530, ParamKind::Integer},
      {531, ParamKind::Number},  {540, ParamKind::Number},  {541, ParamKind::Integer},
      {560, ParamKind::Integer}, {561, ParamKind::Length},  {580, ParamKind::Length}};
  for (const auto& [slot, kind] : kinds) EXPECT_EQ(parameterKind(slot), kind) << slot;

  const std::map<int, std::string> names = {
      {0, ""},          {1, "NumberOfLines"},        {8, "MachinineDirection"},
      {46, "MachiningOrder"}, {58, "MinPocketWidth"},  {86, "2DFeatureFileName"},
      {465, "ApproximationSamplingTolerance"},        {466, "_UNUSED_"},
      {500, "_UNUSED_"}, {501, "UndercutArea"},       {531, "5AxisMaxMachiningCtxAngle"},
      {532, "_UNUSED_"}, {541, "ProtectAllSurfaces"}, {542, "_UNUSED_"},
      {580, "_UNUSED_"}, {581, ""}};
  for (const auto& [slot, name] : names) EXPECT_EQ(parameterKeyName(slot), name) << slot;

  std::map<ParamKind, int> perKind;
  std::set<std::string_view> distinct;
  int unused = 0;
  for (int s = 1; s <= kParameterSlots; ++s) {
    ++perKind[parameterKind(s)];
    const std::string_view name = parameterKeyName(s);
    ASSERT_FALSE(name.empty()) << s;
    if (name == "_UNUSED_") ++unused;
    else EXPECT_TRUE(distinct.insert(name).second) << "duplicate key " << name;
  }
  EXPECT_EQ(perKind[ParamKind::Number], 201);
  EXPECT_EQ(perKind[ParamKind::Length], 224);
  EXPECT_EQ(perKind[ParamKind::Text], 85);
  EXPECT_EQ(perKind[ParamKind::Integer], 70);
  EXPECT_EQ(unused, 35 + 9 + 39);
}

TEST(ToolParameterBlock, AllocationIsZeroFilledWithTheCount) {
  ToolParameters block;
  EXPECT_EQ(allocateToolParameters(block, 3), kParameterTextWidth);
  ASSERT_TRUE(block.values && block.texts);
  EXPECT_EQ(block.values[3], 580.0f);
  EXPECT_EQ(block.values[0], 0.0f);
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
    ParameterSources sources;
    sources.zoneText = [this](int code, std::span<char> text) {
      EXPECT_EQ(code, 31);
      std::memset(text.data(), ' ', text.size());
      std::memcpy(text.data(), zoneText.data(), std::min(zoneText.size(), text.size()));
      return zoneStatus;
    };
    sources.unitScale = [this](float* s) { *s = scale; };
    readToolParameters(block.values.get(), block.texts.get(), 300, &count, sources);
  }
  void write(const std::string& bytes) { test::writeFile(dir.file("outil.par"), bytes); }
  float v(int s) { return block.slot(s); }
  std::string text(int s) { return std::string(block.texts.get() + 300 * (s - 1), 300); }
  static std::string padded(const std::string& t) { return t + std::string(300 - t.size(), ' '); }

  // One line per slot: numbers s + 0.25, texts "name : text<s>", integers s.7.
  static std::string fullFile(int lines, const char* end = "\n") {
    std::string out;
    for (int s = 1; s <= lines; ++s) {
      const int slot = (s - 1) % 580 + 1;
      if (parameterKind(slot) == ParamKind::Text) out += "name : text" + std::to_string(s);
      else if (parameterKind(slot) == ParamKind::Integer) out += std::to_string(s) + ".7 comment";
      else out += std::to_string(s) + ".25000";
      out += end;
    }
    return out;
  }
};

TEST_F(ParameterFile, EveryKindIsConverted) {
  write(fullFile(580));
  read();
  EXPECT_EQ(v(1), 580.0f);  // the outcome, whatever line 1 held
  EXPECT_EQ(v(3), 3.25f);
  EXPECT_EQ(v(580), 580.25f);
  EXPECT_EQ(v(61), 0.0f);
  EXPECT_EQ(text(61), padded(" text61"));
  EXPECT_EQ(v(421), 421.7f);
  EXPECT_EQ(text(421), padded(fileio::formatListInteger(421)));
  EXPECT_EQ(text(3), padded(""));
}

TEST_F(ParameterFile, ShortFilesAndLineEnds) {
  write(fullFile(60, "\r\n"));
  read();
  EXPECT_EQ(v(1), 580.0f);
  EXPECT_EQ(v(60), 60.25f);
  EXPECT_EQ(v(62), 0.0f);
  EXPECT_EQ(text(61), padded(""));  // cleared to blanks, not left zero
  write("");
  read();
  EXPECT_EQ(v(1), 580.0f);
  EXPECT_EQ(v(60), 0.0f);
}

TEST_F(ParameterFile, TextAndIntegerLines) {
  std::string lines(60, '\n');
  lines += "0.00000   :  a comment\n";        // 61: blank text
  lines += "abc : word\n";                    // 62
  lines += "no colon here\n";                 // 63: the whole line
  lines += "x:" + std::string(400, 'y') + "\n";  // 64: cut to 300
  write(lines + std::string(420 - 64, '\n') + "12.7\n\n-3 trailing\n");
  read();
  EXPECT_EQ(text(61), padded(""));
  EXPECT_EQ(text(62), padded(" word"));
  EXPECT_EQ(text(63), padded("no colon here"));
  EXPECT_EQ(text(64), std::string(300, 'y'));
  EXPECT_EQ(v(421), 12.7f);
  EXPECT_EQ(text(421), padded(fileio::formatListInteger(12)));
  EXPECT_EQ(text(422), padded(""));  // no value, no text
  EXPECT_EQ(v(423), -3.0f);
  EXPECT_EQ(text(423), padded(fileio::formatListInteger(-3)));
}

TEST_F(ParameterFile, MissingFileStillTakesTheZoneIncrement) {
  block.slot(3) = 9.0f;  // no slot is cleared when the file is missing
  zoneStatus = 4;
  zoneText = "0.5";
  scale = 2.0f;
  read();
  EXPECT_EQ(v(1), 0.0f);
  EXPECT_EQ(v(3), 18.0f);
  EXPECT_EQ(v(10), 1.0f);
}

TEST_F(ParameterFile, BadLinesEndTheReadingAsAFailure) {
  const std::vector<std::string> badNumbers = {"1e400", "nan", "inf", "--3", "1.2.3", "abc",
                                               std::string("\0\0\x01\xff", 4)};
  for (const std::string& bad : badNumbers) {
    write("1\n2\n3\n4\n" + bad + "\n6\n");
    read();
    EXPECT_EQ(v(1), 0.0f) << bad;
    EXPECT_EQ(v(4), 4.0f) << bad;
    EXPECT_EQ(v(5), 0.0f) << bad;
    EXPECT_EQ(v(6), 0.0f) << bad;
  }
  write("1\n2\n3");  // no final line feed
  read();
  EXPECT_EQ(v(1), 0.0f);
  EXPECT_EQ(v(2), 2.0f);
  EXPECT_EQ(v(3), 0.0f);
  write("1\n" + std::string(5000, '7') + "\n3\n");
  read();
  EXPECT_EQ(v(1), 0.0f);
  EXPECT_EQ(v(2), 0.0f);
  write("1\n5" + std::string(1021, ' ') + "\n3\n");  // 1022 bytes is still a line
  read();
  EXPECT_EQ(v(1), 580.0f);
  EXPECT_EQ(v(2), 5.0f);
  write(std::string(420, '\n') + "99999999999\n8\n");
  read();
  EXPECT_EQ(v(1), 0.0f);
  EXPECT_EQ(v(421), 99999999999.0f);
  EXPECT_EQ(v(422), 0.0f);
  std::string garbage;
  for (int i = 0; i < 20000; ++i) garbage += static_cast<char>((i * 37 + 11) % 256);
  write(garbage);
  read();
  EXPECT_EQ(v(1), 0.0f);
}

TEST_F(ParameterFile, NothingIsReadPastTheLastSlot) {
  write(fullFile(100000));
  read();
  EXPECT_EQ(v(1), 580.0f);
  EXPECT_EQ(v(580), 580.25f);
  block.slot(12) = 5.0f;
  read(10);
  EXPECT_EQ(v(1), 10.0f);
  EXPECT_EQ(v(10), 10.25f);
  EXPECT_EQ(v(12), 5.0f);
  read(600);  // no such slot: nothing cleared or read
  EXPECT_EQ(v(1), 0.0f);
  EXPECT_EQ(v(12), 5.0f);
  read(0);
  EXPECT_EQ(v(1), 0.0f);
}

TEST_F(ParameterFile, LengthsAreScaledAfterTheIncrement) {
  std::string lines = "0\n3\n0.25\n0.5\n";
  lines += std::string(5, '\n') + "1.0\n" + std::string(6, '\n') + "-99998.0\n";
  write(lines);
  zoneStatus = 1;
  zoneText = " 0.5   ";
  scale = 25.4f;
  read();
  EXPECT_EQ(v(1), 580.0f);
  EXPECT_EQ(v(2), 3.0f);
  EXPECT_EQ(v(3), 6.35f);
  EXPECT_EQ(v(4), 12.7f);
  EXPECT_EQ(v(10), 1.5f * 25.4f);
  EXPECT_EQ(v(17), -99999.0f);

  write(std::string(16, '\n') + "-10.0\n");
  read();
  EXPECT_EQ(v(17), -254.0f);
  scale = 1.0f;
  write(std::string(16, '\n') + "-99998.0\n");
  read();
  EXPECT_EQ(v(17), -99998.0f);
  zoneStatus = -23;  // not found: the text is not even looked at
  zoneText = "junk";
  read();
  EXPECT_EQ(v(10), 0.0f);
}

TEST_F(ParameterFile, UnreadableZoneIncrementStopsTheRun) {
  write("1\n");
  zoneStatus = 2;
  for (const char* bad : {"", "abc", ",", "nan"}) {
    zoneText = bad;
    EXPECT_EXIT(read(), testing::ExitedWithCode(fileio::kFatalStopStatus), "") << bad;
  }
}

}  // namespace
}  // namespace pc
