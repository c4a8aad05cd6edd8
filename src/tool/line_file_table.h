// The line file table: up to 100 byte streams opened by name and read line by
// line, used by the tool parameter reader.
#pragma once

#include <span>
#include <string_view>

namespace pc {

inline constexpr int kLineFileSlots = 100;

// Statuses of the line file operations.
inline constexpr int kLineOk = 0;
inline constexpr int kLineIoError = -12;       // open (not "w+b"), close or read failed
inline constexpr int kLineBadMode = -13;       // mode index 4 or more
inline constexpr int kLineCreateFailed = -22;  // open failed with "w+b"
inline constexpr int kLineEnd = -23;           // end of the stream before any byte
inline constexpr int kLinePartial = -25;       // end of the stream inside a line
inline constexpr int kLineTooLong = -42;       // 1023 bytes without a line feed

// Opens the named file (at most 1024 characters, trailing blanks dropped).
// |mode| selects "r+b" (0), "rb" (1), "w+b" (2) or "a+b" (3). On success
// `handle` is the lowest free entry 0..99; otherwise it is -1. A full table
// gives the same status as a failed open of that mode.
void lineFileOpen(int& handle, std::string_view name, int mode, int& status);

// Closes the stream and frees the entry. An unknown handle gives -12.
void lineFileClose(int handle, int& status);

// Reads one line of at most 1023 bytes: the line feed and the carriage
// returns before it are removed, the line is cut to the buffer and
// blank-padded. A stream error, or an unknown handle, gives -12.
void lineFileReadLine(int handle, std::span<char> buffer, int& status);

}  // namespace pc
