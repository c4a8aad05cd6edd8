#include "fileio/record_runtime.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <cstdio>
#include <string>
#include <vector>

#include "support/test_support.h"

namespace pc::fileio {
namespace {

using test::framedRecord;
using test::readFile;

constexpr int kUnit = 11;

class RecordRuntime : public ::testing::Test {
 protected:
  void TearDown() override { closeAllUnits(); }
  void openOld(const std::string& bytes, FileForm form = FileForm::Unformatted) {
    test::writeFile(path, bytes);
    ASSERT_EQ(openUnit(kUnit, path, OpenDisposition::Old, form), kIoOk);
  }
  int read(std::size_t size) {
    got.assign(size, '?');
    return readRecord(kUnit, got.data(), size);
  }
  int line() { return readTextRecord(kUnit, got); }

  test::TempDir dir;
  std::string path = dir.file("data.bin");
  std::string got;
};

std::string int32Bytes(std::int32_t v) {
  std::string s;
  test::putInt32(s, v);
  return s;
}

TEST_F(RecordRuntime, FramingRoundTripThroughTheBuffer) {
  // Many small records, an empty one, and one larger than the buffer.
  std::string bytes;
  const std::string huge(3 * 1024 * 1024 + 7, 'h');
  ASSERT_EQ(openUnit(kUnit, path, OpenDisposition::New, FileForm::Unformatted), kIoOk);
  for (int i = 0; i < 100000; ++i) {
    bytes += framedRecord(int32Bytes(i));
    ASSERT_EQ(writeRecord(kUnit, int32Bytes(i).data(), 4), kIoOk);
  }
  ASSERT_EQ(writeRecord(kUnit, nullptr, 0), kIoOk);
  ASSERT_EQ(writeRecord(kUnit, huge.data(), huge.size()), kIoOk);
  ASSERT_EQ(writeRecord(kUnit, "end", 3), kIoOk);
  EXPECT_EQ(closeUnit(kUnit), kIoOk);
  bytes += framedRecord("") + framedRecord(huge) + framedRecord("end");
  EXPECT_TRUE(readFile(path) == bytes);

  ASSERT_EQ(openUnit(kUnit, path, OpenDisposition::Old, FileForm::Unformatted), kIoOk);
  for (int i = 0; i < 100000; ++i) {
    ASSERT_EQ(read(4), kIoOk);
    ASSERT_EQ(got, int32Bytes(i)) << i;
  }
  EXPECT_EQ(read(0), kIoOk);
  EXPECT_EQ(read(5), kIoOk);  // the front of a longer record, then the next one
  EXPECT_EQ(got, "hhhhh");
  EXPECT_EQ(read(3), kIoOk);
  EXPECT_EQ(got, "end");
  EXPECT_EQ(read(0), kIoEnd);
}

TEST_F(RecordRuntime, DamagedFramingIsAReadErrorThatDoesNotAdvance) {
  const std::string good = framedRecord("0123456789ab");
  const std::vector<std::pair<std::string, std::size_t>> cases = {
      {int32Bytes(12) + "0123456789ab" + int32Bytes(13), 12},  // trailer differs
      {framedRecord("01234567"), 12},                           // shorter than asked
      {int32Bytes(INT32_MAX) + std::string(100, 'z'), 12},      // 2 GiB count, small file
      {int32Bytes(-12) + "0123456789ab" + int32Bytes(-12), 12}, // negative count
      {good.substr(0, 10), 12},                                 // cut in the data
      {good.substr(0, good.size() - 1), 12},                    // cut in the trailer
      {good.substr(0, 3), 0},                                   // cut in the count
      {int32Bytes(5000000) + std::string(2000000, 'q'), 4},     // huge record cut
  };
  for (const auto& [bytes, ask] : cases) {
    SCOPED_TRACE(testing::Message() << bytes.size() << " bytes");
    openOld(good + bytes);
    ASSERT_EQ(read(12), kIoOk);
    EXPECT_EQ(read(ask), kIoErrorRecord);
    EXPECT_EQ(read(ask), kIoErrorRecord);  // same place, same answer
    EXPECT_EQ(backspaceUnit(kUnit), kIoOk);
    EXPECT_EQ(read(12), kIoOk);
    EXPECT_EQ(got, "0123456789ab");
    EXPECT_EQ(closeUnit(kUnit), kIoOk);
  }
  openOld("");
  EXPECT_EQ(read(0), kIoEnd);
}

TEST_F(RecordRuntime, RewindBackspaceAndAWriteInTheMiddleCutsTheRest) {
  openOld(framedRecord("one") + framedRecord("two") + framedRecord("three"));
  ASSERT_EQ(read(3), kIoOk);
  ASSERT_EQ(read(3), kIoOk);
  EXPECT_EQ(backspaceUnit(kUnit), kIoOk);
  EXPECT_EQ(read(3), kIoOk);
  EXPECT_EQ(got, "two");
  EXPECT_EQ(rewindUnit(kUnit), kIoOk);
  EXPECT_EQ(read(3), kIoOk);
  EXPECT_EQ(writeRecord(kUnit, "2", 1), kIoOk);
  EXPECT_EQ(read(0), kIoEnd);
  EXPECT_EQ(backspaceUnit(kUnit), kIoOk);  // from after the end to the end
  EXPECT_EQ(backspaceUnit(kUnit), kIoOk);
  EXPECT_EQ(read(1), kIoOk);
  EXPECT_EQ(got, "2");
  EXPECT_EQ(closeUnit(kUnit), kIoOk);
  EXPECT_EQ(readFile(path), framedRecord("one") + framedRecord("2"));
}

TEST_F(RecordRuntime, UnitTableRulesAndRefusals) {
  EXPECT_EQ(openUnit(kUnit, dir.file("missing"), OpenDisposition::Old, FileForm::Unformatted), kIoErrorOpen);
  EXPECT_EQ(openUnit(kUnit, dir.path(), OpenDisposition::Unknown, FileForm::Formatted), kIoErrorOpen);
  EXPECT_EQ(openUnit(0, path, OpenDisposition::Unknown, FileForm::Formatted), kIoErrorUnit);
  test::writeFile(path, "keep");
  EXPECT_EQ(openUnit(kUnit, path, OpenDisposition::New, FileForm::Formatted), kIoErrorOpen);
  EXPECT_TRUE(namedFileExists(path + "  "));
  EXPECT_FALSE(namedFileExists(dir.path()));
  EXPECT_EQ(read(1), kIoErrorUnit);
  EXPECT_EQ(closeUnit(kUnit), kIoOk);  // closing a closed unit is harmless

  // Unknown keeps an existing file; the form must match the operation.
  ASSERT_EQ(openUnit(kUnit, path, OpenDisposition::Unknown, FileForm::Formatted), kIoOk);
  EXPECT_EQ(read(1), kIoErrorUnit);
  EXPECT_EQ(writeRecord(kUnit, "x", 1), kIoErrorUnit);
  EXPECT_EQ(line(), kIoOk);
  EXPECT_EQ(got, "keep");
  // Opening an open unit again leaves its first file.
  ASSERT_EQ(openUnit(kUnit, dir.file("b.txt"), OpenDisposition::Unknown, FileForm::Formatted), kIoOk);
  EXPECT_EQ(line(), kIoEnd);
  EXPECT_EQ(closeUnit(kUnit, true), kIoOk);
  EXPECT_FALSE(test::fileExists(dir.file("b.txt")));
  EXPECT_EQ(readFile(path), "keep");
}

TEST_F(RecordRuntime, WriteFailureIsReportedAtTheLatestOnClose) {
  if (!test::fileExists("/dev/full")) GTEST_SKIP() << "no /dev/full here";
  ASSERT_EQ(openUnit(kUnit, "/dev/full", OpenDisposition::Old, FileForm::Unformatted), kIoOk);
  EXPECT_EQ(writeRecord(kUnit, "abc", 3), kIoOk);  // still in the buffer
  EXPECT_EQ(closeUnit(kUnit), kIoErrorSystem);
  ASSERT_EQ(openUnit(kUnit, "/dev/full", OpenDisposition::Old, FileForm::Formatted), kIoOk);
  EXPECT_EQ(writeTextRecord(kUnit, std::string(2 * 1024 * 1024, 'l')), kIoErrorSystem);  // beyond the buffer
  EXPECT_EQ(closeUnit(kUnit), kIoErrorSystem);
}

TEST_F(RecordRuntime, TextRecordsAppendAfterUnterminatedLastLine) {
  openOld("first\r\n\n  x , y\nlast", FileForm::Formatted);
  for (const char* expected : {"first", "", "  x , y", "last"}) {
    ASSERT_EQ(line(), kIoOk);
    EXPECT_EQ(got, expected);
  }
  EXPECT_EQ(line(), kIoEnd);
  EXPECT_EQ(backspaceUnit(kUnit), kIoOk);  // back to the end of the data
  EXPECT_EQ(writeTextRecord(kUnit, "added"), kIoOk);
  EXPECT_EQ(closeUnit(kUnit), kIoOk);
  EXPECT_EQ(readFile(path), "first\r\n\n  x , y\nlast\nadded\n");
}

TEST_F(RecordRuntime, TextBackspaceOverlongLineAndStandardOutput) {
  openOld("a\nbb\n\nccc\n" + std::string(kMaxTextRecord + 1, 'L') + "\n", FileForm::Formatted);
  for (int i = 0; i < 4; ++i) ASSERT_EQ(line(), kIoOk);
  EXPECT_EQ(line(), kIoErrorRecord);
  for (int i = 0; i < 3; ++i) ASSERT_EQ(backspaceUnit(kUnit), kIoOk);
  EXPECT_EQ(line(), kIoOk);
  EXPECT_EQ(got, "bb");
  for (int i = 0; i < 3; ++i) ASSERT_EQ(backspaceUnit(kUnit), kIoOk);  // stops at the start
  EXPECT_EQ(line(), kIoOk);
  EXPECT_EQ(got, "a");
  EXPECT_EQ(writeTextRecord(kUnit, "B"), kIoOk);
  EXPECT_EQ(closeUnit(kUnit), kIoOk);
  EXPECT_EQ(readFile(path), "a\nB\n");

  testing::internal::CaptureStdout();
  EXPECT_EQ(writeTextRecord(kStandardOutputUnit, " 1.5 2"), kIoOk);
  EXPECT_EQ(writeTextRecord(kStandardOutputUnit, ""), kIoOk);
  std::fflush(stdout);
  EXPECT_EQ(testing::internal::GetCapturedStdout(), " 1.5 2\n\n");
}

}  // namespace
}  // namespace pc::fileio
