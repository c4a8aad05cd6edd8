#include "contours/contour_info_file.h"

#include <cmath>

#include "fileio/little_endian.h"
#include "fileio/record_runtime.h"
#include "fileio/sequential_open.h"

namespace pc {

namespace {

constexpr char kContourInfoName[] = "$TMP/trxcon.inf";
constexpr double kZChange = 0.0001;
constexpr double kNoPreviousZ = 999999999.0;

}  // namespace

int openContourInfoFile(int& unit) {
  unit = fileio::freeUnit();
  if (unit < 0) return fileio::kIoErrorUnit;
  return fileio::openUnformatted(unit, kContourInfoName, 1);
}

int readContourRecord(int unit, float& x, float& y, float& z) {
  unsigned char data[kContourInfoRecordBytes];
  if (fileio::readRecord(unit, data, kContourInfoRecordBytes) != fileio::kIoOk) return 1;
  decodeContourInfoRecord(data, x, y, z);
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
