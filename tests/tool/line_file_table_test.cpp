#include "tool/line_file_table.h"

#include <gtest/gtest.h>
#include <sys/stat.h>

#include <climits>
#include <tuple>
#include <utility>

#include "fileio/memory_files.h"
#include "support/test_support.h"

namespace pc {
namespace {

using Opened = std::pair<int, int>;         // handle, status
using Line = std::pair<std::string, int>;  // buffer, status

Opened openFile(const std::string& name, int mode) {
  Opened result{7, 99};
  lineFileOpen(result.first, name, mode, result.second);
  return result;
}

int closeFile(int handle) {
  int status = 99;
  lineFileClose(handle, status);
  return status;
}

Line readLine(int handle, std::size_t width) {
  Line result{std::string(width, '?'), 99};
  lineFileReadLine(handle, result.first, result.second);
  return result;
}

TEST(LineFileTable, OpenCloseHandlesAndLineStatuses) {
  test::TempDir dir;
  const std::tuple<std::string, int, int> failures[] = {
      {"a", 4, kLineBadMode}, {"a", -4, kLineBadMode}, {"a", INT_MIN, kLineBadMode}, {"missing", 1, kLineIoError},
      {"no/dir", -2, kLineCreateFailed}, {std::string("x\0y", 3), 2, kLineCreateFailed}};
  for (const auto& [name, mode, status] : failures) EXPECT_EQ(openFile(dir.file(name), mode), (Opened{-1, status}));
  EXPECT_FALSE(test::fileExists(dir.file("x")));  // not cut at the NUL

  // Mode -2 creates; trailing blanks of the name do not count.
  const auto [created, createStatus] = openFile(dir.file("f") + "     ", -2);
  ASSERT_EQ(createStatus, kLineOk);
  EXPECT_TRUE(test::fileExists(dir.file("f")));
  test::writeFile(dir.file("f"), "keep\n");
  EXPECT_EQ(closeFile(created), kLineOk);
  EXPECT_EQ(closeFile(created), kLineIoError);  // already closed
  EXPECT_EQ(readLine(-1, 3), (Line{"   ", kLineIoError}));

  // Handles are the lowest free entries. A full table refuses without
  // touching the file, even in "w+b".
  for (int i = 0; i < kLineFileSlots; ++i) ASSERT_EQ(openFile(dir.file("f"), 1).first, i);
  EXPECT_EQ(openFile(dir.file("f"), 2), (Opened{-1, kLineCreateFailed}));
  EXPECT_EQ(openFile(dir.file("f"), 1), (Opened{-1, kLineIoError}));
  EXPECT_EQ(test::readFile(dir.file("f")), "keep\n");
  EXPECT_EQ(closeFile(42), kLineOk);
  EXPECT_EQ(openFile(dir.file("f"), 1), (Opened{42, kLineOk}));
  for (int i = 0; i < kLineFileSlots; ++i) closeFile(i);

  // Every status of a line read.
  test::writeFile(dir.file("f"), "ab\r\r\ncd\n\n" + std::string(1022, 'x') + "\n" + std::string(1030, 'y') +
                                     "\nxyz");
  const auto [handle, status] = openFile(dir.file("f"), 1);
  ASSERT_EQ(status, kLineOk);
  EXPECT_EQ(readLine(handle, 4), (Line{"ab  ", kLineOk}));
  EXPECT_EQ(readLine(handle, 1), (Line{"c", kLineOk}));  // cut to the buffer
  EXPECT_EQ(readLine(handle, 2), (Line{"  ", kLineOk}));
  EXPECT_EQ(readLine(handle, 1100), (Line{std::string(1022, 'x') + std::string(78, ' '), kLineOk}));
  EXPECT_EQ(readLine(handle, 1100), (Line{std::string(1023, 'y') + std::string(77, ' '), kLineTooLong}));
  EXPECT_EQ(readLine(handle, 10), (Line{"yyyyyyy   ", kLineOk}));  // the rest of that line
  EXPECT_EQ(readLine(handle, 5), (Line{"xyz  ", kLinePartial}));
  EXPECT_EQ(readLine(handle, 5), (Line{"     ", kLineEnd}));
  closeFile(handle);

  // Nothing but a regular file is opened to be read, and nothing blocks: a
  // directory, a FIFO or a device is a file that cannot be opened.
  const std::string fifo = dir.file("fifo");
  ASSERT_EQ(::mkfifo(fifo.c_str(), 0600), 0);
  for (const std::string& name : {dir.path(), fifo, std::string("/dev/zero")}) {
    for (const int mode : {0, 1}) EXPECT_EQ(openFile(name, mode), (Opened{-1, kLineIoError})) << name;
  }

  // Bytes registered under the name stand in for the file when it is read.
  const std::string bytes = "one\ntwo";
  fileio::setMemoryFile(dir.file("f"), {reinterpret_cast<const unsigned char*>(bytes.data()), bytes.size()});
  const auto [memory, memoryStatus] = openFile(dir.file("f"), 1);
  ASSERT_EQ(memoryStatus, kLineOk);
  EXPECT_EQ(readLine(memory, 4), (Line{"one ", kLineOk}));
  EXPECT_EQ(readLine(memory, 4), (Line{"two ", kLinePartial}));
  closeFile(memory);
  fileio::clearMemoryFiles();
}

}  // namespace
}  // namespace pc
