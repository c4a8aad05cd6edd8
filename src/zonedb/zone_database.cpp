// The read queries of the zone database. Each is a complete transaction:
// take the zone lock, open "zone.inf" read-only, find the record, decode it,
// close the file, release the lock. The file itself is never modified.
#include "zonedb/zone_database.h"

#include <algorithm>
#include <charconv>
#include <cstdint>
#include <string>
#include <vector>

#include "env/diagnostic_channels.h"
#include "platform/platform.h"
#include "zonedb/zone_database_testing.h"
#include "zonedb/zone_lock.h"
#include "zonedb/zone_names.h"
#include "zonedb/zone_record_file.h"
#include "zonedb/zone_record_format.h"
#include "zonedb/zone_status.h"

namespace pc {

namespace zonedb {

namespace {

LockTiming& queryLockTiming() {
  static LockTiming timing = systemLockTiming();
  return timing;
}

void reportLockedDatabase(const std::string& database, const std::string& lock) {
  fatal("Zone database '" + database + "' cannot be read: its lock file '" + lock +
        "' can be neither taken nor broken");
}

// Finds the record of `item` and checks its format and leading state and
// code fields; `decode` reads the value fields. Returns the record's position
// or a negative status.
template <typename Decode>
int readZoneRecord(int item, std::string_view numberedRecordCode, Decode&& decode) {
  ZoneLockGuard lock(zoneLockName(), queryLockTiming());
  const std::string& name = zoneDatabaseName();
  // A zone without a database simply has no record; a read creates nothing.
  if (!platform::pathExists(name)) return kNoRecord;
  if (!lock.held()) {
    // The database is there but out of reach: going on with a default in
    // place of its values (a unit scale of 1 for 25.4) would machine the
    // part wrong without a word.
    reportLockedDatabase(name, zoneLockName());
    return kCannotOpen;
  }
  if (!platform::isRegularFile(name)) return kCannotOpen;

  ZoneRecordFile file;
  if (const int status = file.open(name); status != 0) return status;
  std::vector<unsigned char> data;
  const int position = file.find(item, numberedRecordCode, data);
  if (position < 1) return position;

  RecordFields fields(data, file.order());
  if (fields.status() != 0) return fields.status();
  if (fields.format() != itemFormat(item)) return kBadFormat;
  char stateAndCode[3];
  for (char& c : stateAndCode) {
    if (const int status = fields.readChar(c); status != 0) return status;
  }
  if (const int status = decode(fields); status != 0) return status;
  return position;
}

std::string realText(float value) {
  char buffer[32];
  const auto result = std::to_chars(buffer, buffer + sizeof buffer, value);
  return std::string(buffer, result.ptr);
}

// The value fields of an item as text: an "S" text as stored, numbers in
// decimal, several numbers separated by one blank.
int readValueText(RecordFields& fields, std::string_view format, std::string& text) {
  // The value token is the third of the item's format, e.g. "002I ".
  const char type = format[13];
  const int count = (format[10] - '0') * 100 + (format[11] - '0') * 10 + (format[12] - '0');
  text.clear();
  for (int i = 0; i < count; ++i) {
    if (i > 0) text += ' ';
    int status = 0;
    if (type == 'S') {
      std::string value;
      status = fields.readText(value);
      if (status == 0 && value.size() > static_cast<std::size_t>(kMaxTextLength)) return kTextOverLimit;
      text += value;
    } else if (type == 'I') {
      std::int32_t value = 0;
      status = fields.readInteger(value);
      text += std::to_string(value);
    } else if (type == 'R') {
      float value = 0.0f;
      status = fields.readReal(value);
      text += realText(value);
    } else {
      return kBadFormat;
    }
    if (status != 0) return status;
  }
  return 0;
}

}  // namespace

void setLockTimingForTesting(const LockTiming& timing) {
  const LockTiming system = systemLockTiming();
  queryLockTiming() = LockTiming{timing.nowMilliseconds ? timing.nowMilliseconds : system.nowMilliseconds,
                                 timing.sleepMilliseconds ? timing.sleepMilliseconds : system.sleepMilliseconds};
}

}  // namespace zonedb

int zoneRealValue(int item, float& value) {
  using namespace zonedb;
  // Item 0 stands for deleted records and item 13 needs a record number:
  // neither is a real value of the zone.
  if (item < 1 || item >= kNumberedItem) return kNoRecord;
  float found = 0.0f;
  const int status = readZoneRecord(item, {}, [&found](RecordFields& fields) { return fields.readReal(found); });
  if (status >= 1) value = found;
  return status;
}

int zoneTextValue(int number, std::span<char> text) {
  using namespace zonedb;
  std::fill(text.begin(), text.end(), ' ');
  const int item = number >= 101 && number <= 113 ? number - 100 : kNumberedItem;
  const std::string code = numberedCode(number);
  const std::string_view format = itemFormat(item);
  std::string value;
  const int status = readZoneRecord(item, code, [&](RecordFields& fields) { return readValueText(fields, format, value); });
  if (status < 1 || text.empty()) return status;
  const std::size_t kept = std::min(value.size(), text.size() - 1);
  std::copy_n(value.begin(), kept, text.begin());
  return status;
}

}  // namespace pc
