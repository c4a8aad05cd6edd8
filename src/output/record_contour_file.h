// Run modes 2 and 4: the ordered pockets written to "$TMP/contour.bin" as a
// record contour file, one unformatted record per outline entry, through the
// numbered-unit file layer.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string_view>

#include "driver/checked_array.h"
#include "pockets/pocket_model.h"

namespace pc {

inline constexpr const char* kRecordContourFileName = "$TMP/contour.bin";
// Mode of the unit layer's creation of a new unformatted file, as shown when
// the file is lost.
inline constexpr const char* kRecordContourFileMode = "wb";

inline constexpr std::int32_t kRecordPointCode = -1003;
inline constexpr std::int32_t kRecordSeparatorCode = -1001;

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
