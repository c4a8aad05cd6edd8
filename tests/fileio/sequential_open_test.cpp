#include "fileio/sequential_open.h"

#include <gtest/gtest.h>

#include <cstdio>
#include <cstdlib>
#include <string>

#include "env/configuration_lookup.h"
#include "env/path_expander.h"
#include "fileio/record_runtime.h"
#include "fileio/runtime_fatal.h"
#include "support/test_support.h"

namespace pc::fileio {
namespace {

using test::readFile;
using test::writeFile;

constexpr char kUndefined[] = "$PC_H1_SURELY_UNDEFINED/x";

class SequentialOpen : public ::testing::Test {
 protected:
  // Undefined variables stay undefined: no configuration table is consulted.
  void SetUp() override { previousLookup = setConfigurationLookup(nullptr); }
  void TearDown() override {
    closeAllUnits();
    setConfigurationLookup(previousLookup);
  }
  // The records a call prints before the process ends (run in a child).
  template <typename F>
  std::string fatalReport(F call) {
    const std::string out = dir.file("report.txt");
    EXPECT_EXIT(
        {
          if (!std::freopen(out.c_str(), "w", stdout)) std::abort();
          call();
        },
        ::testing::ExitedWithCode(kFatalStopStatus), "");
    return readFile(out);
  }

  test::TempDir dir;
  ConfigurationLookup previousLookup = nullptr;
};

TEST_F(SequentialOpen, FreeUnitIsTheLowestClosedNumberFromThree) {
  EXPECT_EQ(freeUnit(), 3);
  ASSERT_EQ(opensq(3, dir.file("a"), 2), 0);
  ASSERT_EQ(opensq(4, dir.file("b"), 2), 0);
  EXPECT_EQ(freeUnit(), 5);
  closeUnit(3);
  EXPECT_EQ(freeUnit(), 3);
}

TEST_F(SequentialOpen, ReadWriteAndAppendModes) {
  const std::string name = dir.file("f.txt");
  writeFile(name, "old\nmore\n");
  ASSERT_EQ(opensq(7, name + "    ", 1), 0);  // a blank-padded field
  std::string line;
  EXPECT_EQ(readTextRecord(7, line), kIoOk);
  EXPECT_EQ(line, "old");
  ASSERT_EQ(opensq(7, name, 2), 0);  // the same unit, now replacing the file
  EXPECT_EQ(readFile(name), "");
  EXPECT_EQ(writeTextRecord(7, "one"), kIoOk);
  EXPECT_EQ(writeTextRecord(7, "two"), kIoOk);
  EXPECT_EQ(closeUnit(7), kIoOk);
  ASSERT_EQ(opensq(7, name, -3), 0);
  EXPECT_EQ(writeTextRecord(7, "three"), kIoOk);
  EXPECT_EQ(closeUnit(7), kIoOk);
  EXPECT_EQ(readFile(name), "one\ntwo\nthree\n");
}

TEST_F(SequentialOpen, FailuresGiveTheirCodeAndLeaveTheUnitClosed) {
  EXPECT_EQ(opensq(9, dir.file("missing.txt"), 1), 3);
  EXPECT_EQ(opensq(9, dir.path(), 1), 3);  // a directory is not a file
  EXPECT_EQ(opensq(9, kUndefined, 1), 3);
  EXPECT_EQ(opensq(9, "", 2), 1);
  EXPECT_EQ(opensq(9, "   ", 3), 1);
  EXPECT_EQ(opensq(9, dir.path(), 2), 1);
  EXPECT_EQ(opensq(9, dir.file("no/such/dir.txt"), 3), 1);
  EXPECT_FALSE(isUnitOpen(9));
  if (test::fileExists("/proc/self/status")) {  // exists, cannot be deleted
    EXPECT_EQ(opensq(9, "/proc/self/status", 2), 2);
    EXPECT_FALSE(isUnitOpen(9));
  }
}

TEST_F(SequentialOpen, NegativeModesAndBadModesAreFatal) {
  const std::string missing = dir.file("missing.dat");
  const std::string tail = " iomode= 1, err= 3\n Program terminated.\n";
  EXPECT_EQ(fatalReport([&] { opensq(5, missing, -1); }), " Fatal error in opensq : \n Fichier " + missing + tail);
  EXPECT_EQ(fatalReport([&] { opensq(5, dir.path(), -3); }),
            " Fatal error in opensq : \n Fichier " + dir.path() + " iomode= 3, err= 1\n Program terminated.\n");
  EXPECT_EQ(fatalReport([&] { opensq(5, missing, 4); }),
            " Fatal error in opensq(" + missing + ") : \n mode=4\n Program terminated.\n");
  // A '%' in the name is printed as it stands; names are cut to 64 characters.
  const std::string percent = dir.file("50%.dat");
  EXPECT_EQ(fatalReport([&] { opensq(5, percent, -1); }), " Fatal error in opensq : \n Fichier " + percent + tail);
  const std::string longName = dir.file(std::string(80, 'n'));
  EXPECT_EQ(fatalReport([&] { opensq(5, longName, -1); }),
            " Fatal error in opensq : \n Fichier " + longName.substr(0, 64) + tail);
}

TEST_F(SequentialOpen, FilePresentAndDeleteFile) {
  const std::string name = dir.file("here.dat");
  writeFile(name, "x");
  EXPECT_TRUE(filePresent(name + "  "));
  EXPECT_FALSE(filePresent(kUndefined));
  EXPECT_EQ(deleteFile("$(" + name), EXPAND_SYNTAX);
  EXPECT_TRUE(test::fileExists(name));
  EXPECT_EQ(deleteFile(name + "   "), EXPAND_OK);
  EXPECT_FALSE(filePresent(name));
  EXPECT_EQ(deleteFile(name), EXPAND_NOT_FOUND);
}

TEST_F(SequentialOpen, UnformattedOpening) {
  const std::string name = dir.file("contour.bin");
  EXPECT_EQ(openUnformatted(6, name, 1), EXPAND_NOT_FOUND);
  EXPECT_FALSE(isUnitOpen(6));
  EXPECT_EQ(openUnformatted(6, name, 2), EXPAND_NOT_FOUND);  // created
  EXPECT_EQ(writeRecord(6, "new", 3), kIoOk);
  EXPECT_EQ(closeUnit(6), kIoOk);
  EXPECT_EQ(readFile(name), test::framedRecord("new"));
  EXPECT_EQ(openUnformatted(6, name, 1), EXPAND_OK);
  char got[3] = {};
  EXPECT_EQ(readRecord(6, got, 3), kIoOk);
  EXPECT_EQ(std::string(got, 3), "new");
  EXPECT_EQ(openUnformatted(6, name, 2), EXPAND_OK);  // replaced
  EXPECT_EQ(closeUnit(6), kIoOk);
  EXPECT_EQ(readFile(name), "");
  // A name that does not expand creates nothing, whatever the mode.
  EXPECT_EQ(openUnformatted(6, kUndefined, 2), EXPAND_UNDEFINED);
  EXPECT_EQ(openUnformatted(6, "$(PC_H1/x.bin", 2), EXPAND_SYNTAX);
  EXPECT_FALSE(isUnitOpen(6));
  // A good name whose file the system refuses ends the run.
  EXPECT_EQ(fatalReport([&] { openUnformatted(6, dir.path(), 1); }),
            " Fatal error in openUnformatted : \n Fichier " + dir.path() + " iomode= 1, err= " +
                std::to_string(kIoErrorOpen) + "\n Program terminated.\n");
}

}  // namespace
}  // namespace pc::fileio
