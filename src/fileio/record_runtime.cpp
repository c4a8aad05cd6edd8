// The record I/O runtime: a process-wide table of numbered units, each a file
// read and written through one large buffer so that a record costs a few
// memory moves, not a system call.
//
// Unformatted sequential file: a sequence of records, nothing before the
// first and nothing after the last. One record of n data bytes:
//
//   offset  size  type                          meaning
//   0       4     int32, little-endian          n, the byte count of the data
//   4       n     bytes                         the record's data
//   4 + n   4     int32, little-endian          n again
//
// A count that is negative, or whose trailer differs, is damaged framing. The
// numbers inside the data are the callers' business (little-endian as well).
//
// Formatted sequential file: one record per line, ended by "\n" (a "\r\n"
// written elsewhere is read as the same line end).
//
// Positioning follows sequential-file rules: a write makes its record the
// last one of the file (anything after it is cut off), a read that meets the
// end leaves the unit after the end, and a backspace from there moves back to
// the end of the data so that the next write appends.
#include "fileio/record_runtime.h"

#include "fileio/memory_files.h"
#include "fileio/unit_table.h"

namespace pc::fileio {

using namespace detail;

int openUnit(int unit, const std::string& name, OpenDisposition disposition, FileForm form, UnitUse use) {
  if (unit < 1) return kIoErrorUnit;
  const std::string path = trimTrailingBlanks(name);
  if (path.empty()) return kIoErrorOpen;
  // A unit opened again leaves its old file first; a write error still
  // pending on that file is reported, not lost with it.
  if (isUnitOpen(unit)) {
    const int closed = closeUnit(unit);
    if (closed != kIoOk) return closed;
  }
  if (platform::isDirectory(path)) return kIoErrorOpen;

  const bool exists = platform::pathExists(path);
  if (disposition == OpenDisposition::Old && !exists) return kIoErrorOpen;
  if (disposition == OpenDisposition::New && exists) return kIoErrorOpen;

  auto u = std::make_unique<Unit>();
  if (disposition != OpenDisposition::New) u->file.reset(openMemoryFile(path));
  if (u->file) {
    u->writable = false;
  } else if (exists) {
    const bool regularOnly = use == UnitUse::Read;
    u->file.reset(platform::openExistingFile(path, "r+b", regularOnly));
    u->writable = u->file != nullptr;
    // Read-only files are still readable.
    if (!u->file) u->file.reset(platform::openExistingFile(path, "rb", regularOnly));
  } else {
    u->file.reset(std::fopen(path.c_str(), "w+b"));
    u->writable = true;
  }
  if (!u->file) return kIoErrorOpen;
  // The unit buffers itself; a second buffer in the C library would only
  // copy every byte once more.
  std::setvbuf(u->file.get(), nullptr, _IONBF, 0);
  u->number = unit;
  u->name = path;
  u->form = form;
  table().units.push_back(std::move(u));
  return kIoOk;
}

int closeUnit(int unit, bool deleteFile) {
  std::unique_ptr<Unit> u = table().take(unit);
  if (!u) return kIoOk;
  u->flushWrites();
  int status = u->writeFailed ? kIoErrorSystem : kIoOk;
  if (std::fclose(u->file.release()) != 0) status = kIoErrorSystem;
  if (deleteFile && !platform::removeFile(u->name)) status = kIoErrorSystem;
  return status;
}

void closeAllUnits() {
  while (!table().units.empty()) closeUnit(table().units.back()->number);
}

bool isUnitOpen(int unit) { return table().find(unit) != nullptr; }

bool namedFileExists(const std::string& name) {
  const std::string path = trimTrailingBlanks(name);
  return platform::pathExists(path) && !platform::isDirectory(path);
}

int rewindUnit(int unit) {
  Unit* u = table().find(unit);
  if (u == nullptr) return kIoErrorUnit;
  u->flushWrites();
  if (u->writeFailed) return kIoErrorSystem;
  return u->setPosition(0) ? kIoOk : kIoErrorSystem;
}

int backspaceUnit(int unit) {
  Unit* u = table().find(unit);
  if (u == nullptr) return kIoErrorUnit;
  u->flushWrites();
  if (u->writeFailed) return kIoErrorSystem;
  if (u->afterEnd) {
    // Back from after the end of the file to the end of its data.
    u->afterEnd = false;
    return kIoOk;
  }
  const std::int64_t here = u->position();
  if (here == 0) return kIoOk;

  if (u->form == FileForm::Unformatted) {
    unsigned char frame[kFrameSize];
    if (here < static_cast<std::int64_t>(2 * kFrameSize) || !u->peekAt(here - 4, frame, kFrameSize)) {
      u->setPosition(here);
      return kIoErrorRecord;
    }
    const std::uint32_t count = loadLE32(frame);
    const std::int64_t start = here - static_cast<std::int64_t>(2 * kFrameSize) - static_cast<std::int64_t>(count);
    if (count > INT32_MAX || start < 0 || !u->peekAt(start, frame, kFrameSize) || loadLE32(frame) != count) {
      u->setPosition(here);
      return kIoErrorRecord;
    }
    return u->setPosition(start) ? kIoOk : kIoErrorSystem;
  }

  // Formatted: the previous line starts after the line end before its own.
  unsigned char last = 0;
  if (!u->peekAt(here - 1, &last, 1)) {
    u->setPosition(here);
    return kIoErrorSystem;
  }
  std::int64_t scanEnd = last == '\n' ? here - 1 : here;  // exclusive
  std::vector<unsigned char> chunk(kBackScanChunk);
  while (scanEnd > 0) {
    const std::size_t n = static_cast<std::size_t>(std::min<std::int64_t>(scanEnd, kBackScanChunk));
    const std::int64_t from = scanEnd - static_cast<std::int64_t>(n);
    if (!u->peekAt(from, chunk.data(), n)) return kIoErrorSystem;
    for (std::size_t i = n; i > 0; --i) {
      if (chunk[i - 1] == '\n') return u->setPosition(from + static_cast<std::int64_t>(i)) ? kIoOk : kIoErrorSystem;
    }
    scanEnd = from;
  }
  return u->setPosition(0) ? kIoOk : kIoErrorSystem;
}

}  // namespace pc::fileio
