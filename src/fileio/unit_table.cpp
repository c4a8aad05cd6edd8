#include "fileio/unit_table.h"

namespace pc::fileio::detail {

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
