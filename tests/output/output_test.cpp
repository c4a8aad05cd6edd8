// The outputs of the ordered pockets and of the levels: the exact bytes of
// every file form, the text fields and outline check they share, and the
// loss of a file.
#include <gtest/gtest.h>
#include <unistd.h>

#include <cctype>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <deque>
#include <filesystem>
#include <functional>
#include <string>
#include <vector>

#include "contours/zcontour.h"
#include "output/contour_file_rewrite.h"
#include "output/fixed_format.h"
#include "output/level_dump.h"
#include "output/outline_check.h"
#include "output/output_file.h"
#include "output/pocket_result_file.h"
#include "output/record_contour_file.h"
#include "output/tagged_file.h"
#include "pockets/pocket_model.h"
#include "support/platform_conventions.h"
#include "support/test_support.h"

namespace pc {
namespace {

using Contour = std::vector<Point>;
constexpr Point S = kSeparatorPoint;

// A closed square of five points from (x0, y0).
Contour square(float x0, float y0, float side) {
  return {{x0, y0}, {x0 + side, y0}, {x0 + side, y0 + side}, {x0, y0 + side}, {x0, y0}};
}
const Contour kOpenSquare = {{0, 0}, {4, 0}, {4, 4}, {0, 4}, {0, 1}};
const Contour kShortRun = {{1, 1}, {2, 1}, {1, 1}};  // blanked by the outline check
const std::string kBar = "**************************************\n";

// Little-endian bytes of the values in order (char, int16, int32, float, double).
void packOne(std::string& s, char v) { s += v; }
void packOne(std::string& s, std::int16_t v) { test::putInt16(s, v); }
void packOne(std::string& s, std::int32_t v) { test::putInt32(s, v); }
void packOne(std::string& s, float v) { test::putFloat(s, v); }
void packOne(std::string& s, double v) { test::putDouble(s, v); }
template <typename... T>
std::string pack(T... values) {
  std::string s;
  (packOne(s, values), ...);
  return s;
}

std::FILE* refuseOpen(const char*, const char*) { return nullptr; }
std::size_t refuseWrite(const void*, std::size_t, std::FILE*) { return 0; }
int refuseClose(std::FILE* file) {
  std::fclose(file);
  return EOF;
}
int writeCalls = 0;
int failingWriteCall = 0;
std::size_t failOneWrite(const void* data, std::size_t size, std::FILE* file) {
  return ++writeCalls == failingWriteCall ? 0 : std::fwrite(data, 1, size, file);
}

// A temporary directory as $TMP and current directory, and the contours,
// pockets and levels written (addresses stay put). File hooks are reset after.
class Outputs : public testing::Test {
 protected:
  Outputs() { std::filesystem::current_path(dir.path()); }
  ~Outputs() override {
    std::filesystem::current_path(oldDir);
    outputFileHooks() = defaultOutputFileHooks();
  }

  // Gives `node` a contour of `pts` at `z` and appends it to the chain at `chain`.
  ContourNode* link(ContourNode* node, ContourNode** chain, Contour pts, float z, ContourNode* parent) {
    const auto count = static_cast<std::int32_t>(pts.size());
    fill(contours.emplace_back(), points.emplace_back(std::move(pts)).data(), count, z);
    *node = {.contour = &contours.back(), .parent = parent};
    while (*chain != nullptr) chain = &(*chain)->nextSibling;
    return *chain = node;
  }
  // Islands get another Z than their outer contour: the outputs must not use it.
  Pocket* pocket(Contour outer, float z, std::vector<Contour> islands = {}) {
    ContourNode* n = link(&nodes.emplace_back(), &pockets.emplace_back().node, std::move(outer), z, nullptr);
    for (Contour& island : islands) link(&nodes.emplace_back(), &n->firstChild, std::move(island), z + 1.0f, n);
    return &pockets.back();
  }
  // A contour of `level`, inside `parent` if any; the level owns the node.
  ContourNode* add(std::size_t level, Contour pts, float z, ContourNode* parent = nullptr) {
    return link(new ContourNode, parent ? &parent->firstChild : &levels[level].root, std::move(pts), z, parent);
  }
  static CheckedArray<Pocket*> list(std::initializer_list<Pocket*> items) {
    CheckedArray<Pocket*> list(static_cast<std::int32_t>(items.size()), 1000);
    for (Pocket* p : items) list.append(p);
    return list;
  }
  // Standard output of `run()`, its result going to `result`.
  template <typename F>
  std::string console(F run) {
    testing::internal::CaptureStdout();
    result = run();
    std::fflush(stdout);
    return testing::internal::GetCapturedStdout();
  }
  std::string written(const std::string& name) const { return test::readFile(dir.file(name)); }

