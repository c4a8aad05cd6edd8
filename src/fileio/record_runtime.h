// The record I/O runtime under the numbered-unit file layer: files addressed
// by small unit numbers, formatted (text records, one per line) or
// unformatted (binary records framed by their byte count).
//
// Statuses: 0 success, -1 end of file, a positive value for an error.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace pc::fileio {

inline constexpr int kIoOk = 0;
inline constexpr int kIoEnd = -1;
// Positive statuses, one per kind of failure.
inline constexpr int kIoErrorUnit = 1;    // unit not open, or not of the form/access the operation needs
inline constexpr int kIoErrorOpen = 2;    // the file could not be opened (or created)
inline constexpr int kIoErrorRecord = 3;  // damaged framing, a record shorter than asked, a line too long
inline constexpr int kIoErrorSystem = 4;  // the system failed a read, write, seek, flush, close or delete

// Unit -1 in a text write means standard output.
inline constexpr int kStandardOutputUnit = -1;

enum class OpenDisposition { Old, New, Unknown };
enum class FileForm { Formatted, Unformatted };

// Opens `unit` on the named file for sequential access, positioned at its
// start. Old: must exist. New: must not exist, created. Unknown: opened when
// it exists, created otherwise. Status 0 when open; non-zero: nothing opened.
// A unit opened only to be read is refused on anything but a regular file:
// a FIFO, a socket or a device could block the run or never end. Any unit
// is refused on a FIFO or a socket, which are never opened blocking.
enum class UnitUse { ReadWrite, Read };
int openUnit(int unit, const std::string& name, OpenDisposition disposition, FileForm form,
             UnitUse use = UnitUse::ReadWrite);
// Closes the unit (and deletes its file when asked). A pending write error,
// or a failure to flush, gives a positive status; the unit is free afterwards.
int closeUnit(int unit, bool deleteFile = false);
bool isUnitOpen(int unit);
bool namedFileExists(const std::string& name);
int rewindUnit(int unit);
int backspaceUnit(int unit);

// Unformatted records. readRecord transfers the first `size` bytes of the next
// record and moves past the record; a record shorter than `size`, or damaged
// framing, is an error (positive status).
int readRecord(int unit, void* data, std::size_t size);
int writeRecord(int unit, const void* data, std::size_t size);

// Formatted records: one line each, without its line end.
// A line end is "\n" or "\r\n"; a last line without one is still a record.
// Lines longer than kMaxTextRecord are a record error.
inline constexpr std::size_t kMaxTextRecord = std::size_t{1} << 20;
int readTextRecord(int unit, std::string& record);
int writeTextRecord(int unit, std::string_view record);

// Closes every open unit, flushing pending writes (also done at process exit).
void closeAllUnits();

}  // namespace pc::fileio
