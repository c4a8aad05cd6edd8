#include "zonedb/zone_record_file.h"

#include <new>

#include "fileio/memory_files.h"
#include "platform/platform.h"

#include "zonedb/zone_status.h"

namespace pc::zonedb {

namespace {

bool readAt(std::FILE* file, std::uint64_t offset, unsigned char* bytes, std::size_t size) {
  // Offsets come from the file: they are checked against its size before
  // getting here, and the file is well below the range of long.
  if (std::fseek(file, static_cast<long>(offset), SEEK_SET) != 0) return false;
  return std::fread(bytes, 1, size, file) == size;
}

}  // namespace

int ZoneRecordFile::open(const std::string& name) {
  // Never a FIFO or a device: the query would block or read for ever.
  file_.reset(fileio::openMemoryFile(name));
  if (!file_) file_.reset(platform::openExistingFile(name, "rb", true));
  if (!file_) return kCannotOpen;
  if (std::fseek(file_.get(), 0, SEEK_END) != 0) return kCannotOpen;
  const long end = std::ftell(file_.get());
  if (end < 0) return kCannotOpen;
  size_ = static_cast<std::uint64_t>(end);

  unsigned char header[kHeaderSize];
  if (size_ < kHeaderSize) return kEndOfFile;
  if (!readAt(file_.get(), 0, header, kHeaderSize)) return kEndOfFile;
  return decodeHeader(header, header_);
}

int ZoneRecordFile::find(int item, std::string_view numberedRecordCode,
                         std::vector<unsigned char>& data) {
  if (!file_) return kCannotOpen;
  std::uint64_t offset = header_.firstRecordOffset;
  if (offset > size_) return kEndOfFile;
  for (int position = 1;; ++position) {
    if (offset == size_) return kNoRecord;
    if (const int status = readRecordAt(offset, data, offset); status != 0) return status;
    RecordKey key;
    if (const int status = decodeRecordKey(data, key); status != 0) return status;
    if (itemOfRecord(key, numberedRecordCode) == item) return position;
  }
}

int ZoneRecordFile::readRecordAt(std::uint64_t offset, std::vector<unsigned char>& data, std::uint64_t& next) {
  if (!file_) return kCannotOpen;
  unsigned char recordHeader[kRecordHeaderSize];
  if (offset > size_ || size_ - offset < kRecordHeaderSize) return kEndOfFile;
  if (!readAt(file_.get(), offset, recordHeader, kRecordHeaderSize)) return kEndOfFile;
  const std::uint16_t length = recordDataLength(recordHeader, header_.order);
  offset += kRecordHeaderSize;
  if (size_ - offset < length) return kEndOfFile;
  try {
    data.resize(length);
  } catch (const std::bad_alloc&) {
    return kNoMemory;
  }
  if (length > 0 && !readAt(file_.get(), offset, data.data(), length)) return kEndOfFile;
  next = offset + length;
  return 0;
}

}  // namespace pc::zonedb
