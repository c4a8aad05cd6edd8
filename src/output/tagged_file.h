// The tagged record file: a byte-order mark, then records of one tag letter
// and a small payload. Used for the rewritten contour file.
//
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
//
// The contour file of the default mode holds, per pocket: 'n' (Z as float,
// Z truncated), then for each contour (outer first, then the islands) one 'p'
// per point and an 'f' with 0.0, then 'e' (0.0, 0).
#pragma once

#include <cstdint>
#include <string>

#include "contours/point.h"
#include "fileio/byte_stream.h"
#include "fileio/framed_record_reader.h"
#include "output/output_file.h"

namespace pc {

struct TaggedFile {
  OutputFile out;
  std::string name;   // as opened, for the loss report
  std::string mode;
  bool swapBytes = false;  // opened for update: the stored mark was not 256
};

// Opens `name` with the standard I/O `mode`. A "w" mode writes the
// byte-order mark; an "r" mode reads it and sets swapBytes when it differs
// from 256. A file that cannot be opened ends the run through
// reportLostOutput (name and mode as given).
TaggedFile openTaggedFile(const char* name, const char* mode);

// Appends one record; 1 when `tag` is one of b p c r d m e n f, 0 (nothing
// written) otherwise. Write errors surface at closeTaggedFile.
int writeTaggedRecord(TaggedFile& file, char tag, float a, float b);

// For each run of points of `points[0..count)`: one 'p' record per point,
// then one 'f' record with 0.0. Separator entries write nothing.
void writeContours(TaggedFile& file, const Point* points, std::int32_t count);

// Closes the file; a write or close failure ends the run through
// reportLostOutput.
void closeTaggedFile(TaggedFile& file);

// One record as read back: the float and integer views of its payload, as
// its tag stores them (unused fields 0).
struct TaggedRecord {
  char tag = 0;
  float a = 0.0f;           // b p e n f
  float b = 0.0f;           // b p
  std::int32_t ia = 0;      // c r d m
  std::int32_t ib = 0;      // c r e n
  std::int64_t offset = 0;  // of the tag byte
};

// Payload size of a tag, 0 for a letter that is no tag.
std::size_t taggedPayloadSize(char tag);

// Reads a tagged file from its start. A mark that reads as 256 with the
// bytes reversed is a file of the other byte order, read as such.
class TaggedFileReader {
 public:
  // False when the file cannot be opened or holds no valid mark (problem()).
  bool open(const std::string& path);
  bool swapped() const { return swap_; }
  // Record, End, or Damaged: an unknown tag or a payload cut by the end.
  fileio::RecordRead next(TaggedRecord& record);
  std::int64_t recordNumber() const { return number_; }
  const fileio::ReadProblem& problem() const { return problem_; }

 private:
  fileio::ByteStream stream_;
  bool swap_ = false;
  std::int64_t number_ = 0;
  fileio::ReadProblem problem_;
};

}  // namespace pc
