#include "fileio/record_runtime.h"

#include <gtest/gtest.h>
#include <sys/stat.h>

#include <cstdint>
#include <string>
#include <utility>

#include "fileio/memory_files.h"
#include "support/test_support.h"

namespace pc::fileio {
namespace {

using test::framedRecord;

constexpr int kUnit = 11;

std::string int32Bytes(std::int32_t v) { std::string s; test::putInt32(s, v); return s; }

class RecordRuntime : public ::testing::Test {
 protected:
  void TearDown() override { closeAllUnits(); }
  void openOld(const std::string& bytes, FileForm form = FileForm::Unformatted) {
    test::writeFile(path, bytes);
    ASSERT_EQ(openUnit(kUnit, path, OpenDisposition::Old, form), kIoOk);
  }
  // The next record (or line), or the status of the read when it fails.
  std::string rec(std::size_t size) { got.assign(size, '?'); return shown(readRecord(kUnit, got.data(), size)); }
  std::string line() { return shown(readTextRecord(kUnit, got)); }
  std::string shown(int s) const { return s == kIoOk ? got : status(s); }
  static std::string status(int s) { return "status " + std::to_string(s); }
  // What the unit left in its file.
  std::string closed() { EXPECT_EQ(closeUnit(kUnit), kIoOk); return test::readFile(path); }

