// The work-zone number files "workzone.num": the zone's own number and the
// suite-wide counter of numbers handed out.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace pc {

// The zone's number: read from "$TRXZONE/workzone.num" when that file
// exists, otherwise taken from the suite-wide counter (which is advanced)
// and written into the zone's file. nullopt after a fatal message.
std::optional<std::string> zoneNumber();

// The value of the first line as the counter reads it: optional blanks, an
// optional "0x", then hexadecimal digits (saturating at 0xffffffff);
// nullopt when there are no digits.
std::optional<std::uint32_t> counterValue(std::string_view line);

// The number handed out after `previous` (1 when there was none; after
// 0xffffffff numbering starts again at 1).
std::uint32_t nextZoneNumber(std::optional<std::uint32_t> previous);

}  // namespace pc
