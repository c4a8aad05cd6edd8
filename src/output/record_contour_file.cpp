#include "output/record_contour_file.h"

#include <cstring>

#include "env/path_expander.h"
#include "fileio/little_endian.h"
#include "fileio/record_runtime.h"
#include "fileio/sequential_open.h"
#include "output/lost_output.h"
#include "output/outline_check.h"
#include "output/outline_list.h"
#include "output/output_file.h"

namespace pc {

namespace {

constexpr std::size_t kRecordSize = kContourRecordBytes;
constexpr int kCreateNewFile = 2;

int defaultFreeUnit() { return fileio::freeUnit(); }
int defaultOpenUnformatted(int unit, std::string_view name, int mode) {
  // A refused file is a lost output, reported like that of every other form.
  return fileio::openUnformatted(unit, name, mode, fileio::RefusedOpen::ReturnStatus);
}
bool defaultIsUnitOpen(int unit) { return fileio::isUnitOpen(unit); }
int defaultWriteRecord(int unit, const void* data, std::size_t size) { return fileio::writeRecord(unit, data, size); }
int defaultCloseUnit(int unit, bool deleteFile) { return fileio::closeUnit(unit, deleteFile); }

[[noreturn]] void loseRecordContourFile() {
  char name[512];
  std::strcpy(name, kRecordContourFileName);
  expandNameInPlace(name, sizeof name);
  reportLostOutput(name, kRecordContourFileMode);
}

}  // namespace

RecordUnitOps defaultRecordUnitOps() {
  return RecordUnitOps{defaultFreeUnit, defaultOpenUnformatted, defaultIsUnitOpen, defaultWriteRecord,
                       defaultCloseUnit};
}

RecordUnitOps& recordUnitOps() {
  static RecordUnitOps ops = defaultRecordUnitOps();
  return ops;
}

void openRecordContourFile(int& unit, int& status) {
  unit = recordUnitOps().freeUnit();
  if (unit < 0) loseRecordContourFile();  // no unit to open the file on
  status = recordUnitOps().openUnformatted(unit, kRecordContourFileName, kCreateNewFile);
  if (status > 0) loseRecordContourFile();  // the system refused the file
  if (status == EXPAND_NOT_FOUND) status = 0;
}

void writeContourRecord(int unit, float x, float y, float z, std::int32_t code, std::int16_t flag) {
  char data[kRecordSize];
  char* p = fileio::putFloatLE(fileio::putFloatLE(fileio::putFloatLE(data, x), y), z);
  fileio::putInt16LE(fileio::putInt32LE(p, code), flag);
  if (recordUnitOps().writeRecord(unit, data, sizeof data) != 0) loseRecordContourFile();
}

void closeRecordContourFile(int unit) {
  writeContourRecord(unit, kSeparatorValue, kSeparatorValue, kSeparatorValue, kRecordSeparatorCode, 0);
  if (recordUnitOps().closeUnit(unit, false) != 0) loseRecordContourFile();
}

int writeRecordContourFile(const CheckedArray<Pocket*>& pockets) {
  if (pockets.count < 1) return 0;
  CheckedArray<Point> outline = makeOutlineList(pockets);

  int unit = -1;
  int status = 0;
  openRecordContourFile(unit, status);
  if (status != 0) return -1;
  if (!recordUnitOps().isUnitOpen(unit)) loseRecordContourFile();

  const bool checked = writeCheckedOutlines(pockets, outline, [&](float z) {
    for (std::int32_t e = 0; e < outline.count; ++e) {
      const Point& p = outline.data[e];
      if (isPointEntry(p)) {
        writeContourRecord(unit, p.x, p.y, z, kRecordPointCode, 1);
      } else {
        writeContourRecord(unit, kSeparatorValue, kSeparatorValue, kSeparatorValue, kRecordSeparatorCode, 0);
      }
    }
  });
  closeRecordContourFile(unit);
  return checked ? 0 : -1;
}

}  // namespace pc
