#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "fileio/record_runtime.h"
#include "output/record_contour_file.h"
#include "output_fixture.h"

namespace pc {
namespace {

using test::pack;
using test::square;

const std::string kSeparator = test::framedRecord(pack(99999.0f, 99999.0f, 99999.0f, -1001, std::int16_t{0}));

std::string points(const std::vector<Point>& pts, float z) {
  std::string r;
  for (const Point& p : pts) r += test::framedRecord(pack(p.x, p.y, z, -1003, std::int16_t{1}));
  return r;
}

class RecordContourFile : public testing::Test {
 protected:
  test::TempDir dir;
  test::ScopedEnv tmp{"TRXTMPDIR", dir.path()};
  test::OutlineFixture model;
  int result = 0;

  std::string path() const { return dir.file("contour.bin"); }
  std::string write(const CheckedArray<Pocket*>& list) {
    return test::console([&] { return writeRecordContourFile(list); }, result);
  }
};

TEST_F(RecordContourFile, OneSquarePocketGivesSevenRecords) {
  test::writeFile(path(), std::string(300, 'x'));  // an earlier file is replaced
  EXPECT_EQ(write(test::pocketList({model.pocket(square(1, 2, 3), 5.0f)})), "");
  EXPECT_EQ(result, 0);
  const std::string bytes = test::readFile(path());
  EXPECT_EQ(bytes.size(), 7u * 26);
  EXPECT_EQ(bytes, kSeparator + points(square(1, 2, 3), 5.0f) + kSeparator);
}

TEST_F(RecordContourFile, PocketsAndIslandsFollowOneAnotherBetweenSeparators) {
  Pocket* first = model.pocket(square(0, 0, 20), -2.5f, {square(2, 2, 3)});
  write(test::pocketList({first, model.pocket(square(50, 0, 5), 7.0f)}));
  EXPECT_EQ(result, 0);
  EXPECT_EQ(test::readFile(path()), kSeparator + points(square(0, 0, 20), -2.5f) + kSeparator +
                                        points(square(2, 2, 3), -2.5f) + kSeparator +
                                        points(square(50, 0, 5), 7.0f) + kSeparator);
}

TEST_F(RecordContourFile, OpenContourStillClosesTheFileWithItsFinalSeparator) {
  Pocket* good = model.pocket(square(0, 0, 10), 4.0f, {{{1, 1}, {2, 1}, {1, 1}}});  // island blanked
  const std::string out = write(test::pocketList({good, model.pocket(test::kOpenSquare, 2.0f), good}));
  EXPECT_EQ(result, -1);
  EXPECT_NE(out.find("*** OPEN CONTOUR (5 pts)"), std::string::npos);
  EXPECT_EQ(test::readFile(path()), kSeparator + points(square(0, 0, 10), 4.0f) + kSeparator + kSeparator +
                                        kSeparator + kSeparator + kSeparator);
}

TEST_F(RecordContourFile, EmptyListLeavesAnExistingFileAlone) {
  test::writeFile(path(), "tagged result of an earlier run");
  write(CheckedArray<Pocket*>(0, 1000));
  EXPECT_EQ(result, 0);
  EXPECT_EQ(test::readFile(path()), "tagged result of an earlier run");
}

int noFreeUnit() { return -1; }
bool neverOpen(int) { return false; }
int refuseRecord(int, const void*, std::size_t) { return 5; }
int refuseClose(int unit, bool deleteFile) {
  fileio::closeUnit(unit, deleteFile);
  return 5;
}

using RecordContourFileDeathTest = RecordContourFile;

TEST_F(RecordContourFileDeathTest, FileThatCannotBeCreatedOrWrittenEndsTheRun) {
  auto list = test::pocketList({model.pocket(square(0, 0, 10), 1.0f)});
  const std::string report = "^\\*\\*\\* Cannot open file " + test::regexQuote(path()) + " in mode wb\\.\n$";
  std::vector<RecordUnitOps> failures(4, defaultRecordUnitOps());
  failures[0].freeUnit = noFreeUnit;
  failures[1].isUnitOpen = neverOpen;
  failures[2].writeRecord = refuseRecord;
  failures[3].closeUnit = refuseClose;
  for (const RecordUnitOps& ops : failures) {
    recordUnitOps() = ops;
    EXPECT_EXIT(
        {
          test::sendStdoutToStderr();
          writeRecordContourFile(list);
        },
        testing::ExitedWithCode(255), report);
  }
  recordUnitOps() = defaultRecordUnitOps();
  // A file the system refuses is reported before the unit layer could end
  // the run with a runtime error of its own.
  std::filesystem::remove(path());
  std::filesystem::create_directories(path() + "/keep");  // no file can take its place
  for (const OutputFileHooks& hooks : {test::failingHooks()[0], defaultOutputFileHooks()}) {
    test::ScopedOutputHooks scoped(hooks);
    EXPECT_EXIT(
        {
          test::sendStdoutToStderr();
          writeRecordContourFile(list);
        },
        testing::ExitedWithCode(255), report);
  }
}

}  // namespace
}  // namespace pc
