// Opening numbered-unit files by a name written with path variables.
#pragma once

#include <string_view>

namespace pc::fileio {

// Lowest unit number from 3 upward that is not open; -1 when that cannot be
// told.
int freeUnit();

// True exactly when expandFileName of the name gives EXPAND_OK.
bool filePresent(std::string_view name);

// Opens a formatted sequential file. Modes: 1 read, 2 write (replace), 3
// append; a negative mode makes every failure fatal. Returns the error code
// (0 success, 1..5 as documented in sequential_open.cpp). The unit is
// closed after a failure.
int opensq(int unit, std::string_view name, int mode);

// Opens an unformatted sequential file; returns the name expansion's code.
// Mode 2 deletes an existing file first and creates a new one (a code of
// EXPAND_NOT_FOUND then means success); other modes open an existing file
// only when the code is 0.
// A name that expanded but whose file the system refuses ends the run with
// the layer's fatal report, unless the caller asks to have the runtime's
// (positive) status back, to report the loss in its own words.
enum class RefusedOpen { EndRun, ReturnStatus };
int openUnformatted(int unit, std::string_view name, int mode, RefusedOpen onRefusal = RefusedOpen::EndRun);

// Removes the named file; returns the expansion code, or -21 when the file
// could not be removed.
int deleteFile(std::string_view name);

}  // namespace pc::fileio
