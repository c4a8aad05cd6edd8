// The operating-system services the program needs, behind one small layer so
// that a Windows build only has to supply another implementation of this file.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace pc::platform {

// Native directory separator ('/' here, '\\' on Windows).
char nativeSeparator();

// Process environment. An unset variable gives nullopt (a set but empty one "").
std::optional<std::string> getEnv(const std::string& name);
bool setEnv(const std::string& name, const std::string& value);
bool unsetEnv(const std::string& name);

// Full path of the running executable, or nullopt when it cannot be had.
std::optional<std::string> executablePath();

std::uint32_t processId();
void sleepMilliseconds(unsigned milliseconds);

// File attributes. Each is false/nullopt when the name does not exist.
bool pathExists(const std::string& name);
bool isRegularFile(const std::string& name);
bool isDirectory(const std::string& name);
// Modification time in seconds since the epoch; nullopt when absent.
std::optional<std::int64_t> modificationTime(const std::string& name);

// Creates one directory level. 0 on success, 1 when it already exists or
// access is denied (callers treat both as benign), -1 on any other failure.
int makeDirectory(const std::string& name);
// Removes one file; true on success.
bool removeFile(const std::string& name);

// Names (not paths) of the entries of a directory, in an unspecified order;
// empty when the directory cannot be read.
std::vector<std::string> listDirectory(const std::string& directory);

// Creates one directory level and tells exactly what happened, for callers
// that must tell an existing directory from a refused creation.
enum class DirectoryCreation { created, alreadyExists, accessDenied, failed };
DirectoryCreation createDirectory(const std::string& name);

// Name of the directory that holds this platform's executables in the
// suite's installation layout (<home>/exe/<this>/<program>).
const char* platformDirectoryName();

// The variable that the configuration sets to 1 for this platform, so that
// the suite's files can test for it ("LINUX" here, "WINDOWS" on Windows).
const char* platformConfigurationVariable();

// Converts the `length` UTF-8 bytes at `text` to the process code page in
// place, keeping at most `size` - 1 bytes and a NUL; gives the new length.
// The identity where the code page is UTF-8.
std::size_t utf8ToProcessCodePage(char* text, std::size_t length, std::size_t size);

// Stops a process running under a debugger here. Without a debugger the
// process ends abnormally (SIGTRAP on POSIX systems).
void breakpointTrap();

// Broken-down local time of the current second.
struct LocalTime {
  int year = 0;    // four digits
  int month = 0;   // 1..12
  int day = 0;     // 1..31
  int hour = 0;    // 0..23
  int minute = 0;  // 0..59
  int second = 0;  // 0..60
};
// Seconds since the epoch, and their local time (nullopt when the time
// cannot be converted).
std::int64_t currentTime();
std::optional<LocalTime> localTime(std::int64_t secondsSinceEpoch);

// Storage for the run's large arrays: one uninitialised block, backed by huge
// pages where the system offers them, which saves most of the page faults of
// a multi-million-point part. nullptr when it cannot be had; release with
// releaseLarge.
void* allocateLarge(std::size_t bytes);
void releaseLarge(void* block);

// Creates `name` only when it does not exist yet, readable and writable by
// its owner only, and writes `content` into it. A file whose content could
// not be written is removed again.
enum class ExclusiveCreation { Created, Exists, Failed, WriteFailed };
ExclusiveCreation createExclusiveFile(const std::string& name, std::string_view content);

// Opens an existing file for reading with the standard I/O `mode` ("rb" or
// "r+b") without ever blocking: a FIFO or a socket is refused, and with
// `regularOnly` anything but a regular file (a device, a directory) too. A
// refused file is reported like one that cannot be opened: nullptr.
std::FILE* openExistingFile(const std::string& name, const char* mode, bool regularOnly);

// A read-only stream over `size` bytes at `data`, which must outlive it;
// nullptr when it cannot be had.
std::FILE* openMemoryStream(const void* data, std::size_t size);

// The version resource that the system itself keeps in an executable, where
// there is one (Windows); elsewhere the build places its own section, which
// the caller reads. `fixed` gets the thirteen fields of the fixed block,
// `strings` those of `names` found, keyed
// "\StringFileInfo\<language><code page>\<name>" (lower-case hexadecimal).
enum class VersionResource { Found, Missing, Unreadable, NotNative };
VersionResource readVersionResource(const std::string& file, const std::vector<std::string>& names,
                                    std::array<std::uint32_t, 13>& fixed,
                                    std::map<std::string, std::string>& strings);

}  // namespace pc::platform
