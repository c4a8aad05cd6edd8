// The unit scale of the run: the zone database's scale, overridden by a local
// scale file of the temporary directory, decided on the first call and
// remembered for every later one.
#include "tool/unit_scale.h"

#include <array>
#include <cmath>
#include <string>

#include "env/fixed_field.h"
#include "env/path_expander.h"
#include "fileio/list_directed.h"
#include "fileio/record_runtime.h"
#include "fileio/sequential_open.h"
#include "tool/unit_scale_testing.h"
#include "zonedb/zone_database.h"

namespace pc {

namespace {

constexpr int kUndecided = 0;
constexpr int kMetric = 1;
constexpr int kInch = 2;

constexpr std::string_view kLocalScaleFile = "$TMP/localscale.dat";
constexpr std::string_view kLocalScaleCopy = "$TMP/localscale.tmp";
constexpr float kNoLocalScale = -1.0f;

struct UnitState {
  int unitSystem = kUndecided;
  float unitScale = 0.0f;
  float databaseScale = 0.0f;
  float localScale = 0.0f;
};

UnitState& state() {
  static UnitState s;
  return s;
}

int realZoneScaleQuery(float& value) { return zoneRealValue(6, value); }

std::function<int(float&)>& zoneScaleQuery() {
  static std::function<int(float&)> query = realZoneScaleQuery;
  return query;
}

int unitSystemFromSettings() {
  std::array<char, 200> field;
  field.fill(' ');
  expandText("$TRXUNITS", field);
  return fieldText(std::string_view(field.data(), field.size())) == "inch" ? kInch : kMetric;
}

// The number at the front of the first record of the unit's file; `value`
// is left as it is when the record holds none (or is missing). Anything not
// a finite number counts as none, before it can reach the copy.
void readFirstReal(int unit, float& value) {
  std::string record;
  if (fileio::readTextRecord(unit, record) != fileio::kIoOk) return;
  std::size_t pos = 0;
  float read = value;
  if (fileio::readListReal(record, pos, read) == fileio::kListValue && std::isfinite(read)) value = read;
}

// The local scale of the temporary directory, kNoLocalScale when there is
// none. A ".dat" file is copied to the ".tmp" file, which later runs fall
// back on.
float localScaleFromFiles() {
  float local = kNoLocalScale;
  if (fileio::filePresent(kLocalScaleFile)) {
    const int unit = fileio::freeUnit();
    if (unit < 0 || fileio::opensq(unit, kLocalScaleFile, 1) != 0) return local;
    readFirstReal(unit, local);
    fileio::closeUnit(unit);
    // The copy goes nowhere when it cannot be created.
    if (fileio::opensq(unit, kLocalScaleCopy, 2) == 0) {
      fileio::writeListRecord(unit, fileio::formatListReal(local));
      fileio::closeUnit(unit);
    }
  } else if (fileio::filePresent(kLocalScaleCopy)) {
    const int unit = fileio::freeUnit();
    if (unit < 0 || fileio::opensq(unit, kLocalScaleCopy, 1) != 0) return local;
    readFirstReal(unit, local);
    fileio::closeUnit(unit);
  }
  return local;
}

void printLocalScaleBanner(float databaseScale, float localScale) {
  fileio::writeListRecord(fileio::kStandardOutputUnit, "*******");
  fileio::writeListRecord(fileio::kStandardOutputUnit,
                          "you are using local_scale " + fileio::formatListReal(databaseScale) + " " +
                              fileio::formatListReal(localScale));
  fileio::writeListRecord(fileio::kStandardOutputUnit, "*******");
}

}  // namespace

void unitScale(float* scale) {
  UnitState& s = state();
  if (s.unitSystem != kUndecided) {
    *scale = s.unitScale;
    return;
  }
  *scale = 0.0f;
  const int unitSystem = unitSystemFromSettings();

  if (zoneScaleQuery()(*scale) < 0) *scale = 1.0f;
  // A damaged record can hold anything: only a finite scale is one.
  if (!std::isfinite(*scale)) *scale = 1.0f;
  s.databaseScale = *scale;

  s.localScale = localScaleFromFiles();
  const float u = *scale;
  if (s.localScale < 0.0f) {
    s.localScale = u;
  } else if (s.localScale != u) {
    printLocalScaleBanner(u, s.localScale);
    *scale = s.localScale;
  }
  if (*scale <= 0.0f) *scale = 1.0f;

  s.unitSystem = unitSystem;
  s.unitScale = *scale;
}

namespace unit_scale_testing {

void reset() { state() = UnitState{}; }

void setZoneScaleQuery(std::function<int(float&)> query) {
  zoneScaleQuery() = query ? std::move(query) : std::function<int(float&)>(realZoneScaleQuery);
}

int unitSystem() { return state().unitSystem; }

}  // namespace unit_scale_testing

}  // namespace pc
