#include "output/tagged_file.h"

#include <bit>
#include <cstring>

#include "driver/float_truncation.h"
#include "fileio/little_endian.h"
#include "output/lost_output.h"

namespace pc {

namespace {

constexpr std::int32_t kByteOrderMark = 256;
constexpr std::size_t kLargestRecord = 9;

}  // namespace

TaggedFile openTaggedFile(const char* name, const char* mode) {
  TaggedFile file;
  file.name = name;
  file.mode = mode;
  if (!file.out.open(name, mode)) reportLostOutput(name, mode);
  if (mode[0] == 'w') {
    char mark[4];
    fileio::putInt32LE(mark, kByteOrderMark);
    file.out.write(mark, sizeof mark);
  } else if (mode[0] == 'r') {
    unsigned char mark[4] = {0, 0, 0, 0};
    const bool read = file.out.read(mark, sizeof mark) == sizeof mark;
    const std::int32_t stored = static_cast<std::int32_t>(static_cast<std::uint32_t>(mark[0]) |
                                                          static_cast<std::uint32_t>(mark[1]) << 8 |
                                                          static_cast<std::uint32_t>(mark[2]) << 16 |
                                                          static_cast<std::uint32_t>(mark[3]) << 24);
    file.swapBytes = !read || stored != kByteOrderMark;
  }
  return file;
}

int writeTaggedRecord(TaggedFile& file, char tag, float a, float b) {
  char* const start = file.out.reserve(kLargestRecord);
  char* p = start;
  *p++ = tag;
  switch (tag) {
    case 'b':
    case 'p':
      p = fileio::putFloatLE(fileio::putFloatLE(p, a), b);
      break;
    case 'c':
    case 'r':
      p = fileio::putInt32LE(fileio::putInt32LE(p, truncateToInt32(a)), truncateToInt32(b));
      break;
    case 'd':
    case 'm':
      p = fileio::putInt32LE(p, truncateToInt32(a));
      break;
    case 'e':
    case 'n':
      p = fileio::putInt32LE(fileio::putFloatLE(p, a), truncateToInt32(b));
      break;
    case 'f':
      p = fileio::putFloatLE(p, a);
      break;
    default:
      return 0;  // nothing committed
  }
  file.out.commit(p);
  return 1;
}

void writeContours(TaggedFile& file, const Point* points, std::int32_t count) {
  bool inRun = false;
  for (std::int32_t i = 0; i < count; ++i) {
    if (isPointEntry(points[i])) {
      writeTaggedRecord(file, 'p', points[i].x, points[i].y);
      inRun = true;
    } else if (inRun) {
      writeTaggedRecord(file, 'f', 0.0f, 0.0f);
      inRun = false;
    }
  }
  if (inRun) writeTaggedRecord(file, 'f', 0.0f, 0.0f);
}

std::size_t taggedPayloadSize(char tag) {
  switch (tag) {
    case 'b': case 'p': case 'c': case 'r': case 'e': case 'n': return 8;
    case 'd': case 'm': case 'f': return 4;
    default: return 0;
  }
}

namespace {

std::uint32_t loadWord(const unsigned char* p, bool swap) {
  const std::uint32_t v = fileio::loadLE32(p);
  return swap ? (v >> 24) | ((v >> 8) & 0xFF00u) | ((v << 8) & 0xFF0000u) | (v << 24) : v;
}
float loadFloat(const unsigned char* p, bool swap) { return std::bit_cast<float>(loadWord(p, swap)); }
std::int32_t loadInt(const unsigned char* p, bool swap) { return std::bit_cast<std::int32_t>(loadWord(p, swap)); }

}  // namespace

bool TaggedFileReader::open(const std::string& path) {
  number_ = 0;
  if (!stream_.open(path)) {
    problem_ = fileio::ReadProblem{0, 0, "a readable file"};
    return false;
  }
  unsigned char mark[4];
  if (stream_.read(mark, sizeof mark) < sizeof mark) {
    problem_ = fileio::ReadProblem{0, 0, "the 4-byte byte-order mark 256, the file is shorter"};
    return false;
  }
  if (loadWord(mark, false) == static_cast<std::uint32_t>(kByteOrderMark)) {
    swap_ = false;
  } else if (loadWord(mark, true) == static_cast<std::uint32_t>(kByteOrderMark)) {
    swap_ = true;
  } else {
    problem_ = fileio::ReadProblem{0, 0, "the byte-order mark 256 (00 01 00 00)"};
    return false;
  }
  return true;
}

fileio::RecordRead TaggedFileReader::next(TaggedRecord& record) {
  record = TaggedRecord{};
  record.offset = stream_.offset();
  unsigned char bytes[kLargestRecord];
  if (stream_.read(bytes, 1) == 0) {
    if (!stream_.failed()) return fileio::RecordRead::End;
    problem_ = fileio::ReadProblem{record.offset, number_ + 1, "a tag byte, the system failed the read"};
    return fileio::RecordRead::Damaged;
  }
  ++number_;
  record.tag = static_cast<char>(bytes[0]);
  const std::size_t payload = taggedPayloadSize(record.tag);
  if (payload == 0) {
    problem_ = fileio::ReadProblem{record.offset, number_,
                                   "a tag letter b p c r d m e n f, found byte " + std::to_string(bytes[0])};
    return fileio::RecordRead::Damaged;
  }
  if (stream_.read(bytes + 1, payload) < payload) {
    problem_ = fileio::ReadProblem{record.offset, number_,
                                   std::to_string(payload) + " payload bytes after tag '" +
                                       std::string(1, record.tag) + "', the file ends first"};
    return fileio::RecordRead::Damaged;
  }
  const unsigned char* p = bytes + 1;
  switch (record.tag) {
    case 'b': case 'p': record.a = loadFloat(p, swap_); record.b = loadFloat(p + 4, swap_); break;
    case 'c': case 'r': record.ia = loadInt(p, swap_); record.ib = loadInt(p + 4, swap_); break;
    case 'd': case 'm': record.ia = loadInt(p, swap_); break;
    case 'e': case 'n': record.a = loadFloat(p, swap_); record.ib = loadInt(p + 4, swap_); break;
    default: record.a = loadFloat(p, swap_); break;  // 'f'
  }
  return fileio::RecordRead::Record;
}

void closeTaggedFile(TaggedFile& file) {
  if (!file.out.close()) reportLostOutput(file.name.c_str(), file.mode.c_str());
}

}  // namespace pc