  test::TempDir dir;
  std::string path = dir.file("data.bin");
  std::string got;
};

TEST_F(RecordRuntime, FramingRoundTripThroughTheBuffer) {
  // Many small records, an empty one, and one larger than the buffer.
  const std::string huge(3 * 1024 * 1024 + 7, 'h');
  std::string bytes;
  ASSERT_EQ(openUnit(kUnit, path, OpenDisposition::New, FileForm::Unformatted), kIoOk);
  for (int i = 0; i < 100000; ++i) {
    bytes += framedRecord(int32Bytes(i));
    ASSERT_EQ(writeRecord(kUnit, int32Bytes(i).data(), 4), kIoOk);
  }
  ASSERT_EQ(writeRecord(kUnit, nullptr, 0), kIoOk);
  ASSERT_EQ(writeRecord(kUnit, huge.data(), huge.size()), kIoOk);
  ASSERT_EQ(writeRecord(kUnit, "end", 3), kIoOk);
  EXPECT_TRUE(closed() == bytes + framedRecord("") + framedRecord(huge) + framedRecord("end"));

  ASSERT_EQ(openUnit(kUnit, path, OpenDisposition::Old, FileForm::Unformatted), kIoOk);
  for (int i = 0; i < 100000; ++i) ASSERT_EQ(rec(4), int32Bytes(i)) << i;
  // The front of a longer record, then the next one.
  EXPECT_EQ(rec(0), "");
  EXPECT_EQ(rec(5), "hhhhh");
  EXPECT_EQ(rec(3), "end");
  EXPECT_EQ(rec(0), status(kIoEnd));
}

TEST_F(RecordRuntime, DamagedFramingIsAReadErrorThatDoesNotAdvance) {
  const std::string good = framedRecord("0123456789ab");
  const std::pair<std::string, std::size_t> cases[] = {
      {int32Bytes(12) + "0123456789ab" + int32Bytes(13), 12},        // trailer differs
      {framedRecord("01234567"), 12},                                 // shorter than asked
      {int32Bytes(INT32_MAX) + std::string(100, 'z'), 12},            // 2 GiB count, small file
      {int32Bytes(-12) + "0123456789ab" + int32Bytes(-12), 12},       // negative count
      {good.substr(0, good.size() - 1), 12},                          // cut in the trailer
      {good.substr(0, 3), 0},                                         // cut in the count
      {int32Bytes(2000000) + std::string(2000000, 'q') + int32Bytes(1999999), 4},  // trailer differs, long record
  };
  for (const auto& [bytes, ask] : cases) {
    SCOPED_TRACE(testing::Message() << bytes.size() << " bytes");
    openOld(good + bytes);
    ASSERT_EQ(rec(12), "0123456789ab");
    EXPECT_EQ(rec(ask), status(kIoErrorRecord));
    EXPECT_EQ(backspaceUnit(kUnit), kIoOk);  // the failed read did not move on
    EXPECT_EQ(rec(12), "0123456789ab");
  }
}

TEST_F(RecordRuntime, PositioningCutsAtAWriteInBothForms) {
  openOld(framedRecord("one") + framedRecord("two") + framedRecord("three"));
  EXPECT_EQ(rec(3), "one");
  EXPECT_EQ(rec(3), "two");
  EXPECT_EQ(rewindUnit(kUnit), kIoOk);
  EXPECT_EQ(rec(3), "one");
  EXPECT_EQ(writeRecord(kUnit, "2", 1), kIoOk);
  EXPECT_EQ(rec(0), status(kIoEnd));
  EXPECT_EQ(backspaceUnit(kUnit), kIoOk);  // from after the end to the end
  EXPECT_EQ(backspaceUnit(kUnit), kIoOk);
  EXPECT_EQ(rec(1), "2");
  EXPECT_EQ(closed(), framedRecord("one") + framedRecord("2"));

  openOld("first\r\n\n  x , y\nlast", FileForm::Formatted);
  EXPECT_EQ(rec(1), status(kIoErrorUnit));  // the form must match the operation
  EXPECT_EQ(writeRecord(kUnit, "x", 1), kIoErrorUnit);
  for (const char* expected : {"first", "", "  x , y", "last"}) EXPECT_EQ(line(), expected);
  EXPECT_EQ(line(), status(kIoEnd));
  EXPECT_EQ(backspaceUnit(kUnit), kIoOk);             // back to the end of the data
  EXPECT_EQ(writeTextRecord(kUnit, "added"), kIoOk);  // after an unterminated last line
  EXPECT_EQ(closed(), "first\r\n\n  x , y\nlast\nadded\n");

  openOld("a\nbb\n\nccc\n" + std::string(kMaxTextRecord + 1, 'L') + "\n", FileForm::Formatted);
  for (const char* expected : {"a", "bb", "", "ccc"}) EXPECT_EQ(line(), expected);
  EXPECT_EQ(line(), status(kIoErrorRecord));
  for (int i = 0; i < 3; ++i) ASSERT_EQ(backspaceUnit(kUnit), kIoOk);
  EXPECT_EQ(line(), "bb");
  for (int i = 0; i < 3; ++i) ASSERT_EQ(backspaceUnit(kUnit), kIoOk);  // stops at the start
  EXPECT_EQ(line(), "a");
  EXPECT_EQ(writeTextRecord(kUnit, "B"), kIoOk);
  EXPECT_EQ(closed(), "a\nB\n");
}

TEST_F(RecordRuntime, RefusalsAndWriteFailures) {
  EXPECT_EQ(openUnit(kUnit, dir.file("missing"), OpenDisposition::Old, FileForm::Unformatted), kIoErrorOpen);
  EXPECT_EQ(openUnit(0, path, OpenDisposition::Unknown, FileForm::Formatted), kIoErrorUnit);
  test::writeFile(path, "keep");
  EXPECT_TRUE(namedFileExists(path + "  "));  // a blank-padded name
  EXPECT_EQ(openUnit(kUnit, path, OpenDisposition::New, FileForm::Formatted), kIoErrorOpen);
  EXPECT_EQ(rec(1), status(kIoErrorUnit));
  EXPECT_EQ(closed(), "keep");  // closing a closed unit is harmless

  // Nothing that is not a regular file is opened to be read, and nothing
  // blocks: a FIFO is refused for any use, a device for reading.
  const std::string fifo = dir.file("fifo");
  ASSERT_EQ(::mkfifo(fifo.c_str(), 0600), 0);
  for (const UnitUse use : {UnitUse::Read, UnitUse::ReadWrite}) {
    EXPECT_EQ(openUnit(kUnit, fifo, OpenDisposition::Old, FileForm::Unformatted, use), kIoErrorOpen);
  }
  EXPECT_EQ(openUnit(kUnit, "/dev/zero", OpenDisposition::Old, FileForm::Formatted, UnitUse::Read), kIoErrorOpen);
  EXPECT_FALSE(isUnitOpen(kUnit));

  // A write failure is reported at the latest on close.
  if (!test::fileExists("/dev/full")) GTEST_SKIP() << "no /dev/full here";
  ASSERT_EQ(openUnit(kUnit, "/dev/full", OpenDisposition::Old, FileForm::Unformatted), kIoOk);
  EXPECT_EQ(writeRecord(kUnit, "abc", 3), kIoOk);  // still in the buffer
  EXPECT_EQ(closeUnit(kUnit), kIoErrorSystem);
  ASSERT_EQ(openUnit(kUnit, "/dev/full", OpenDisposition::Old, FileForm::Formatted), kIoOk);
  EXPECT_EQ(writeTextRecord(kUnit, std::string(2 * 1024 * 1024, 'l')), kIoErrorSystem);  // beyond the buffer
  EXPECT_EQ(closeUnit(kUnit), kIoErrorSystem);
}

// Bytes registered under a name are read in place of that file's content,
// with the same framing and statuses; writing opens the real file.
TEST_F(RecordRuntime, MemoryFilesStandInForTheirFileWhenRead) {
  const std::string bytes = framedRecord("abc") + framedRecord("de") + "\1\0";
  test::writeFile(path, "");
  setMemoryFile(path, {reinterpret_cast<const unsigned char*>(bytes.data()), bytes.size()});
  ASSERT_EQ(openUnit(kUnit, path, OpenDisposition::Old, FileForm::Unformatted, UnitUse::Read), kIoOk);
  EXPECT_EQ(rec(3), "abc");
  EXPECT_EQ(rec(3), status(kIoErrorRecord));  // shorter than asked
  EXPECT_EQ(rec(2), "de");
  EXPECT_EQ(rec(1), status(kIoErrorRecord));  // cut framing
  EXPECT_EQ(writeRecord(kUnit, "x", 1), kIoErrorUnit);  // memory is never written
  EXPECT_EQ(closeUnit(kUnit), kIoOk);
  setMemoryFile(path, {});
  ASSERT_EQ(openUnit(kUnit, path, OpenDisposition::Old, FileForm::Formatted), kIoOk);
  EXPECT_EQ(line(), status(kIoEnd));
  EXPECT_EQ(closeUnit(kUnit), kIoOk);
  clearMemoryFiles();
  ASSERT_EQ(openUnit(kUnit, path, OpenDisposition::Unknown, FileForm::Formatted), kIoOk);
  EXPECT_EQ(writeTextRecord(kUnit, "real"), kIoOk);
  EXPECT_EQ(closed(), "real\n");
}

}  // namespace
}  // namespace pc::fileio
