// The level dump "$TMP/wlevel.tmp" of run mode 4: the outlines of every
// outer contour of every level as point records, with an index per level.
//
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
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "fileio/byte_stream.h"
#include "fileio/framed_record_reader.h"

#include "pockets/pocket_model.h"

namespace pc {

inline constexpr const char* kLevelDumpName = "$TMP/wlevel.tmp";
inline constexpr const char* kLevelDumpMode = "w+b";

// Writes the dump of `levels[0..levelCount)`. 1 on success; -1 when the name
// cannot be expanded, the file cannot be created or an outline fails the
// outline check (the levels before it stay indexed); such a dump does not
// stop the run. A dump whose file was created but could not be completely
// written (a full disk) ends the run through reportLostOutput.
int writeLevelDump(ZLevel* levels, std::int32_t levelCount);

inline constexpr std::int64_t kLevelDumpHeaderBytes = 12;
inline constexpr std::int64_t kLevelDumpRecordBytes = 24;
inline constexpr std::int64_t kLevelDumpIndexBytes = 32;

struct LevelDumpHeader {
  std::int32_t entries = 0;
  std::int32_t records = 0;
  std::int32_t ordered = 0;
};

struct LevelDumpRecord {
  std::int32_t kind = 0;  // 1 point, 0 separator
  double x = 0.0;
  double y = 0.0;
};

struct LevelDumpIndexEntry {
  std::int32_t level = 0;
  std::int32_t records = 0;
  std::int32_t offset = 0;
  double z = 0.0;
};

// Reads a dump back: header, index and level list at open, checked against
// one another and against the file's size; then the point records of one
// index entry at a time, streamed.
class LevelDumpReader {
 public:
  // False (problem()) when the file cannot be opened, its header was never
  // finished, its size is not that of its counts, or an index entry or the
  // level list disagrees with the header.
  bool open(const std::string& path);
  const LevelDumpHeader& header() const { return header_; }
  const std::vector<LevelDumpIndexEntry>& index() const { return index_; }
  const std::vector<std::int32_t>& levelList() const { return levelList_; }

  // Positions the reader at the first record of index entry k.
  bool startEntry(std::size_t k);
  // The next record of the current entry: Record, End after its last, or
  // Damaged (a kind other than 0 or 1, or a read cut short).
  fileio::RecordRead nextRecord(LevelDumpRecord& record);
  // 1-based number, in the whole file, of the record last read.
  std::int64_t recordNumber() const { return recordNumber_; }
  const fileio::ReadProblem& problem() const { return problem_; }

 private:
  bool fail(std::int64_t offset, std::int64_t record, std::string expected);

  fileio::ByteStream stream_;
  LevelDumpHeader header_;
  std::vector<LevelDumpIndexEntry> index_;
  std::vector<std::int32_t> levelList_;
  std::int64_t recordNumber_ = 0;
  std::int64_t entryLeft_ = 0;
  fileio::ReadProblem problem_;
};

}  // namespace pc
