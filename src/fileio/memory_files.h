// Memory-backed input files. Bytes registered under a file name are read from
// memory, instead of from the file of that name, by the record runtime and the
// line file table: the readers then run through the very code that reads the
// files, thousands of times a second (fuzzing), without touching the disk.
// Only opens for reading are served; name expansion still looks at the disk,
// so the file of that name must exist (an empty one will do).
#pragma once

#include <cstdio>
#include <span>
#include <string>

namespace pc::fileio {

// `bytes` is not copied and must stay valid while it is registered.
void setMemoryFile(const std::string& name, std::span<const unsigned char> bytes);
void clearMemoryFiles();

// A read-only stream over the bytes registered under `name`; nullptr when
// none are (or the stream cannot be had).
std::FILE* openMemoryFile(const std::string& name);

}  // namespace pc::fileio
