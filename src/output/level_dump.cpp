// Level dump, binary, little-endian:
//
// Header, at offset 0 (written as three -1 first, rewritten at the end):
//   offset  size  type    meaning
//   0       4     int32   number of index entries (levels written)
//   4       4     int32   number of point records counted (R)
//   8       4     int32   1 while every index entry k describes level k, else 0
//
// Point records from offset 12, level after level, 24 bytes each:
//   0       4     int32   kind: 1 point, 0 separator
//   4       4     -       padding, zero
//   8       8     double  x
//   16      8     double  y
//
// Index at 12 + 24 * R, one 32-byte entry per level written:
//   0       4     int32   level number (position in the level array)
//   4       4     int32   number of point records of the level
//   8       4     int32   the same number
//   12      4     int32   offset of the level's first point record
//   16      4     int32   the same number of records
//   20      4     -       padding, zero
//   24      8     double  Z of the level's last outer contour
//
// Level list after the index: one int32 level number per index entry.
//
// A level whose records could not be written gets no index entry but still
// counts in R, so every offset stays that of a complete file; the next level
// is written at its own offset.
#include "output/level_dump.h"

#include <cstring>
#include <limits>

#include "driver/checked_array.h"
#include "env/path_expander.h"
#include "fileio/little_endian.h"
#include "output/outline_check.h"
#include "output/outline_list.h"
#include "output/lost_output.h"
#include "output/output_file.h"

