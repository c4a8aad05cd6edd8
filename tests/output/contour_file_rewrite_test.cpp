#include <gtest/gtest.h>

#include <string>

#include "output/contour_file_rewrite.h"
#include "output_fixture.h"

namespace pc {
namespace {

using test::pack;
using test::square;

const std::string kMark = pack(256);
const std::string kPocketEnd = pack('e', 0.0f, 0);

std::string contour(const std::vector<Point>& points) {
  std::string r;
  for (const Point& p : points) r += pack('p', p.x, p.y);
  return r + pack('f', 0.0f);
}

class ContourFileRewrite : public testing::Test {
 protected:
  test::TempDir dir;
  test::ScopedEnv tmp{"TRXTMPDIR", dir.path()};
  test::OutlineFixture model;
  int result = 0;

  std::string path() const { return dir.file("contour.bin"); }
  std::string rewrite(const CheckedArray<Pocket*>& list) {
    return test::console([&] { return rewriteContourFile(list); }, result);
  }
};

TEST_F(ContourFileRewrite, OneSquarePocketAtZ127Takes72Bytes) {
  test::writeFile(path(), std::string(500, 'x'));  // replaced, not appended to
  EXPECT_EQ(rewrite(test::pocketList({model.pocket(square(1, 2, 3), 12.7f)})), "");
  EXPECT_EQ(result, 0);
  const std::string bytes = test::readFile(path());
  EXPECT_EQ(bytes.size(), 72u);
  EXPECT_EQ(bytes, kMark + pack('n', 12.7f, 12) + contour(square(1, 2, 3)) + kPocketEnd);
}

TEST_F(ContourFileRewrite, IslandsAndNegativeZ) {
  Pocket* first = model.pocket(square(0, 0, 20), -0.5f, {square(2, 2, 3), square(10, 10, 4)});
  Pocket* second = model.pocket(square(50, 0, 5), -7.9f);
  rewrite(test::pocketList({first, second}));
  EXPECT_EQ(result, 0);
  EXPECT_EQ(test::readFile(path()), kMark + pack('n', -0.5f, 0) + contour(square(0, 0, 20)) +
                                        contour(square(2, 2, 3)) + contour(square(10, 10, 4)) + kPocketEnd +
                                        pack('n', -7.9f, -7) + contour(square(50, 0, 5)) + kPocketEnd);
}

TEST_F(ContourFileRewrite, EmptyListLeavesAnExistingFileAlone) {
  test::writeFile(path(), "earlier result");
  rewrite(CheckedArray<Pocket*>(0, 1000));
  EXPECT_EQ(result, 0);
  EXPECT_EQ(test::readFile(path()), "earlier result");
}

TEST_F(ContourFileRewrite, OpenContourKeepsThePocketsWrittenBefore) {
  Pocket* good = model.pocket(square(0, 0, 10), 4.0f, {{{1, 1}, {2, 1}, {1, 1}}});  // island too short: dropped
  const std::string out = rewrite(test::pocketList({good, model.pocket(test::kOpenSquare, 2.0f)}));
  EXPECT_EQ(result, -1);
  EXPECT_NE(out.find("*** OPEN CONTOUR (5 pts)"), std::string::npos);
  EXPECT_EQ(test::readFile(path()), kMark + pack('n', 4.0f, 4) + contour(square(0, 0, 10)) + kPocketEnd);
}

TEST(TaggedFile, EveryTagWritesItsPayloadAndUnknownTagsNothing) {
  test::TempDir dir;
  const std::string path = dir.file("t.bin");
  TaggedFile file = openTaggedFile(path.c_str(), "w+b");
  int written = 0;
  for (char tag : {'b', 'p', 'c', 'r', 'd', 'm', 'e', 'n', 'f', 'q', 'P'}) {
    written += writeTaggedRecord(file, tag, -3.75f, 1e12f);
  }
  closeTaggedFile(file);
  EXPECT_EQ(written, 9);
  EXPECT_EQ(test::readFile(path), kMark + pack('b', -3.75f, 1e12f, 'p', -3.75f, 1e12f) +
                                      pack('c', -3, 2147483647, 'r', -3, 2147483647) + pack('d', -3, 'm', -3) +
                                      pack('e', -3.75f, 2147483647, 'n', -3.75f, 2147483647) + pack('f', -3.75f));
}

TEST(TaggedFile, UpdateModeReadsTheByteOrderMark) {
  test::TempDir dir;
  test::writeFile(dir.file("same.bin"), kMark);
  test::writeFile(dir.file("swapped.bin"), pack(65536));
  TaggedFile same = openTaggedFile(dir.file("same.bin").c_str(), "r+b");
  TaggedFile swapped = openTaggedFile(dir.file("swapped.bin").c_str(), "r+b");
  EXPECT_FALSE(same.swapBytes);
  EXPECT_TRUE(swapped.swapBytes);
  writeTaggedRecord(same, 'd', 5.0f, 0.0f);  // after the mark
  closeTaggedFile(same);
  closeTaggedFile(swapped);
  EXPECT_EQ(test::readFile(dir.file("same.bin")), kMark + pack('d', 5));
}

using ContourFileRewriteDeathTest = ContourFileRewrite;

TEST_F(ContourFileRewriteDeathTest, FileThatCannotBeCreatedOrWrittenEndsTheRun) {
  auto list = test::pocketList({model.pocket(square(0, 0, 10), 1.0f)});
  const std::string report = "^\\*\\*\\* Cannot open file " + test::regexQuote(path()) + " in mode w\\+b\\.\n$";
  for (const OutputFileHooks& hooks : test::failingHooks()) {
    test::ScopedOutputHooks scoped(hooks);
    EXPECT_EXIT(
        {
          test::sendStdoutToStderr();
          rewriteContourFile(list);
        },
        testing::ExitedWithCode(255), report);
  }
}

}  // namespace
}  // namespace pc
