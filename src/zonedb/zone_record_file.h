// Read-only access to an existing "zone.inf": the header check and the walk
// from the first record to the first record of a requested item. The file is
// never written here.
#pragma once

#include <cstdint>
#include <cstdio>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "zonedb/zone_record_format.h"

namespace pc::zonedb {

class ZoneRecordFile {
 public:
  // Opens the file and checks its header: 0, kCannotOpen, or a header code
  // (kEndOfFile, kBadMagic, kUnreadableFile).
  int open(const std::string& name);

  // Walks the records from the first one and stops at the first whose item
  // is `item` (a numbered record matching `numberedRecordCode` for item 13).
  // Returns its 1-based position with its data in `data`, or kNoRecord,
  // kEndOfFile (a record cut by the end of the file), kBadFormat,
  // kBeyondRecord, kNoMemory.
  int find(int item, std::string_view numberedRecordCode, std::vector<unsigned char>& data);

  ByteOrder order() const { return header_.order; }
  const ZoneFileHeader& header() const { return header_; }
  std::uint64_t size() const { return size_; }

  // Reads the record whose header starts at `offset`: its data, and in
  // `next` the offset of the record after it. 0, kEndOfFile (cut by the end
  // of the file) or kNoMemory.
  int readRecordAt(std::uint64_t offset, std::vector<unsigned char>& data, std::uint64_t& next);

 private:
  struct Closer {
    void operator()(std::FILE* file) const { std::fclose(file); }
  };
  std::unique_ptr<std::FILE, Closer> file_;
  std::uint64_t size_ = 0;
  ZoneFileHeader header_;
};

}  // namespace pc::zonedb
