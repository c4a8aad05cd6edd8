// Run modes 2 and 4: the ordered pockets written to "$TMP/contour.bin" as a
// record contour file, one unformatted record per outline entry, through the
// numbered-unit file layer.
//
// A sequential unformatted file (each record framed by its byte count as a
// little-endian int32 before and after the data), one record of 18 data
// bytes per outline entry and a final separator record, little-endian:
//
//   offset  size  type     point record      separator record
//   0       4     float32  x                 99999.0
//   4       4     float32  y                 99999.0
//   8       4     float32  Z of the pocket   99999.0
//   12      4     int32    -1003             -1001
//   16      2     int16    1                 0
//
// There is no pocket-end record: the outer contour, the islands and the next
// pocket all follow one another, each opened by a separator record.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string_view>

#include "fileio/little_endian.h"

#include "driver/checked_array.h"
#include "pockets/pocket_model.h"

namespace pc {

inline constexpr const char* kRecordContourFileName = "$TMP/contour.bin";
// Mode of the unit layer's creation of a new unformatted file, as shown when
// the file is lost.
inline constexpr const char* kRecordContourFileMode = "wb";

inline constexpr std::int32_t kRecordPointCode = -1003;
inline constexpr std::int32_t kRecordSeparatorCode = -1001;
inline constexpr std::size_t kContourRecordBytes = 18;

struct ContourRecord {
  float x = 0.0f;
  float y = 0.0f;
  float z = 0.0f;
  std::int32_t code = 0;
  std::int16_t flag = 0;
};

// The fields of a record's 18 data bytes.
inline ContourRecord decodeContourRecord(const unsigned char* data) {
  return ContourRecord{fileio::loadFloatLE(data), fileio::loadFloatLE(data + 4), fileio::loadFloatLE(data + 8),
                       fileio::loadInt32LE(data + 12), fileio::loadInt16LE(data + 16)};
}

// The unit-layer operations the writer uses. They are replaceable so that the
// loss of the file (no unit, failed open, failed write or close) can be
// exercised on demand.
struct RecordUnitOps {
  int (*freeUnit)();
  int (*openUnformatted)(int unit, std::string_view name, int mode);
  bool (*isUnitOpen)(int unit);
  int (*writeRecord)(int unit, const void* data, std::size_t size);
  int (*closeUnit)(int unit, bool deleteFile);
};

RecordUnitOps& recordUnitOps();
RecordUnitOps defaultRecordUnitOps();

// Takes a free unit and opens the file on it as a new unformatted file
// (replacing an existing one). `status` is the name expansion's code, with
// "no such file yet" (-21) turned into 0.
void openRecordContourFile(int& unit, int& status);
// One 18-byte record: x, y, z, code, flag.
void writeContourRecord(int unit, float x, float y, float z, std::int32_t code, std::int16_t flag);
// Writes the final separator record and closes the unit.
void closeRecordContourFile(int unit);

// 0 on success (an empty list creates nothing and leaves an existing file
// alone); -1 when the name cannot be expanded (no file) or a pocket fails the
// outline check (the file keeps the pockets before it and its final
// separator). A file that cannot be created or completely written ends the
// run through reportLostOutput.
int writeRecordContourFile(const CheckedArray<Pocket*>& pockets);

}  // namespace pc
