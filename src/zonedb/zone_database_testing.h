// Test seams of the zone database queries.
#pragma once

#include "zonedb/zone_lock.h"

namespace pc::zonedb {

// Forgets the names built from TRXZONE, so that the next query builds them
// again.
void resetZoneNamesForTesting();
// Replaces the clock and sleep of the queries' lock; empty members restore
// the system ones.
void setLockTimingForTesting(const LockTiming& timing);

}  // namespace pc::zonedb
