#include "fileio/framed_record_reader.h"

#include <algorithm>

#include "fileio/little_endian.h"

namespace pc::fileio {

RecordRead FramedRecordReader::damaged(std::string expected) {
  problem_ = ReadProblem{recordOffset_, number_, std::move(expected)};
  return RecordRead::Damaged;
}

RecordRead FramedRecordReader::next(unsigned char* data, std::size_t size, std::uint32_t& count) {
  recordOffset_ = stream_.offset();
  ++number_;
  unsigned char frame[4];
  const std::size_t got = stream_.read(frame, sizeof frame);
  if (got == 0 && !stream_.failed()) {
    --number_;
    return RecordRead::End;
  }
  if (got < sizeof frame) return damaged("a 4-byte record length, the file ends after " + std::to_string(got));
  count = loadLE32(frame);
  if (count > 0x7FFFFFFFu) return damaged("a record length of at most 2147483647, found " + std::to_string(count));
  const std::size_t keep = std::min<std::size_t>(size, count);
  if (stream_.read(data, keep) < keep || !stream_.skip(count - keep)) {
    return damaged(std::to_string(count) + " data bytes, the file ends first");
  }
  if (stream_.read(frame, sizeof frame) < sizeof frame) {
    return damaged("the trailing record length " + std::to_string(count) + ", the file ends first");
  }
  if (loadLE32(frame) != count) {
    return damaged("the trailing record length " + std::to_string(count) + ", found " +
                   std::to_string(loadLE32(frame)));
  }
  return RecordRead::Record;
}

}  // namespace pc::fileio
