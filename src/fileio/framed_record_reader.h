// Reading an unformatted sequential file record by record, with the offset
// and number of each record, for tools that show or check such files. The
// framing is that of the record runtime (record_runtime.cpp): a little-endian
// int32 byte count n, n bytes of data, n again.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>

#include "fileio/byte_stream.h"

namespace pc::fileio {

enum class RecordRead { Record, End, Damaged };

class FramedRecordReader {
 public:
  bool open(const std::string& path) { return stream_.open(path); }

  // Reads the next record: its byte count in `count` and its first
  // min(count, size) bytes in `data`. Damaged: a cut count, a count above
  // INT32_MAX, a record cut by the end of the file, or a trailer that
  // differs; problem() then says where and what was expected.
  RecordRead next(unsigned char* data, std::size_t size, std::uint32_t& count);

  // 1-based number and offset of the record last read (or being read).
  std::int64_t recordNumber() const { return number_; }
  std::int64_t recordOffset() const { return recordOffset_; }
  const ReadProblem& problem() const { return problem_; }
  // Marks the record last read as damaged for a reason of the caller's (a
  // record too short for its format, for example).
  RecordRead damaged(std::string expected);
  std::int64_t fileSize() const { return stream_.size(); }

 private:
  ByteStream stream_;
  std::int64_t number_ = 0;
  std::int64_t recordOffset_ = 0;
  ReadProblem problem_;
};

}  // namespace pc::fileio
