#include "output/level_dump.h"

#include <bit>
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

bool LevelDumpReader::fail(std::int64_t offset, std::int64_t record, std::string expected) {
  problem_ = fileio::ReadProblem{offset, record, std::move(expected)};
  return false;
}

bool LevelDumpReader::open(const std::string& path) {
  index_.clear();
  levelList_.clear();
  if (!stream_.open(path)) return fail(0, 0, "a readable file");
  unsigned char bytes[kIndexEntrySize];
  if (stream_.read(bytes, kHeaderSize) < kHeaderSize) return fail(0, 0, "a 12-byte header, the file is shorter");
  header_ = LevelDumpHeader{fileio::loadInt32LE(bytes), fileio::loadInt32LE(bytes + 4),
                            fileio::loadInt32LE(bytes + 8)};
  if (header_.entries == -1 && header_.records == -1 && header_.ordered == -1) {
    return fail(0, 0, "a finished header, found -1 -1 -1 (the dump never ended)");
  }
  if (header_.entries < 0 || header_.records < 0 || (header_.ordered != 0 && header_.ordered != 1)) {
    return fail(0, 0, "entries >= 0, records >= 0 and an order flag of 0 or 1, found " +
                          std::to_string(header_.entries) + " " + std::to_string(header_.records) + " " +
                          std::to_string(header_.ordered));
  }
  const std::int64_t indexStart = kHeaderSize + kRecordSize * header_.records;
  const std::int64_t expectedSize = indexStart + (kLevelDumpIndexBytes + 4) * header_.entries;
  if (stream_.size() != expectedSize) {
    return fail(stream_.size() < expectedSize ? stream_.size() : expectedSize, 0,
                "a file of 12 + 24 x " + std::to_string(header_.records) + " + 36 x " +
                    std::to_string(header_.entries) + " = " + std::to_string(expectedSize) + " bytes, found " +
                    std::to_string(stream_.size()));
  }
  if (!stream_.seek(indexStart)) return fail(indexStart, 0, "the index, the file cannot be positioned there");
  index_.reserve(static_cast<std::size_t>(header_.entries));
  for (std::int32_t k = 0; k < header_.entries; ++k) {
    const std::int64_t at = stream_.offset();
    if (stream_.read(bytes, kIndexEntrySize) < kIndexEntrySize) return fail(at, k + 1, "a 32-byte index entry");
    LevelDumpIndexEntry e{fileio::loadInt32LE(bytes), fileio::loadInt32LE(bytes + 4), fileio::loadInt32LE(bytes + 12),
                          std::bit_cast<double>(static_cast<std::uint64_t>(fileio::loadLE32(bytes + 24)) |
                                                static_cast<std::uint64_t>(fileio::loadLE32(bytes + 28)) << 32)};
    if (fileio::loadInt32LE(bytes + 8) != e.records || fileio::loadInt32LE(bytes + 16) != e.records) {
      return fail(at, k + 1, "the same record count three times in the index entry");
    }
    const std::int64_t end = static_cast<std::int64_t>(e.offset) + kRecordSize * e.records;
    if (e.records < 0 || e.offset < kHeaderSize || (e.offset - kHeaderSize) % kRecordSize != 0 || end > indexStart) {
      return fail(at, k + 1, "records inside the record area (offset " + std::to_string(e.offset) + ", " +
                                 std::to_string(e.records) + " records)");
    }
    index_.push_back(e);
  }
  for (std::int32_t k = 0; k < header_.entries; ++k) {
    const std::int64_t at = stream_.offset();
    if (stream_.read(bytes, 4) < 4) return fail(at, k + 1, "a 4-byte level number of the level list");
    levelList_.push_back(fileio::loadInt32LE(bytes));
    if (levelList_.back() != index_[static_cast<std::size_t>(k)].level) {
      return fail(at, k + 1, "the level number " + std::to_string(index_[static_cast<std::size_t>(k)].level) +
                                 " of index entry " + std::to_string(k + 1) + ", found " +
                                 std::to_string(levelList_.back()));
    }
  }
  return true;
}

bool LevelDumpReader::startEntry(std::size_t k) {
  if (k >= index_.size()) return false;
  const LevelDumpIndexEntry& e = index_[k];
  if (!stream_.seek(e.offset)) return fail(e.offset, 0, "the level's records, the file cannot be positioned there");
  recordNumber_ = (e.offset - kHeaderSize) / kRecordSize;
  entryLeft_ = e.records;
  return true;
}

fileio::RecordRead LevelDumpReader::nextRecord(LevelDumpRecord& record) {
  if (entryLeft_ <= 0) return fileio::RecordRead::End;
  const std::int64_t at = stream_.offset();
  ++recordNumber_;
  unsigned char bytes[kRecordSize];
  if (stream_.read(bytes, kRecordSize) < kRecordSize) {
    fail(at, recordNumber_, "a 24-byte point record, the file ends first");
    return fileio::RecordRead::Damaged;
  }
  --entryLeft_;
  auto loadDouble = [](const unsigned char* p) {
    return std::bit_cast<double>(static_cast<std::uint64_t>(fileio::loadLE32(p)) |
                                 static_cast<std::uint64_t>(fileio::loadLE32(p + 4)) << 32);
  };
  record = LevelDumpRecord{fileio::loadInt32LE(bytes), loadDouble(bytes + 8), loadDouble(bytes + 16)};
  if (record.kind != 0 && record.kind != 1) {
    fail(at, recordNumber_, "a record kind of 1 (point) or 0 (separator), found " + std::to_string(record.kind));
    return fileio::RecordRead::Damaged;
  }
  return fileio::RecordRead::Record;
}

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
