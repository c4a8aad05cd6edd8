// The numbered-unit opening routines, and the fatal reports that end a run.
#include "fileio/sequential_open.h"

#include <gtest/gtest.h>
#include <sys/stat.h>

#include <cstdio>
#include <string>
#include <tuple>
#include <vector>

#include "env/configuration_lookup.h"
#include "env/path_expander.h"
#include "fileio/record_runtime.h"
#include "fileio/runtime_fatal.h"
#include "support/test_support.h"

namespace pc::fileio {
namespace {

using test::readFile;

// What a call that ends the process prints on standard output (run in a child).
template <typename F>
std::string fatalReport(const test::TempDir& dir, F call) {
  const std::string out = dir.file("report.txt");
  EXPECT_EXIT({ if (std::freopen(out.c_str(), "w", stdout)) call(); }, ::testing::ExitedWithCode(kFatalStopStatus), "");
  return readFile(out);
}

TEST(RuntimeFatal, MessageText) {
  const std::tuple<std::string, std::vector<int>, std::string> cases[] = {
      // Values take exactly the characters they need, nine at most.
      {"%%", {1, 2}, "12"}, {"%", {123456789}, "123456789"}, {"[%]", {1234567890}, "[*********]"},
      // The text around the marks, blanks included, is kept; a '%' without a value stays.
      {"  a %  ", {7}, "  a 7  "}, {"a=% b=%", {1}, "a=1 b=%"}, {"v=%;", {-12}, "v=-12;"},
      // Beyond 198 characters the framing parenthesis goes, and one character more.
      {std::string(198, 'x'), {}, std::string(198, 'x')}, {std::string(250, 'x'), {}, std::string(198, 'x')},
      // A value growing the field pushes its end out.
      {std::string(197, 'y') + "%", {12345}, std::string(197, 'y') + "1"},
  };
  for (const auto& [tmpl, values, expected] : cases) EXPECT_EQ(fatalMessageText(tmpl, values), expected) << tmpl;
  // A blank routine name leaves out the heading record.
  test::TempDir dir;
  const int values[] = {2, 5};
  EXPECT_EQ(fatalReport(dir, [&] { fatalErrorValues("   ", " iomode= %, err= %", values); }),
            "  iomode= 2, err= 5\n Program terminated.\n");
}

constexpr char kUndefined[] = "$PC_H1_SURELY_UNDEFINED/x";

class SequentialOpen : public ::testing::Test {
 protected:
  // Undefined variables stay undefined: no configuration table is consulted.
  void SetUp() override { previousLookup = setConfigurationLookup(nullptr); }
  void TearDown() override {
    closeAllUnits();
    setConfigurationLookup(previousLookup);
  }

  test::TempDir dir;
  ConfigurationLookup previousLookup = nullptr;
};

TEST_F(SequentialOpen, ModesAndTheLowestFreeUnit) {
  const std::string name = dir.file("f.txt");
  test::writeFile(name, "old\nmore\n");
  ASSERT_EQ(opensq(3, name + "    ", 1), 0);  // a blank-padded field
  ASSERT_EQ(opensq(4, dir.file("b"), 2), 0);
  EXPECT_EQ(freeUnit(), 5);
  std::string line;
  EXPECT_EQ(readTextRecord(3, line), kIoOk);
  EXPECT_EQ(line, "old");
  ASSERT_EQ(opensq(3, name, 2), 0);  // the same unit, now replacing the file
  EXPECT_EQ(readFile(name), "");
  EXPECT_EQ(writeTextRecord(3, "one"), kIoOk);
  EXPECT_EQ(closeUnit(3), kIoOk);
  EXPECT_EQ(freeUnit(), 3);
  ASSERT_EQ(opensq(3, name, -3), 0);
  EXPECT_EQ(writeTextRecord(3, "two"), kIoOk);
  EXPECT_EQ(closeUnit(3), kIoOk);
  EXPECT_EQ(readFile(name), "one\ntwo\n");
}

TEST_F(SequentialOpen, FailuresGiveTheirCodeOrEndTheRun) {
  struct Case {
    std::string name;
    int mode, code;
  };
  std::vector<Case> cases = {{dir.file("missing.txt"), 1, 3}, {dir.path(), 1, 3}, {kUndefined, 1, 3}, {"", 2, 1},
                             {"   ", 3, 1}, {dir.path(), 2, 1}, {dir.file("no/such/dir.txt"), 3, 1}};
  // A file that exists but cannot be deleted.
  if (test::fileExists("/proc/self/status")) cases.push_back({"/proc/self/status", 2, 2});
  // A FIFO is never read (it would block): a file that cannot be opened.
  ASSERT_EQ(::mkfifo(dir.file("fifo").c_str(), 0600), 0);
  cases.push_back({dir.file("fifo"), 1, 1});
  for (const Case& c : cases) {
    EXPECT_EQ(opensq(9, c.name, c.mode), c.code) << c.name << " mode " << c.mode;
    EXPECT_FALSE(isUnitOpen(9)) << c.name;
  }
  // Negative modes and bad modes are fatal. A '%' in the name is printed as
  // it stands; names are cut to 64 characters.
  const std::string name = dir.file("50%" + std::string(80, 'n'));
  EXPECT_EQ(fatalReport(dir, [&] { opensq(5, name, -1); }),
            " Fatal error in opensq : \n Fichier " + name.substr(0, 64) + " iomode= 1, err= 3\n Program terminated.\n");
  EXPECT_EQ(fatalReport(dir, [&] { opensq(5, name, 4); }),
            " Fatal error in opensq(" + name.substr(0, 64) + ") : \n mode=4\n Program terminated.\n");
}

TEST_F(SequentialOpen, UnformattedOpeningAndDeleting) {
  const std::string name = dir.file("contour.bin");
  EXPECT_EQ(openUnformatted(6, name, 1), EXPAND_NOT_FOUND);
  EXPECT_EQ(openUnformatted(6, name, 2), EXPAND_NOT_FOUND);  // created
  EXPECT_EQ(writeRecord(6, "new", 3), kIoOk);
  EXPECT_EQ(openUnformatted(6, name, 1), EXPAND_OK);  // the unit leaves its file first
  EXPECT_EQ(readFile(name), test::framedRecord("new"));
  EXPECT_TRUE(filePresent(name + "  "));
  EXPECT_EQ(openUnformatted(6, name, 2), EXPAND_OK);  // replaced
  EXPECT_EQ(closeUnit(6), kIoOk);
  EXPECT_EQ(readFile(name), "");
  // A name that does not expand creates nothing, whatever the mode.
  EXPECT_EQ(openUnformatted(6, kUndefined, 2), EXPAND_UNDEFINED);
  EXPECT_EQ(openUnformatted(6, "$(PC_H1/x.bin", 2), EXPAND_SYNTAX);
  EXPECT_FALSE(isUnitOpen(6));
  // A good name whose file the system refuses ends the run.
  EXPECT_EQ(fatalReport(dir, [&] { openUnformatted(6, dir.path(), 1); }),
            " Fatal error in openUnformatted : \n Fichier " + dir.path() + " iomode= 1, err= " +
                std::to_string(kIoErrorOpen) + "\n Program terminated.\n");
  EXPECT_EQ(deleteFile("$(" + name), EXPAND_SYNTAX);
  EXPECT_TRUE(test::fileExists(name));
  EXPECT_EQ(deleteFile(name + "   "), EXPAND_OK);
  EXPECT_EQ(deleteFile(name), EXPAND_NOT_FOUND);
  EXPECT_FALSE(filePresent(name) || filePresent(kUndefined));
}

}  // namespace
}  // namespace pc::fileio
