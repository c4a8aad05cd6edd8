// Tagged record file, binary, little-endian, no padding:
//
//   offset  size  type     meaning
//   0       4     int32    byte-order mark, 256 (bytes 00 01 00 00)
//   4       ...            records back to back, each a tag byte and its payload:
//
//   tag    payload                                           size
//   b, p   a float32, b float32                              1 + 8
//   c, r   a int32, b int32 (truncated toward zero)          1 + 8
//   d, m   a int32 (truncated toward zero)                   1 + 4
//   e, n   a float32, b int32 (truncated toward zero)        1 + 8
//   f      a float32                                         1 + 4
//
// Integer fields of values outside the int32 range saturate; NaN gives 0.
#include "output/tagged_file.h"

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

void closeTaggedFile(TaggedFile& file) {
  if (!file.out.close()) reportLostOutput(file.name.c_str(), file.mode.c_str());
}

}  // namespace pc
