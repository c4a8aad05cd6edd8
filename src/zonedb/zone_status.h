// Status codes of the zone database. A query's status is the 1-based
// position of the record found (>= 1) or one of these negative codes. A text
// longer than the caller's buffer is cut to it, not refused.
#pragma once

namespace pc::zonedb {

inline constexpr int kUnreadableFile = -13;   // flag byte cleared, or a damaged header
inline constexpr int kCannotOpen = -21;       // file (or its lock) cannot be opened
inline constexpr int kNoRecord = -23;         // no record of the requested type
inline constexpr int kEndOfFile = -25;        // a read met the end of the file
inline constexpr int kBadMagic = -27;         // neither byte order of the magic
inline constexpr int kBadFormat = -31;        // another format, or an unknown type letter
inline constexpr int kWrongFieldType = -33;   // a field of another type than requested
inline constexpr int kBeyondRecord = -34;     // a field beyond the end of the record data
inline constexpr int kNoMemory = -41;
inline constexpr int kTextOverLimit = -42;    // a text longer than kMaxTextLength

inline constexpr int kMaxTextLength = 241;

}  // namespace pc::zonedb
