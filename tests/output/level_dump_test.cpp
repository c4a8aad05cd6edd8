#include <gtest/gtest.h>

#include <cstdio>
#include <string>
#include <vector>

#include "output/level_dump.h"
#include "output_fixture.h"

namespace pc {
namespace {

using test::pack;
using test::square;

const std::string kSeparator = pack(0, 0, 99999.0, 99999.0);

std::string outline(const std::vector<Point>& points) {
  std::string r = kSeparator;
  for (const Point& p : points) r += pack(1, 0, double{p.x}, double{p.y});
  return r;
}
std::string indexEntry(std::int32_t level, std::int32_t records, std::int32_t offset, double z) {
  return pack(level, records, records, offset, records, 0, z);
}

int writeCalls = 0;
int failingWriteCall = 0;
std::size_t failOneWrite(const void* data, std::size_t size, std::FILE* file) {
  return ++writeCalls == failingWriteCall ? 0 : std::fwrite(data, 1, size, file);
}

class LevelDump : public testing::Test {
 protected:
  test::TempDir dir;
  test::ScopedEnv tmp{"TRXTMPDIR", dir.path()};
  test::OutlineFixture model;  // the contours; the levels own their nodes
  std::vector<ZLevel> levels{3};
  int result = 0;

  ContourNode* add(std::size_t level, std::vector<Point> points, float z, ContourNode* parent = nullptr) {
    auto* node = new ContourNode;
    node->contour = model.contour(std::move(points), z);
    node->parent = parent;
    ContourNode** link = parent != nullptr ? &parent->firstChild : &levels[level].root;
    while (*link != nullptr) link = &(*link)->nextSibling;
    return *link = node;
  }
  std::string dump(std::int32_t count) {
    return test::console([&] { return writeLevelDump(levels.data(), count); }, result);
  }
  std::string written() const { return test::readFile(dir.file("wlevel.tmp")); }
};

TEST_F(LevelDump, OneSquareLevelTakes192Bytes) {
  add(0, square(1, 2, 3), 7.5f);
  EXPECT_EQ(dump(1), "");
  EXPECT_EQ(result, 1);
  const std::string bytes = written();
  EXPECT_EQ(bytes.size(), 192u);
  EXPECT_EQ(bytes, pack(1, 6, 1) + outline(square(1, 2, 3)) + indexEntry(0, 6, 12, 7.5) + pack(0));
}

TEST_F(LevelDump, IslandsNestedOuterContoursAndSecondLevelOffset) {
  ContourNode* a = add(0, square(0, 0, 100), 4.0f);
  ContourNode* island = add(0, square(10, 10, 40), 4.0f, a);
  add(0, square(60, 60, 5), 4.0f, a);
  add(0, square(20, 20, 5), 4.0f, island);  // an outer contour inside an island
  add(0, square(200, 0, 10), 4.25f);
  add(1, square(1, 1, 8), 2.0f);
  dump(2);
  EXPECT_EQ(result, 1);
  EXPECT_EQ(written(), pack(2, 36, 1) + outline(square(0, 0, 100)) + outline(square(10, 10, 40)) +
                           outline(square(60, 60, 5)) + outline(square(20, 20, 5)) + outline(square(200, 0, 10)) +
                           outline(square(1, 1, 8)) + indexEntry(0, 30, 12, 4.25) +
                           indexEntry(1, 6, 12 + 24 * 30, 2.0) + pack(0, 1));
}

TEST_F(LevelDump, OpenContourOnTheLastLevelKeepsTheLevelsBefore) {
  add(0, square(0, 0, 10), 3.0f);
  add(1, square(0, 0, 8), 2.0f);
  add(1, {{1, 1}, {2, 1}, {1, 1}}, 2.0f);  // too short: blanked, still one record per entry
  add(2, test::kOpenSquare, 1.0f);
  const std::string out = dump(3);
  EXPECT_EQ(result, -1);
  EXPECT_NE(out.find("*** OPEN CONTOUR (5 pts)\n*** First Point : X=0.000 Y=0.000 Z=1.000\n"), std::string::npos);
  EXPECT_EQ(written(), pack(2, 16, 1) + outline(square(0, 0, 10)) + outline(square(0, 0, 8)) + kSeparator +
                           kSeparator + kSeparator + kSeparator + indexEntry(0, 6, 12, 3.0) +
                           indexEntry(1, 10, 12 + 24 * 6, 2.0) + pack(0, 1));
}

TEST_F(LevelDump, LevelWhoseRecordsCannotBeWrittenLosesOnlyItsIndexEntry) {
  for (std::size_t i = 0; i < 3; ++i) add(i, square(0, 0, 10.0f + static_cast<float>(i)), static_cast<float>(i));
  writeCalls = 0;
  failingWriteCall = 3;  // header, level 0, then level 1 fails
  OutputFileHooks failing = defaultOutputFileHooks();
  failing.write = failOneWrite;
  test::ScopedOutputHooks hooks(failing);
  dump(3);
  EXPECT_EQ(result, 1);
  const std::string bytes = written();
  ASSERT_EQ(bytes.size(), 12u + 24 * 18 + 64 + 8);
  EXPECT_EQ(bytes.substr(0, 12), pack(2, 18, 0));
  EXPECT_EQ(bytes.substr(12 + 24 * 12, 24 * 6), outline(square(0, 0, 12)));  // at its own offset
  EXPECT_EQ(bytes.substr(12 + 24 * 18), indexEntry(0, 6, 12, 0.0) + indexEntry(2, 6, 12 + 24 * 12, 2.0) + pack(0, 2));
}

TEST_F(LevelDump, FailuresBeforeTheRecordsOrInTheIndexGiveMinusOne) {
  add(0, square(0, 0, 10), 1.0f);
  std::vector<OutputFileHooks> failures = test::failingHooks();  // no file, no header
  failures[2] = defaultOutputFileHooks();
  failures[2].write = failOneWrite;  // header, level 0, then the index fails
  std::vector<std::string> expected = {"", "", pack(-1, -1, -1) + outline(square(0, 0, 10))};
  for (std::size_t k = 0; k < failures.size(); ++k) {
    writeCalls = 0;
    failingWriteCall = 3;
    test::ScopedOutputHooks hooks(failures[k]);
    dump(1);
    EXPECT_EQ(result, -1) << k;
    EXPECT_EQ(test::fileExists(dir.file("wlevel.tmp")), k > 0) << k;
    EXPECT_EQ(written(), expected[k]) << k;
  }
}

}  // namespace
}  // namespace pc
