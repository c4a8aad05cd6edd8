// The run of the pocket classifier: one pass through a fixed list of steps,
// each printing its progress line. The early error returns leave the process
// to reclaim what the run holds.
#include "driver/run_driver.h"

#include <cmath>
#include <cstdint>
#include <cstdio>
#include <memory>
#include <type_traits>
#include <vector>

#include "contours/contour_assembly.h"
#include "contours/contour_info_file.h"
#include "contours/point_loader.h"
#include "driver/checked_array.h"
#include "driver/fatal_report.h"
#include "driver/float_truncation.h"
#include "driver/run_mode.h"
#include "env/path_expander.h"
#include "output/contour_file_rewrite.h"
#include "output/level_dump.h"
#include "output/pocket_result_file.h"
#include "output/record_contour_file.h"
#include "platform/platform.h"
#include "pockets/level_order.h"
#include "pockets/pocket_model.h"
#include "pockets/width_filter.h"
#include "pockets/zone_order.h"
#include "tool/program_version.h"
#include "tool/tool_naming.h"
#include "tool/tool_parameters.h"
#include "tool/tool_view.h"
#include "tool/unit_scale.h"

namespace pc {

namespace {

constexpr const char* kStarLine53 = "*****************************************************\n";
constexpr const char* kLoadError = " *** ERROR : while loading trxcon.inf\n";
constexpr double kDuplicateTolerance = 1e-10;
constexpr double kClosureTolerance = 0.005;
constexpr std::int32_t kSpareEntries = 10;

// Parameter slots the run reads.
constexpr int kSlotToolpathNumber = 2;
constexpr int kSlotCornerRadius = 3;
constexpr int kSlotBodyRadius = 4;
constexpr int kSlotMachiningOrder = 46;
constexpr int kSlotMinPocketWidth = 58;
constexpr int kLevelBasedOrder = 2;

// Memory failures of the run's own arrays end like those of the checked
// arrays: a boxed report and status 1.
constexpr const char* kDriverSourceName = "run_driver";

// One of the run's large arrays. Its entries are written by the loaders
// before they are read, so the block is not initialised here.
template <typename T>
struct RunArray {
  static_assert(std::is_trivially_copyable_v<T> && std::is_trivially_destructible_v<T>);
  struct Release {
    void operator()(T* block) const { platform::releaseLarge(block); }
  };
  std::unique_ptr<T, Release> block;
  T* get() const { return block.get(); }
};

template <typename T>
RunArray<T> allocateArray(std::int64_t entries) {
  RunArray<T> array;
  if (entries > 0 && entries <= INT32_MAX) {
    array.block.reset(static_cast<T*>(platform::allocateLarge(static_cast<std::size_t>(entries) * sizeof(T))));
  }
  if (!array.block) FatalReport(kDriverSourceName, __LINE__, kMemoryAllocationFailure);
  return array;
}

// The point, Z and contour arrays of the run, sized by the counting pass
// with ten spare entries each.
struct RunArrays {
  std::int32_t pointCapacity = 0;
  std::int32_t contourCapacity = 0;
  RunArray<Point> points;
  RunArray<float> zs;
  RunArray<ZContour> contours;
};

RunArrays allocateRunArrays(const ContourCounts& counts) {
  RunArrays arrays;
  const std::int64_t pointCapacity = std::int64_t{counts.np} + kSpareEntries;
  const std::int64_t contourCapacity = std::int64_t{counts.nc} + kSpareEntries;
  arrays.points = allocateArray<Point>(pointCapacity);
  arrays.zs = allocateArray<float>(pointCapacity);
  arrays.contours = allocateArray<ZContour>(contourCapacity);
  arrays.pointCapacity = static_cast<std::int32_t>(pointCapacity);
  arrays.contourCapacity = static_cast<std::int32_t>(contourCapacity);
  return arrays;
}

// Loads the points and cuts them into checked contours; the number of
// contours, or 0 when the file could not be used.
std::int32_t loadContours(RunArrays& arrays) {
  const std::int32_t entries =
      loadContourPoints(arrays.points.get(), arrays.zs.get(), arrays.pointCapacity, kDuplicateTolerance);
  if (entries < 1) return 0;
  return assembleContours(arrays.points.get(), arrays.zs.get(), entries, arrays.contours.get(),
                          arrays.contourCapacity, kClosureTolerance);
}

void writeOutput(RunMode mode, const CheckedArray<Pocket*>& ordered) {
  switch (mode) {
    case RunMode::ContourFileRewrite: rewriteContourFile(ordered); break;
    case RunMode::RecordContourFile: writeRecordContourFile(ordered); break;
    case RunMode::PocketResultFile: writePocketResultFile(ordered); break;
    case RunMode::LevelDumpThenRecords: break;  // runs as RecordContourFile after the dump
  }
}

void printBanner() {
  std::printf("%s", kStarLine53);
  std::printf("***          POCKET CLASSIFICATION\n");
  std::printf("***\n");
  std::printf("***      (Version : %d)\n", static_cast<int>(programVersion()));
  std::printf("%s", kStarLine53);
}

// Reads the tool parameters into a fresh block; the texts are not kept.
ToolParameters readParameters() {
  ToolParameters block;
  allocateToolParameters(block, 0);
  if (!block.values || !block.texts) FatalReport(kDriverSourceName, __LINE__, kMemoryAllocationFailure);
  const int slotCount = truncateToInt32(block.values[0]);
  readToolParameters(block.values.get(), block.texts.get(), kParameterTextWidth, &slotCount);
  block.texts.reset();
  return block;
}

void printToolLine(ToolParameters& parameters, float scale) {
  const int toolpath = truncateToInt32(parameters.slot(kSlotToolpathNumber));
  loadView(kToolViewKind, static_cast<double>(scale), toolFilePath(toolpath, ".mul"));
  const float r = parameters.slot(kSlotCornerRadius);
  float bodyRadius = parameters.slot(kSlotBodyRadius);
  if (r > bodyRadius) {
    parameters.slot(kSlotBodyRadius) = r;
    bodyRadius = r;
  }
  const float shownCorner = r / scale;
  const float shownBody = bodyRadius / scale;
  const char* label = toolNumberText(toolpath);
  std::printf("\n");
  if (shownCorner == 0.0f) {
    std::printf(" Tool : #%s FLATEND(R=%.2fmm)\n", label, static_cast<double>(shownBody));
  } else if (shownCorner == shownBody) {
    std::printf(" Tool : #%s BALLEND(r=%.2fmm)\n", label, static_cast<double>(shownCorner));
  } else {
    std::printf(" Tool : #%s BULLNOSE(r=%.2fmm,R=%.2fmm)\n", label, static_cast<double>(shownCorner),
                static_cast<double>(shownBody));
  }
  std::printf("\n");
  std::printf(" INITIALIZATION...\n");
}

// Consecutive contours of exactly equal Z form one level; a Z that comes
// back after another opens a new level. The level list grows as needed, so
// contours closer in Z than the counting tolerance cannot overrun it.
std::vector<ZLevel> groupIntoLevels(ZContour* contours, std::int32_t contourCount, std::int32_t expectedLevels) {
  std::vector<ZLevel> levels;
  levels.reserve(static_cast<std::size_t>(expectedLevels));
  for (std::int32_t i = 0; i < contourCount; ++i) {
    const bool opensLevel =
        i == 0 || !(static_cast<double>(contours[i].z) == static_cast<double>(contours[i - 1].z));
    if (opensLevel) levels.emplace_back();
    addContourToLevel(levels.back(), &contours[i]);
  }
  return levels;
}

bool levelBasedClassification(std::size_t levelCount, ToolParameters& parameters) {
  return levelCount == 1 || truncateToInt32(parameters.slot(kSlotMachiningOrder)) == kLevelBasedOrder;
}

// Marks a run that ends without any pocket to write.
void writeEmptyResultMarker() {
  char name[512] = "$TMP/errvide.tmp";
  expandNameInPlace(name, sizeof name);
  if (std::FILE* marker = std::fopen(name, "w+")) std::fclose(marker);
}

void removeStaleOffsetError() {
  char name[512] = "$TMP/offset2.err";
  expandNameInPlace(name, sizeof name);
  // Only a regular file: a FIFO of that name would block the open for ever.
  if (std::FILE* stale = platform::openExistingFile(name, "r", true)) {
    std::fclose(stale);
    std::remove(name);
  }
}

}  // namespace

int runPocketClassifier(int argc, char** argv) {
  std::setvbuf(stdout, nullptr, _IONBF, 0);
  printBanner();

  RunMode mode = runModeFromArguments(argc, argv);
  float scale = 1.0f;
  unitScale(&scale);
  ToolParameters parameters = readParameters();
  printToolLine(parameters, scale);

  const ContourCounts counts = countContourInfoFile();
  std::printf(" NZ=%d NP=%d NC=%d\n", counts.nz, counts.np, counts.nc);

  RunArrays arrays = allocateRunArrays(counts);
  std::printf("\n");
  std::printf(" LOADING Z-CONTOURS...\n");
  const std::int32_t contourCount = loadContours(arrays);
  if (contourCount < 1) {
    std::printf("%s", kLoadError);
    return 0;
  }
  std::printf(" %d contours\n", contourCount);
  std::printf("\n");
  std::printf(" BUILDING POCKETS IN EACH Z-LEVEL...\n");

  std::vector<ZLevel> levels = groupIntoLevels(arrays.contours.get(), contourCount, counts.nz + kSpareEntries);
  const auto levelCount = static_cast<std::int32_t>(levels.size());
  std::printf(" %d z-levels\n", levelCount);

  if (mode == RunMode::LevelDumpThenRecords) {
    writeLevelDump(levels.data(), levelCount);
    mode = RunMode::RecordContourFile;
  }

  std::printf("\n");
  if (mode == RunMode::RecordContourFile) parameters.slot(kSlotMachiningOrder) = 2.0f;
  const bool levelBased = levelBasedClassification(levels.size(), parameters);
  std::printf(levelBased ? " LEVEL-BASED POCKET CLASSIFICATION...\n" : " ZONE-BASED POCKET CLASSIFICATION...\n");

  auto forest = std::make_unique<PocketForest>();
  buildPockets(*forest, levels.data(), levelCount);
  std::int32_t pockets = pocketCount(*forest);
  std::printf(" %d pockets\n", pockets);

  const float minWidth = parameters.slot(kSlotMinPocketWidth);
  if (minWidth > 0.0f) {
    pockets = widthFilter(*forest, static_cast<double>(minWidth));
    if (pockets <= 0) {
      writeEmptyResultMarker();
      return 0;
    }
    std::printf(" %d pockets [width > %.3fmm]\n", pockets, static_cast<double>(minWidth));
  }

  auto ordered = std::make_unique<CheckedArray<Pocket*>>(pockets, 1000);
  const std::int32_t orderedCount = levelBasedClassification(levels.size(), parameters)
                                        ? levelOrder(*forest, *ordered)
                                        : zoneOrder(*forest, *ordered);
  if (orderedCount <= 0) {
    writeEmptyResultMarker();
    return 0;
  }

  writeOutput(mode, *ordered);

  levels.clear();
  arrays = RunArrays{};
  parameters = ToolParameters{};

  removeStaleOffsetError();
  std::printf(" DONE\n\n");
  ordered.reset();
  forest.reset();
  return 0;
}

}  // namespace pc
