#include "zonedb/zone_names.h"

#include <optional>

#include "platform/platform.h"
#include "zonedb/zone_database_testing.h"

namespace pc::zonedb {

namespace {

struct ZoneNames {
  std::string database;
  std::string lock;
};

std::optional<ZoneNames>& cachedNames() {
  static std::optional<ZoneNames> names;
  return names;
}

const ZoneNames& zoneNames() {
  std::optional<ZoneNames>& names = cachedNames();
  if (!names) {
    const std::optional<std::string> zone = platform::getEnv("TRXZONE");
    // An empty value would otherwise put the database at the root.
    const std::string directory = zone && !zone->empty() ? *zone : std::string(1, '.');
    const std::string prefix = directory + platform::nativeSeparator();
    names = ZoneNames{prefix + "zone.inf", prefix + "zone.lck"};
  }
  return *names;
}

}  // namespace

const std::string& zoneDatabaseName() { return zoneNames().database; }
const std::string& zoneLockName() { return zoneNames().lock; }

void resetZoneNamesForTesting() { cachedNames().reset(); }

}  // namespace pc::zonedb