  std::filesystem::path oldDir = std::filesystem::current_path();
  test::TempDir dir;
  test::ScopedEnv tmp{"TRXTMPDIR", dir.path()};
  std::deque<Contour> points;
  std::deque<ZContour> contours;
  std::deque<ContourNode> nodes;
  std::deque<Pocket> pockets;
  std::vector<ZLevel> levels{3};
  int result = 0;
};

TEST(FixedFormat, MatchesPrintfOnTiesSignsHugeAndPseudoRandomValues) {
  std::vector<float> values = {0.0f,   -0.0f,    0.0625f, -0.0625f,   0.0005f,    1.0005f, -0.0004f, 12.5f,
                               -3.25f, 99999.0f, 0.1875f, 8388607.5f, 9.9999e11f, 1.0e12f, -3.0e38f, 1.0e-40f};
  std::vector<std::int32_t> integers = {0, 2147483647, -2147483647 - 1};
  for (std::uint32_t i = 0, state = 12345u; i < 200000; ++i) {
    state = state * 1664525u + 1013904223u;
    // Magnitudes from 2^-27 to 2^60: the fast path and the fallback.
    const std::uint32_t bits = (state & 0x807FFFFFu) | ((100u + (state >> 8) % 88u) << 23);
    std::memcpy(&values.emplace_back(), &bits, sizeof bits);
    integers.push_back(static_cast<std::int32_t>(state) >> (state % 31));
  }
  char text[kMaxFixedFieldChars];
  char expected[128];
  for (int width : {3, 10}) {  // narrower and wider than most texts
    for (float v : values) {
      std::snprintf(expected, sizeof expected, "%*.3f", width, static_cast<double>(v));
      ASSERT_EQ(std::string(text, formatFixed3(text, v, width)), expected) << v;
    }
    for (std::int32_t v : integers) {
      std::snprintf(expected, sizeof expected, "%*d", width, static_cast<int>(v));
      ASSERT_EQ(std::string(text, formatInteger(text, v, width)), expected) << v;
    }
  }
}

TEST(OutlineCheck, ClosesAndBlanksTheRunsBeforeTheFirstOpenContourAndStopsThere) {
  Contour list = {S, {0, 0}, {10, 0}, {10, 10}, {0.003f, 0.0035f},   // 4 points, gap 0.0046: closed
                  S, {1, 1}, {2, 2}, {3, 1}, S, {5, 5},              // 3 and 1 points: blanked
                  S, {1, 1}, {2, 1}, {2, 2}, {1, 2}, {1.5f, 1.25f},  // open
                  S, {7, 7}, {8, 8}};                                // after the failure
  testing::internal::CaptureStdout();
  EXPECT_EQ(checkOutline(list.data(), static_cast<std::int32_t>(list.size()), -2.5f, 0.005), -1);
  EXPECT_EQ(testing::internal::GetCapturedStdout(), kBar + "*** OPEN CONTOUR (5 pts)\n" +
                                                        "*** First Point : X=1.000 Y=1.000 Z=-2.500\n" +
                                                        "*** Last  Point : X=1.500 Y=1.250 Z=-2.500\n" + kBar);
  const Contour after = {S, {0, 0}, {10, 0}, {10, 10}, {0, 0}, S, S, S, S, S, S, S,
                         {1, 1}, {2, 1}, {2, 2}, {1, 2}, {1.5f, 1.25f}, S, {7, 7}, {8, 8}};
  ASSERT_EQ(list.size(), after.size());
  EXPECT_EQ(std::memcmp(list.data(), after.data(), sizeof(Point) * list.size()), 0);
  // Nothing to check fails silently.
  Contour separators = {S, S, {95000.0f, 1.0f}};
  testing::internal::CaptureStdout();
  EXPECT_EQ(checkOutline(nullptr, 3, 0.0f, 0.005), -1);
  EXPECT_EQ(checkOutline(separators.data(), 0, 0.0f, 0.005), -1);
  EXPECT_EQ(checkOutline(separators.data(), 3, 0.0f, 0.005), -1);
  EXPECT_EQ(testing::internal::GetCapturedStdout(), "");
}

const std::string kResultSeparator = " 99999.000 99999.000 99999.000  9999\n";
const std::string kRecordSeparator = test::framedRecord(pack(99999.0f, 99999.0f, 99999.0f, -1001, std::int16_t{0}));

// How a form of the ordered pockets lays them out: a start, per pocket a
// head, each contour (outer first) and a tail, then an end; and what an island
// blanked by the outline check leaves.
struct Form {
  int (*write)(const CheckedArray<Pocket*>&);
  std::string file, banner, start, end, tail, shortIsland;
  std::string (*head)(float z);
  std::string (*contour)(const Contour& points, float z);
};

enum { kResult, kTagged, kRecord };
const Form kForms[] = {
    {writePocketResultFile, "poches.res", "\n OUTPUT : poches.res\n",
     " 99999.000         0         0     0\n" + kResultSeparator, "", " 99999.000 99999.000 99999.000 -1004\n", "",
     [](float) { return std::string(); },
     [](const Contour& points, float z) {
       std::string s;
       for (const Point& p : points) {
         char line[64];
         std::snprintf(line, sizeof line, "%10.3f%10.3f%10.3f%6d\n", double{p.x}, double{p.y}, double{z}, -1003);
         s += line;
       }
       return s + kResultSeparator;
     }},
    {rewriteContourFile, "contour.bin", "", pack(256), "", pack('e', 0.0f, 0), "",
     [](float z) { return pack('n', z, static_cast<std::int32_t>(z)); },
     [](const Contour& points, float) {
       std::string s;
       for (const Point& p : points) s += pack('p', p.x, p.y);
       return s + pack('f', 0.0f);
     }},
    {writeRecordContourFile, "contour.bin", "", "", kRecordSeparator, "",
     kRecordSeparator + kRecordSeparator + kRecordSeparator + kRecordSeparator, [](float) { return std::string(); },
     [](const Contour& points, float z) {
       std::string s = kRecordSeparator;
       for (const Point& p : points) s += test::framedRecord(pack(p.x, p.y, z, -1003, std::int16_t{1}));
       return s;
     }},
};

TEST_F(Outputs, PocketFormsLeaveAnEarlierFileAloneForAnEmptyListAndReplaceItOtherwise) {
  const Contour outer = {{12.5f, -3.25f}, {20, -3.25f}, {20, 4}, {12.5f, 4}, {12.5f, -3.25f}};
  const auto two = list({pocket(square(0, 0, 20), -0.5f, {square(2, 2, 3), square(10, 10, 4)}),
                         pocket(square(50, 0, 5), -7.9f)});
  const std::size_t onePocketSizes[] = {9 * 37, 72, 7 * 26};
  for (int k : {kResult, kTagged, kRecord}) {
    const Form& f = kForms[k];
    test::writeFile(dir.file(f.file), "earlier result");
    EXPECT_EQ(console([&] { return f.write(CheckedArray<Pocket*>(0, 1000)); }), "");
    EXPECT_EQ(result, 0);
    EXPECT_EQ(written(f.file), "earlier result") << k;
    EXPECT_EQ(console([&] { return f.write(list({pocket(outer, 12.7f)})); }), f.banner);
    EXPECT_EQ(result, 0);
    // The result file is a text file: its line ends are the platform's.
    const auto disk = [k](const std::string& text) { return k == kResult ? test::onDisk(text) : text; };
    EXPECT_EQ(written(f.file).size(), onePocketSizes[k] +
              (k == kResult ? 9 * (test::platformConventions().textLineEnd.size() - 1) : 0)) << k;
    EXPECT_EQ(written(f.file), disk(f.start + f.head(12.7f) + f.contour(outer, 12.7f) + f.tail + f.end)) << k;
    console([&] { return f.write(two); });
    EXPECT_EQ(result, 0);
    EXPECT_EQ(written(f.file), disk(f.start + f.head(-0.5f) + f.contour(square(0, 0, 20), -0.5f) +
                                   f.contour(square(2, 2, 3), -0.5f) + f.contour(square(10, 10, 4), -0.5f) + f.tail +
                                   f.head(-7.9f) + f.contour(square(50, 0, 5), -7.9f) + f.tail + f.end))
        << k;
  }
}

TEST_F(Outputs, PocketFormsEndTheFileAfterThePocketsBeforeAnOpenContour) {
  Pocket* good = pocket(square(0, 0, 10), 4.0f, {kShortRun});
  const auto three = list({good, pocket(kOpenSquare, 2.0f), good});
  for (const Form& f : kForms) {
    EXPECT_EQ(console([&] { return f.write(three); }),
              f.banner + kBar + "*** OPEN CONTOUR (5 pts)\n*** First Point : X=0.000 Y=0.000 Z=2.000\n" +
                  "*** Last  Point : X=0.000 Y=1.000 Z=2.000\n" + kBar);
    EXPECT_EQ(result, -1);
    const std::string expected =
        f.start + f.head(4.0f) + f.contour(square(0, 0, 10), 4.0f) + f.shortIsland + f.tail + f.end;
    EXPECT_EQ(written(f.file), &f == &kForms[kResult] ? test::onDisk(expected) : expected) << f.file;
  }
}

using OutputsDeathTest = Outputs;

TEST_F(OutputsDeathTest, PocketFileThatCannotBeCreatedOrWrittenEndsTheRun) {
  const auto one = list({pocket(square(0, 0, 10), 1.0f)});
  const std::string path = dir.file("contour.bin");
  const std::string reports[] = {"\n OUTPUT : poches.res\n*** Cannot open file poches.res in mode w.\n",
                                 "*** Cannot open file " + path + " in mode w+b.\n",
                                 "*** Cannot open file " + path + " in mode wb.\n"};
  const std::pair<int, std::function<void()>> losses[] = {
      {kResult, [] { outputFileHooks().open = refuseOpen; }},
      {kResult, [] { outputFileHooks().write = refuseWrite; }},
      {kResult, [] { outputFileHooks().close = refuseClose; }},
      {kTagged, [] { outputFileHooks().open = refuseOpen; }},
      {kTagged, [] { outputFileHooks().write = refuseWrite; }},
      {kTagged, [] { outputFileHooks().close = refuseClose; }},
      {kRecord, [] { recordUnitOps().writeRecord = [](int, const void*, std::size_t) { return 5; }; }},
      {kRecord, [] { recordUnitOps().closeUnit = [](int, bool) { return 5; }; }},
      // A file the system refuses is reported before the unit layer could end
      // the run with a runtime error of its own. Last: the directory stays.
      {kRecord, [&] { std::filesystem::remove(path); std::filesystem::create_directories(path + "/keep"); }},
  };
  const auto lose = [&](int form, const std::function<void()>& breakFile) {
    breakFile();
    std::fflush(stdout);
    ::dup2(2, 1);  // the report goes to standard output, death tests see standard error
    kForms[form].write(one);
  };
  // Where a death test runs in a fresh process, that process has its own
  // temporary directory: only the report's end can be known.
  const auto report = [&](int form) -> testing::Matcher<const std::string&> {
    if (test::platformConventions().forkedDeathTests || form == kResult) return testing::Eq(reports[form]);
    std::string tail;  // the end from the last separator on, every punctuation mark escaped
    for (const char ch : reports[form].substr(reports[form].rfind(test::platformConventions().separator))) {
      if (std::ispunct(static_cast<unsigned char>(ch))) tail += '\\';
      tail += ch;
    }
    return testing::ContainsRegex(tail + "$");
  };
  for (const auto& [form, breakFile] : losses) {
    EXPECT_EXIT(lose(form, breakFile), testing::ExitedWithCode(test::platformConventions().fatalExitStatus),
                report(form));
  }
}

TEST_F(Outputs, TaggedFileWritesEveryTagAndReadsTheByteOrderMarkForUpdate) {
  TaggedFile file = openTaggedFile(dir.file("t.bin").c_str(), "w+b");
  int records = 0;
  for (char tag : std::string("bpcrdmenfqP")) records += writeTaggedRecord(file, tag, -3.75f, 1e12f);
  closeTaggedFile(file);
  EXPECT_EQ(records, 9);  // unknown tags write nothing
  EXPECT_EQ(written("t.bin"), pack(256, 'b', -3.75f, 1e12f, 'p', -3.75f, 1e12f, 'c', -3, 2147483647) +
                                  pack('r', -3, 2147483647, 'd', -3, 'm', -3, 'e', -3.75f, 2147483647) +
                                  pack('n', -3.75f, 2147483647, 'f', -3.75f));
  for (const auto& [mark, swapped] : {std::pair{pack(256), false}, {pack(65536), true}, {std::string("\1"), true}}) {
    test::writeFile(dir.file("u.bin"), mark);
    file = openTaggedFile(dir.file("u.bin").c_str(), "r+b");
    EXPECT_EQ(file.swapBytes, swapped);
    writeTaggedRecord(file, 'd', 5.0f, 0.0f);  // after the mark
    closeTaggedFile(file);
    EXPECT_EQ(written("u.bin"), mark + pack('d', 5));
  }
}

const std::string kDumpSeparator = pack(0, 0, 99999.0, 99999.0);

std::string outline(const Contour& points) {
  std::string r = kDumpSeparator;
  for (const Point& p : points) r += pack(1, 0, double{p.x}, double{p.y});
  return r;
}
std::string indexEntry(std::int32_t level, std::int32_t records, std::int32_t offset, double z) {
  return pack(level, records, records, offset, records, 0, z);
}

TEST_F(Outputs, LevelDumpOfOneSquareTakes192Bytes) {
  add(0, square(1, 2, 3), 7.5f);
  EXPECT_EQ(console([&] { return writeLevelDump(levels.data(), 1); }), "");
  EXPECT_EQ(result, 1);
  EXPECT_EQ(written("wlevel.tmp").size(), 192u);
  EXPECT_EQ(written("wlevel.tmp"), pack(1, 6, 1) + outline(square(1, 2, 3)) + indexEntry(0, 6, 12, 7.5) + pack(0));
}

TEST_F(Outputs, LevelDumpHasTheOuterContoursWithTheirIslandsUntilAnOpenContour) {
  ContourNode* a = add(0, square(0, 0, 100), 4.0f);
  ContourNode* island = add(0, square(10, 10, 40), 4.0f, a);
  add(0, square(60, 60, 5), 4.0f, a);
  add(0, square(20, 20, 5), 4.0f, island);  // an outer contour inside an island
  add(0, square(200, 0, 10), 4.25f);        // the level takes the Z of its last outer contour
  add(1, square(1, 1, 8), 2.0f);
  add(1, kShortRun, 2.0f);  // blanked, still one record per entry
  add(2, kOpenSquare, 1.0f);
  console([&] { return writeLevelDump(levels.data(), 3); });
  EXPECT_EQ(result, -1);
  EXPECT_EQ(written("wlevel.tmp"), pack(2, 40, 1) + outline(square(0, 0, 100)) + outline(square(10, 10, 40)) +
                                       outline(square(60, 60, 5)) + outline(square(20, 20, 5)) +
                                       outline(square(200, 0, 10)) + outline(square(1, 1, 8)) + kDumpSeparator +
                                       kDumpSeparator + kDumpSeparator + kDumpSeparator + indexEntry(0, 30, 12, 4.25) +
                                       indexEntry(1, 10, 12 + 24 * 30, 2.0) + pack(0, 1));
}

// A dump whose file was made but not completely written is a lost output:
// its report and status -1, after the dump went on as far as it could (a
// level whose records failed loses only its index entry). A dump whose file
// cannot be made at all lets the run go on.
TEST_F(Outputs, LevelDumpThatCannotBeCompletelyWrittenIsLost) {
  const std::string lost = "*** Cannot open file " + dir.file("wlevel.tmp") + " in mode w+b.\n";
  // A death test in a fresh process cannot leave its file to this one.
  if (!test::platformConventions().forkedDeathTests) GTEST_SKIP() << "death tests do not share this process's files";
  const auto dump = [&](std::int32_t levelCount, int failing) {
    writeCalls = 0;
    failingWriteCall = failing;
    outputFileHooks().write = failOneWrite;
    std::fflush(stdout);
    ::dup2(2, 1);  // the report goes to standard output, death tests see standard error
    writeLevelDump(levels.data(), levelCount);
    std::exit(0);
  };
  for (std::size_t i = 0; i < 3; ++i) add(i, square(0, 0, 10.0f + static_cast<float>(i)), static_cast<float>(i));
  EXPECT_EXIT(dump(3, 3), testing::ExitedWithCode(test::platformConventions().fatalExitStatus), testing::Eq(lost));  // header, level 0, then level 1 fails
  // Level 2 at its own offset, after the hole level 1 left.
  EXPECT_EQ(written("wlevel.tmp"), pack(2, 18, 0) + outline(square(0, 0, 10)) + std::string(24 * 6, '\0') +
                                       outline(square(0, 0, 12)) + indexEntry(0, 6, 12, 0.0) +
                                       indexEntry(2, 6, 12 + 24 * 12, 2.0) + pack(0, 2));
  for (int failing : {1, 3}) {  // the header; the index
    EXPECT_EXIT(dump(1, failing), testing::ExitedWithCode(test::platformConventions().fatalExitStatus), testing::Eq(lost)) << failing;
  }
  EXPECT_EQ(written("wlevel.tmp"), pack(-1, -1, -1) + outline(square(0, 0, 10)));

  outputFileHooks().open = refuseOpen;
  console([&] { return writeLevelDump(levels.data(), 1); });
  EXPECT_EQ(result, -1);
}

}  // namespace
}  // namespace pc
