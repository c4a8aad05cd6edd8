// The contour information file "$TMP/trxcon.inf": the Z-level contours of the
// current tool as one sequence of (x, y, z) records in which separator
// records end the contours.
//
// Record layout, inside the unformatted framing of the record runtime
// (fileio/record_runtime.cpp):
//
//   offset in data  size  type                            meaning
//   0               4     float32, little-endian          x
//   4               4     float32, little-endian          y
//   8               4     float32, little-endian          z
//
// No header, no trailer record. A longer record yields its first 12 bytes;
// a shorter one is a failed read.
#pragma once

#include <cstddef>
#include <cstdint>

#include "fileio/little_endian.h"

namespace pc {

// Records whose three values all lie below this magnitude are points.
inline constexpr double kContourRecordLimit = 90000.0;

// A point record: |x|, |y| and |z| below the limit (widened to double). Any
// other record, NaN included, is a separator.
inline bool isContourPoint(float x, float y, float z) {
  const double dx = x, dy = y, dz = z;
  return dx < kContourRecordLimit && dx > -kContourRecordLimit && dy < kContourRecordLimit &&
         dy > -kContourRecordLimit && dz < kContourRecordLimit && dz > -kContourRecordLimit;
}

inline constexpr std::size_t kContourInfoRecordBytes = 12;

// The three values of a record's first 12 data bytes.
inline void decodeContourInfoRecord(const unsigned char* data, float& x, float& y, float& z) {
  x = fileio::loadFloatLE(data);
  y = fileio::loadFloatLE(data + 4);
  z = fileio::loadFloatLE(data + 8);
}

// Takes a free unit and opens the file on it, as an existing unformatted
// file at its first record. Returns the name expansion's code: 0 when the
// file is open; anything else (-21 missing, -43 undefined variable...) means
// nothing was opened and no close is needed.
int openContourInfoFile(int& unit);

// Reads the next record's three floats: 0 when read; 1 at the end of the file
// or on any read error (short record, damaged framing), after which the out
// values are not to be used.
int readContourRecord(int unit, float& x, float& y, float& z);

void closeContourInfoFile(int unit);

// The counts of the first pass over the file, which size the run's arrays.
struct ContourCounts {
  std::int32_t nz = 0;  // changes of Z along the points of the file
  std::int32_t np = 0;  // records, points and separators together
  std::int32_t nc = 0;  // separator records
};

// Reads the whole file once; a file that does not open leaves every count 0.
// Counting stops at kMaxContourRecords records, so that the arrays sized from
// the counts (ten spare entries added) stay addressable.
inline constexpr std::int32_t kMaxContourRecords = INT32_MAX - 10;
ContourCounts countContourInfoFile();

}  // namespace pc
