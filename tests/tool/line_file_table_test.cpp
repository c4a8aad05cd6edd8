#include "tool/line_file_table.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "support/test_support.h"

namespace pc {
namespace {

struct Line {
  std::string text;
  int status;
  bool operator==(const Line&) const = default;
};

Line readLine(int handle, std::size_t width) {
  std::string buffer(width, '?');
  int status = 99;
  lineFileReadLine(handle, buffer, status);
  return {buffer, status};
}

void PrintTo(const Line& l, std::ostream* os) { *os << '"' << l.text << "\" status " << l.status; }

TEST(LineFileTable, OpenModesAndFailures) {
  test::TempDir dir;
  int handle = 7;
  int status = 0;
  for (const int mode : {4, -4, 2147483647, -2147483647 - 1}) {
    lineFileOpen(handle, dir.file("a"), mode, status);
    EXPECT_EQ(status, kLineBadMode) << mode;
    EXPECT_EQ(handle, -1);
  }
  lineFileOpen(handle, dir.file("missing"), 1, status);
  EXPECT_EQ(status, kLineIoError);
  lineFileOpen(handle, dir.file("missing"), 0, status);
  EXPECT_EQ(status, kLineIoError);
  lineFileOpen(handle, dir.file("no/such/dir"), -2, status);
  EXPECT_EQ(status, kLineCreateFailed);
  EXPECT_EQ(handle, -1);
  lineFileOpen(handle, std::string("x\0y", 3), 2, status);
  EXPECT_EQ(status, kLineCreateFailed);
  EXPECT_FALSE(test::fileExists("x"));

  // Mode -2 creates; trailing blanks of the name do not count.
  lineFileOpen(handle, dir.file("new") + "     ", -2, status);
  ASSERT_EQ(status, kLineOk);
  EXPECT_TRUE(test::fileExists(dir.file("new")));
  lineFileClose(handle, status);
  EXPECT_EQ(status, kLineOk);
  lineFileClose(handle, status);  // already closed
  EXPECT_EQ(status, kLineIoError);
  lineFileClose(100, status);
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
    EXPECT_EQ(readLine(handle, 2).status, kLineIoError);
    lineFileClose(handle, status);
  }
}

TEST(LineFileTable, HandlesAreTheLowestFreeEntries) {
  test::TempDir dir;
  test::writeFile(dir.file("f"), "keep\n");
  std::vector<int> handles;
  int status = 0;
  for (int i = 0; i < kLineFileSlots; ++i) {
    int h = -1;
    lineFileOpen(h, dir.file("f"), 1, status);
    ASSERT_EQ(status, kLineOk);
    EXPECT_EQ(h, i);
    handles.push_back(h);
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
  for (const int each : handles) lineFileClose(each, status);
}

}  // namespace
}  // namespace pc
