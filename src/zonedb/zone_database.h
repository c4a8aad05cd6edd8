// Read queries of the work zone's tool database "zone.inf", each one a
// complete transaction under the zone lock.
#pragma once

#include <span>

namespace pc {

// Status: the 1-based position of the record found (>= 1), or a negative
// error code (-23: no record of that type).
int zoneRealValue(int item, float& value);
// The text of the record is cut to the buffer length minus one and
// blank-padded; all blanks when the status is below 1.
int zoneTextValue(int number, std::span<char> text);

}  // namespace pc
