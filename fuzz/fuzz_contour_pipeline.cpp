// The contour information file "$TMP/trxcon.inf" through the whole pipeline:
// counting pass, point loading, assembly, levels, pocket building, both
// orders, the width filter and every output form (the level dump with the
// level-based order), written to memory.
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <memory>
#include <vector>

#include "contours/contour_assembly.h"
#include "contours/contour_info_file.h"
#include "contours/point_loader.h"
#include "driver/checked_array.h"
#include "fuzz_support.h"
#include "output/contour_file_rewrite.h"
#include "output/level_dump.h"
#include "output/output_file.h"
#include "output/pocket_result_file.h"
#include "output/record_contour_file.h"
#include "pockets/level_order.h"
#include "pockets/pocket_model.h"
#include "pockets/width_filter.h"
#include "pockets/zone_order.h"

namespace {

using namespace pc;

// Every output byte lands here; the sink is emptied now and then so that a
// long run does not grow it without end.
std::vector<unsigned char>& sink() {
  static std::vector<unsigned char> bytes;
  return bytes;
}
void keep(const void* data, std::size_t size) {
  if (sink().size() > (std::size_t{8} << 20)) sink().clear();
  const auto* p = static_cast<const unsigned char*>(data);
  sink().insert(sink().end(), p, p + size);
}

std::FILE* openNull(const char*, const char* mode) { return std::fopen("/dev/null", mode[0] == 'r' ? "r+b" : "w+b"); }
std::size_t writeToMemory(const void* data, std::size_t size, std::FILE*) {
  keep(data, size);
  return size;
}
int closeNull(std::FILE* file) { return std::fclose(file); }

int oneUnit() { return 3; }
int openNothing(int, std::string_view, int) { return 0; }
bool alwaysOpen(int) { return true; }
int recordToMemory(int, const void* data, std::size_t size) {
  keep(data, size);
  return 0;
}
int closeNothing(int, bool) { return 0; }

// One classification of the loaded contours, as the run does it, with one
// of the outputs written.
void classify(ZContour* contours, std::int32_t contourCount, bool levelBased, double minWidth, int output) {
  std::vector<ZLevel> levels;
  for (std::int32_t i = 0; i < contourCount; ++i) {
    if (i == 0 || !(static_cast<double>(contours[i].z) == static_cast<double>(contours[i - 1].z))) {
      levels.emplace_back();
    }
    addContourToLevel(levels.back(), &contours[i]);
  }
  const auto levelCount = static_cast<std::int32_t>(levels.size());
  if (levelBased) writeLevelDump(levels.data(), levelCount);

  auto forest = std::make_unique<PocketForest>();
  buildPockets(*forest, levels.data(), levelCount);
  std::int32_t pockets = pocketCount(*forest);
  if (minWidth > 0.0) pockets = widthFilter(*forest, minWidth);
  if (pockets <= 0) return;
  CheckedArray<Pocket*> ordered(pockets, 1000);
  const std::int32_t count = levelBased ? levelOrder(*forest, ordered) : zoneOrder(*forest, ordered);
  if (count <= 0) return;
  switch (output) {
    case 0: rewriteContourFile(ordered); break;
    case 1: writeRecordContourFile(ordered); break;
    default: writePocketResultFile(ordered); break;
  }
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  pc::fuzz::quietConsole();
  pc::fuzz::scratchDirectory();
  outputFileHooks() = OutputFileHooks{openNull, writeToMemory, closeNull};
  recordUnitOps() = RecordUnitOps{oneUnit, openNothing, alwaysOpen, recordToMemory, closeNothing};
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  pc::fuzz::useAsFile("trxcon.inf", data, size);
  const ContourCounts counts = countContourInfoFile();
  const std::int32_t pointCapacity = counts.np + 10;
  const std::int32_t contourCapacity = counts.nc + 10;
  std::vector<Point> points(static_cast<std::size_t>(pointCapacity));
  std::vector<float> zs(static_cast<std::size_t>(pointCapacity));
  std::vector<ZContour> contours(static_cast<std::size_t>(contourCapacity));
  const std::int32_t entries = loadContourPoints(points.data(), zs.data(), pointCapacity, 1e-10);
  if (entries < 1) return 0;
  const std::int32_t contourCount =
      assembleContours(points.data(), zs.data(), entries, contours.data(), contourCapacity, 0.005);
  if (contourCount < 1) return 0;
  // The order, the width filter and the output are chosen by the length of
  // the input, so that the bytes stay a plain contour file: mutations that
  // add or drop bytes move an input through every combination.
  const bool levelBased = size % 2 == 0;
  const double minWidth = size / 2 % 2 == 0 ? 0.0 : 1.0;
  classify(contours.data(), contourCount, levelBased, minWidth, static_cast<int>(size / 4 % 3));
  return 0;
}