namespace pc {

namespace {

constexpr std::int64_t kHeaderSize = 12;
constexpr std::int64_t kRecordSize = 24;
constexpr std::size_t kIndexEntrySize = 32;
// Entries with x above this are separators.
constexpr float kSeparatorKindLimit = 99998.0f;

struct DumpIndexEntry {
  std::int32_t level = 0;
  std::int32_t records = 0;
  std::int32_t offset = 0;
  double z = 0.0;
};

void writeHeader(OutputFile& file, std::int32_t entries, std::int32_t records, std::int32_t ordered) {
  char bytes[kHeaderSize];
  fileio::putInt32LE(fileio::putInt32LE(fileio::putInt32LE(bytes, entries), records), ordered);
  file.write(bytes, sizeof bytes);
}

void writeIndex(OutputFile& file, const CheckedArray<DumpIndexEntry>& index) {
  for (std::int32_t k = 0; k < index.count; ++k) {
    const DumpIndexEntry& e = index.data[k];
    char* p = file.reserve(kIndexEntrySize);
    p = fileio::putInt32LE(fileio::putInt32LE(p, e.level), e.records);
    p = fileio::putInt32LE(fileio::putInt32LE(p, e.records), e.offset);
    p = fileio::putInt32LE(fileio::putInt32LE(p, e.records), 0);
    p = fileio::putDoubleLE(p, e.z);
    file.commit(p);
  }
}

void writeLevelList(OutputFile& file, const CheckedArray<DumpIndexEntry>& index) {
  for (std::int32_t k = 0; k < index.count; ++k) {
    char* p = file.reserve(4);
    file.commit(fileio::putInt32LE(p, index.data[k].level));
  }
}

// The outline list sized for the node's whole outline, so that it never
// grows step by step through a contour of millions of points.
void prepareOutline(CheckedArray<Point>& outline, const ContourNode& node) {
  const std::int64_t entries = nodeOutlineSize(node);
  if (entries > outline.capacity) outline = CheckedArray<Point>(outlineCapacityFor(entries), kOutlineGrowStep);
}

// Checks the outline of every outer node of the level and counts its
// records; false (after the check's report) when an outline fails.
bool checkLevel(const CheckedArray<ContourNode*>& outer, CheckedArray<Point>& outline, std::int64_t& records,
                float& levelZ) {
  records = 0;
  for (std::int32_t k = 0; k < outer.count; ++k) {
    const ContourNode& node = *outer.data[k];
    prepareOutline(outline, node);
    float z = 0.0f;
    collectNodeOutline(node, outline, z);
    if (checkOutline(outline.data, outline.count, z, kOutlineClosureTolerance) != 0) return false;
    records += outline.count;
    levelZ = z;
  }
  return true;
}

// One record per outline entry of every outer node. The outlines are built
// and checked again rather than kept from checkLevel: the check gives the
// same entries every time, and a level of millions of points then needs no
// second copy of itself in memory.
void writeLevelRecords(OutputFile& file, const CheckedArray<ContourNode*>& outer, CheckedArray<Point>& outline) {
  for (std::int32_t k = 0; k < outer.count; ++k) {
    float z = 0.0f;
    collectNodeOutline(*outer.data[k], outline, z);
    checkOutline(outline.data, outline.count, z, kOutlineClosureTolerance);
    for (std::int32_t e = 0; e < outline.count; ++e) {
      const Point& point = outline.data[e];
      char* p = file.reserve(kRecordSize);
      p = fileio::putInt32LE(fileio::putInt32LE(p, point.x > kSeparatorKindLimit ? 0 : 1), 0);
      p = fileio::putDoubleLE(fileio::putDoubleLE(p, static_cast<double>(point.x)), static_cast<double>(point.y));
      file.commit(p);
    }
  }
}

}  // namespace

int writeLevelDump(ZLevel* levels, std::int32_t levelCount) {
  char name[512];
  std::strcpy(name, kLevelDumpName);
  if (expandNameInPlace(name, sizeof name) != EXPAND_OK) return -1;
  OutputFile file;
  if (!file.open(name, kLevelDumpMode)) return -1;
  writeHeader(file, -1, -1, -1);
  // The dump's file is there but some of it could not be written (a full
  // disk): the dump is lost, and the run must not end as a success.
  if (!file.flush()) {
    file.close();
    reportLostOutput(name, kLevelDumpMode);
  }
  bool lost = false;

  CheckedArray<Point> outline(kOutlineInitialCapacity, kOutlineGrowStep);
  CheckedArray<DumpIndexEntry> index(levelCount > 0 ? levelCount : 0, 100);
  std::int64_t counted = 0;  // R
  std::int32_t ordered = 1;
  bool misplaced = false;  // a failed write left the file short of its offsets
  int result = 1;

  for (std::int32_t i = 0; i < levelCount; ++i) {
    const CheckedArray<ContourNode*>& outer = outerNodes(levels[i]);
    std::int64_t records = 0;
    float levelZ = 0.0f;
    if (!checkLevel(outer, outline, records, levelZ)) {
      result = -1;
      break;
    }
    const std::int64_t offset = kHeaderSize + kRecordSize * counted;
    if (kHeaderSize + kRecordSize * (counted + records) > std::numeric_limits<std::int32_t>::max()) {
      result = -1;  // offsets beyond the reach of the index's 32-bit fields
      break;
    }
    counted += records;
    if (misplaced && !file.seek(offset)) {
      file.clearError();
      continue;
    }
    writeLevelRecords(file, outer, outline);
    if (!file.flush()) {
      lost = true;
      file.clearError();
      misplaced = true;
      continue;
    }
    misplaced = false;
    if (ordered == 1 && index.count != i) ordered = 0;
    index.append(DumpIndexEntry{i, static_cast<std::int32_t>(records), static_cast<std::int32_t>(offset),
                                static_cast<double>(levelZ)});
  }

  bool finished = true;
  if (index.count > 0) {
    if (misplaced) finished = file.seek(kHeaderSize + kRecordSize * counted);
    if (finished) {
      writeIndex(file, index);
      finished = file.flush();
    }
    if (finished) {
      writeLevelList(file, index);
      finished = file.flush();
    }
  }
  if (finished && file.seek(0)) {
    writeHeader(file, index.count, static_cast<std::int32_t>(counted), ordered);
    finished = file.flush();
  } else {
    finished = false;
  }
  if (!file.close()) finished = false;
  if (lost || !finished) reportLostOutput(name, kLevelDumpMode);
  return result;
}

}  // namespace pc
