// Record layout of the contour information file, inside the unformatted
// framing of the record runtime (fileio/record_runtime.cpp):
//
//   offset in data  size  type                            meaning
//   0               4     float32, little-endian          x
//   4               4     float32, little-endian          y
//   8               4     float32, little-endian          z
//
// No header, no trailer record. A longer record yields its first 12 bytes.
#include "contours/contour_info_file.h"

#include <cmath>

#include "fileio/little_endian.h"
#include "fileio/record_runtime.h"
#include "fileio/sequential_open.h"

namespace pc {

namespace {

constexpr char kContourInfoName[] = "$TMP/trxcon.inf";
constexpr std::size_t kRecordBytes = 12;
constexpr double kZChange = 0.0001;
constexpr double kNoPreviousZ = 999999999.0;

}  // namespace

int openContourInfoFile(int& unit) {
  unit = fileio::freeUnit();
  if (unit < 0) return fileio::kIoErrorUnit;
  return fileio::openUnformatted(unit, kContourInfoName, 1);
}

int readContourRecord(int unit, float& x, float& y, float& z) {
  unsigned char data[kRecordBytes];
  if (fileio::readRecord(unit, data, kRecordBytes) != fileio::kIoOk) return 1;
  x = fileio::loadFloatLE(data);
  y = fileio::loadFloatLE(data + 4);
  z = fileio::loadFloatLE(data + 8);
  return 0;
}

void closeContourInfoFile(int unit) { fileio::closeUnit(unit); }

ContourCounts countContourInfoFile() {
  ContourCounts counts;
  int unit = 0;
  if (openContourInfoFile(unit) != 0) return counts;
  double previousZ = kNoPreviousZ;
  float x = 0.0f, y = 0.0f, z = 0.0f;
  while (counts.np < kMaxContourRecords && readContourRecord(unit, x, y, z) == 0) {
    ++counts.np;
    if (isContourPoint(x, y, z)) {
      const double zd = z;
      if (std::fabs(zd - previousZ) > kZChange) {
        ++counts.nz;
        previousZ = zd;
      }
    } else {
      ++counts.nc;
    }
  }
  closeContourInfoFile(unit);
  return counts;
}

}  // namespace pc
