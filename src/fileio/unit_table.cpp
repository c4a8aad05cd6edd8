#include "fileio/unit_table.h"

namespace pc::fileio::detail {

namespace {

std::unique_ptr<unsigned char[]>& spareBuffer() {
  static std::unique_ptr<unsigned char[]> spare;
  return spare;
}

}  // namespace

std::unique_ptr<unsigned char[]> takeUnitBuffer() {
  if (spareBuffer()) return std::move(spareBuffer());
  return std::unique_ptr<unsigned char[]>(new unsigned char[kBufferSize]);
}

void returnUnitBuffer(std::unique_ptr<unsigned char[]> buffer) {
  if (buffer && !spareBuffer()) spareBuffer() = std::move(buffer);
}

UnitTable& table() {
  static UnitTable instance;
  return instance;
}

int recordError(Unit& u, std::int64_t start) {
  u.setPosition(start);
  if (u.readFailed) {
    u.readFailed = false;
    return kIoErrorSystem;
  }
  return kIoErrorRecord;
}

}  // namespace pc::fileio::detail
