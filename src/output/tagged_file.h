// The tagged record file: a byte-order mark, then records of one tag letter
// and a small payload. Used for the rewritten contour file.
#pragma once

#include <cstdint>
#include <string>

#include "contours/point.h"
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

}  // namespace pc
