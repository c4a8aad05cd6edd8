#include "tool/line_file_table.h"

#include <gtest/gtest.h>

#include <climits>
#include <string>
#include <tuple>
#include <utility>

#include "support/test_support.h"

namespace pc {
namespace {

using Line = std::pair<std::string, int>;

Line readLine(int handle, std::size_t width) {
  std::string buffer(width, '?');
  int status = 99;
  lineFileReadLine(handle, buffer, status);
  return {buffer, status};
}

TEST(LineFileTable, OpenAndCloseFailures) {
  test::TempDir dir;
  const std::tuple<std::string, int, int> cases[] = {
      {"a", 4, kLineBadMode},           {"a", -4, kLineBadMode},     {"a", INT_MIN, kLineBadMode},
      {"missing", 1, kLineIoError},     {"no/dir", -2, kLineCreateFailed},
      {std::string("x\0y", 3), 2, kLineCreateFailed}};
  for (const auto& [name, mode, expected] : cases) {
    int handle = 7;
    int status = 0;
    lineFileOpen(handle, dir.file(name), mode, status);
    EXPECT_EQ(status, expected) << mode;
    EXPECT_EQ(handle, -1) << mode;
  }
  EXPECT_FALSE(test::fileExists(dir.file("x")));  // not cut at the NUL

  // Mode -2 creates; trailing blanks of the name do not count.
  int handle = -1;
  int status = 0;
  lineFileOpen(handle, dir.file("new") + "     ", -2, status);
  ASSERT_EQ(status, kLineOk);
  EXPECT_TRUE(test::fileExists(dir.file("new")));
  lineFileClose(handle, status);
  EXPECT_EQ(status, kLineOk);
  lineFileClose(handle, status);  // already closed
  EXPECT_EQ(status, kLineIoError);
  EXPECT_EQ(readLine(-1, 3), (Line{"   ", kLineIoError}));
}

TEST(LineFileTable, LineStatuses) {
  test::TempDir dir;
  test::writeFile(dir.file("f"), "ab\r\r\ncd\n\n" + std::string(1022, 'x') + "\n" + std::string(1030, 'y') +
                                     "\nxyz");
  int handle = -1;
  int status = 0;
  lineFileOpen(handle, dir.file("f"), 1, status);
  ASSERT_EQ(status, kLineOk);
  EXPECT_EQ(readLine(handle, 4), (Line{"ab  ", kLineOk}));
  EXPECT_EQ(readLine(handle, 1), (Line{"c", kLineOk}));  // cut to the buffer
  EXPECT_EQ(readLine(handle, 2), (Line{"  ", kLineOk}));
  EXPECT_EQ(readLine(handle, 1100), (Line{std::string(1022, 'x') + std::string(78, ' '), kLineOk}));
  EXPECT_EQ(readLine(handle, 1100), (Line{std::string(1023, 'y') + std::string(77, ' '), kLineTooLong}));
  EXPECT_EQ(readLine(handle, 10), (Line{"yyyyyyy   ", kLineOk}));  // the rest of that line
  EXPECT_EQ(readLine(handle, 5), (Line{"xyz  ", kLinePartial}));
  EXPECT_EQ(readLine(handle, 5), (Line{"     ", kLineEnd}));
  lineFileClose(handle, status);

  // A directory opens on some systems but cannot be read as lines.
  lineFileOpen(handle, dir.path(), 1, status);
  if (status == kLineOk) {
    EXPECT_EQ(readLine(handle, 2).second, kLineIoError);
    lineFileClose(handle, status);
  }
}

TEST(LineFileTable, HandlesAreTheLowestFreeEntries) {
  test::TempDir dir;
  test::writeFile(dir.file("f"), "keep\n");
  int status = 0;
  for (int i = 0; i < kLineFileSlots; ++i) {
    int h = -1;
    lineFileOpen(h, dir.file("f"), 1, status);
    ASSERT_EQ(h, i);
  }
  // A full table refuses without touching the file, even in "w+b".
  int h = 5;
  lineFileOpen(h, dir.file("f"), 2, status);
  EXPECT_EQ(status, kLineCreateFailed);
  EXPECT_EQ(h, -1);
  lineFileOpen(h, dir.file("f"), 1, status);
  EXPECT_EQ(status, kLineIoError);
  EXPECT_EQ(test::readFile(dir.file("f")), "keep\n");

  lineFileClose(42, status);
  lineFileOpen(h, dir.file("f"), 1, status);
  EXPECT_EQ(h, 42);
  for (int i = 0; i < kLineFileSlots; ++i) lineFileClose(i, status);
}

}  // namespace
}  // namespace pc
