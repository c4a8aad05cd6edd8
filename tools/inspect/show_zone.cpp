// show for the zone database: header, byte order, every record decoded.
#include <cstdio>
#include <string>
#include <vector>

#include "json_stream.h"
#include "show.h"
#include "zonedb/zone_record_file.h"
#include "zonedb/zone_status.h"

namespace pc::inspect {

namespace {

using zonedb::RecordFields;

// Every field of a record in the order its format lists them; false with
// `error` when a field cannot be decoded.
bool decodeFields(RecordFields& fields, nlohmann::json& values, std::string& error) {
  values = nlohmann::json::array();
  while (true) {
    char type = 0;
    int status = fields.nextType(type);
    if (status == zonedb::kBeyondRecord) return true;  // the format is exhausted
    if (status != 0) {
      error = "a format of 5-character tokens (3-digit count, type letter C L W I R D S, blank)";
      return false;
    }
    switch (type) {
      case 'C': { char v = 0; status = fields.readChar(v); values.push_back(std::string(1, v)); break; }
      case 'L': { bool v = false; status = fields.readLogical(v); values.push_back(v); break; }
      case 'W': { std::int16_t v = 0; status = fields.readWord(v); values.push_back(v); break; }
      case 'I': { std::int32_t v = 0; status = fields.readInteger(v); values.push_back(v); break; }
      case 'R': { float v = 0; status = fields.readReal(v); values.push_back(number(v)); break; }
      case 'D': { double v = 0; status = fields.readDouble(v); values.push_back(v); break; }
      default: { std::string v; status = fields.readText(v); values.push_back(v); break; }
    }
    if (status != 0) {
      values.erase(values.size() - 1);
      error = std::string("the data of a '") + type + "' field, the record ends first";
      return false;
    }
  }
}

std::string headerText(const unsigned char* h) {
  std::string text;
  for (std::size_t i = 24; i < 152 && h[i] != 0; ++i) text += static_cast<char>(h[i]);
  return text;
}

}  // namespace

int showZoneDatabase(const std::string& path, const ShowOptions& options) {
  zonedb::ZoneRecordFile file;
  const int opened = file.open(path);
  if (opened != 0) {
    const char* what = opened == zonedb::kBadMagic       ? "the magic QZTB (either byte order)"
                       : opened == zonedb::kEndOfFile    ? "a 160-byte header"
                       : opened == zonedb::kUnreadableFile ? "a readable file (flag byte 154 set, first record after the header)"
                                                           : "a readable file";
    return reportDamage(path, fileio::ReadProblem{0, 0, what});
  }
  unsigned char raw[zonedb::kHeaderSize] = {};
  if (std::FILE* f = std::fopen(path.c_str(), "rb")) {
    if (std::fread(raw, 1, sizeof raw, f) != sizeof raw) raw[24] = 0;
    std::fclose(f);
  }
  const zonedb::ZoneFileHeader& h = file.header();
  const char* order = h.order == zonedb::ByteOrder::Little ? "little-endian" : "big-endian";
  JsonStream json(stdout);
  if (options.json) {
    json.beginObject();
    json.value("file", path);
    json.value("kind", "zone-database");
    json.value("header", {{"byte_order", order}, {"last_record_offset", h.lastRecordOffset},
                          {"first_record_offset", h.firstRecordOffset}, {"record_count", h.recordCount},
                          {"text", nlohmann::json(headerText(raw))},
                          {"flags", {raw[152], raw[153], raw[154], raw[155], raw[156]}}});
    json.beginArray("records");
  } else {
    std::printf("zone database %s: %s, first record at %u, last at %u, %u records; text \"%s\"\n", path.c_str(), order,
                h.firstRecordOffset, h.lastRecordOffset, h.recordCount, headerText(raw).c_str());
  }
  std::vector<unsigned char> data;
  std::uint64_t offset = h.firstRecordOffset;
  std::int64_t position = 0;
  fileio::ReadProblem problem;
  bool damaged = false;
  while (offset < file.size()) {
    ++position;
    std::uint64_t next = 0;
    if (file.readRecordAt(offset, data, next) != 0) {
      problem = {static_cast<std::int64_t>(offset), position, "a record header and its data, the file ends first"};
      damaged = true;
      break;
    }
    zonedb::RecordKey key;
    RecordFields fields(data, h.order);
    nlohmann::json values;
    std::string error;
    if (zonedb::decodeRecordKey(data, key) != 0 || fields.status() != 0) {
      error = "a format text ended by NUL, then a state and a 2-character type code";
    } else {
      decodeFields(fields, values, error);
    }
    const int item = error.empty() ? zonedb::itemOfRecord(key, std::string_view(key.code, 2)) : 0;
    const bool deleted = key.state == 'X' || key.state == 'x';
    const std::string code(key.code, 2);
    if (options.json) {
      nlohmann::json j{{"position", position}, {"offset", offset}, {"length", data.size()},
                       {"format", std::string(fields.format())}, {"state", std::string(1, key.state)},
                       {"deleted", deleted}, {"code", code}, {"item", item}, {"values", values}};
      if (!error.empty()) j["error"] = "expected " + error;
      json.element(j);
    } else {
      std::printf("record %lld at %llu  %s  type %s  item %d  format \"%s\"  values %s%s\n",
                  static_cast<long long>(position), static_cast<unsigned long long>(offset),
                  deleted ? "deleted" : "live", code.c_str(), item, std::string(fields.format()).c_str(),
                  values.dump(-1, ' ', false, nlohmann::json::error_handler_t::replace).c_str(),
                  error.empty() ? "" : ("  (expected " + error + ")").c_str());
    }
    offset = next;
  }
  if (options.json) {
    json.end();
    json.value("records_found", position - (damaged ? 1 : 0));
    json.end();
  }
  std::fflush(stdout);
  return damaged ? reportDamage(path, problem) : kExitClean;
}

}  // namespace pc::inspect
