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

#include <algorithm>
#include <climits>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <filesystem>
#include <memory>
#include <vector>

#include "fileio/little_endian.h"
#include "platform/platform.h"

namespace pc::fileio {

namespace {

constexpr std::size_t kBufferSize = std::size_t{1} << 20;
constexpr std::size_t kFrameSize = 4;
constexpr std::size_t kBackScanChunk = std::size_t{1} << 16;

struct FileCloser {
  void operator()(std::FILE* f) const {
    if (f != nullptr) std::fclose(f);
  }
};
using FileHandle = std::unique_ptr<std::FILE, FileCloser>;

enum class Transfer { Idle, Reading, Writing };

std::string trimTrailingBlanks(const std::string& name) {
  const auto end = name.find_last_not_of(' ');
  return end == std::string::npos ? std::string{} : name.substr(0, end + 1);
}

struct Unit {
  int number = 0;
  std::string name;
  FileForm form = FileForm::Formatted;
  bool writable = false;
  FileHandle file;
  std::unique_ptr<unsigned char[]> buffer{new unsigned char[kBufferSize]};

  Transfer transfer = Transfer::Idle;
  std::int64_t bufferOffset = 0;  // file offset of buffer[0]
  std::size_t length = 0;         // valid bytes (reading) or pending bytes (writing)
  std::size_t cursor = 0;         // read position inside the buffer
  std::int64_t filePosition = 0;  // where the stream itself stands
  bool afterEnd = false;          // the last read met the end of the file
  bool readFailed = false;        // the system reported a read error
  bool writeFailed = false;       // a write or flush failed; reported again at close

  Unit() = default;
  Unit(const Unit&) = delete;
  Unit& operator=(const Unit&) = delete;
  ~Unit() { flushWrites(); }

  // The logical position: where the next record is read or written. When
  // idle it is bufferOffset, and the stream is moved there before use.
  std::int64_t position() const {
    switch (transfer) {
      case Transfer::Reading: return bufferOffset + static_cast<std::int64_t>(cursor);
      case Transfer::Writing: return bufferOffset + static_cast<std::int64_t>(length);
      case Transfer::Idle: break;
    }
    return bufferOffset;
  }

  void flushWrites() {
    if (transfer != Transfer::Writing) return;
    if (length > 0 && file) {
      const std::size_t written = std::fwrite(buffer.get(), 1, length, file.get());
      filePosition += static_cast<std::int64_t>(written);
      if (written != length) writeFailed = true;
    }
    if (file && std::fflush(file.get()) != 0) writeFailed = true;
    bufferOffset += static_cast<std::int64_t>(length);
    length = 0;
    transfer = Transfer::Idle;
  }

  // Moves the stream itself; absolute where the offset fits the C library's
  // type, else in relative steps from the known position.
  bool seekTo(std::int64_t target) {
    std::clearerr(file.get());
    if (target <= LONG_MAX) {
      if (std::fseek(file.get(), static_cast<long>(target), SEEK_SET) != 0) return false;
      filePosition = target;
      return true;
    }
    while (filePosition != target) {
      const std::int64_t step = std::clamp<std::int64_t>(target - filePosition, -LONG_MAX, LONG_MAX);
      if (std::fseek(file.get(), static_cast<long>(step), SEEK_CUR) != 0) return false;
      filePosition += step;
    }
    return true;
  }

  bool setPosition(std::int64_t target) {
    flushWrites();
    afterEnd = false;
    if (transfer == Transfer::Reading && target >= bufferOffset &&
        target <= bufferOffset + static_cast<std::int64_t>(length)) {
      cursor = static_cast<std::size_t>(target - bufferOffset);
      return true;
    }
    transfer = Transfer::Idle;
    length = cursor = 0;
    bufferOffset = target;
    return seekTo(target);
  }

  void beginReading() {
    if (transfer == Transfer::Reading) return;
    flushWrites();
    if (filePosition != bufferOffset && !seekTo(bufferOffset)) readFailed = true;
    transfer = Transfer::Reading;
    length = cursor = 0;
  }

  // Makes at least `need` (<= kBufferSize) unread bytes available when the
  // file holds them; returns how many are available.
  std::size_t fill(std::size_t need) {
    std::size_t available = length - cursor;
    if (available >= need) return available;
    if (cursor > 0) {
      std::memmove(buffer.get(), buffer.get() + cursor, available);
      bufferOffset += static_cast<std::int64_t>(cursor);
      cursor = 0;
      length = available;
    }
    while (length < need) {
      const std::size_t got = std::fread(buffer.get() + length, 1, kBufferSize - length, file.get());
      filePosition += static_cast<std::int64_t>(got);
      length += got;
      if (got == 0) {
        if (std::ferror(file.get())) {
          readFailed = true;
          std::clearerr(file.get());
        }
        break;
      }
    }
    return length - cursor;
  }

  // Copies n bytes at an absolute offset; leaves the unit positioned there.
  bool peekAt(std::int64_t offset, unsigned char* out, std::size_t n) {
    if (!setPosition(offset)) return false;
    beginReading();
    if (fill(n) < n) return false;
    std::memcpy(out, buffer.get() + cursor, n);
    return true;
  }

  // Starts writing at the current position; whatever follows is cut off.
  bool beginWriting() {
    if (transfer == Transfer::Writing) return true;
    const std::int64_t start = position();
    bool lineOpen = false;
    if (form == FileForm::Formatted && start > 0) {
      unsigned char last = 0;
      // A last line without its line end gets one before the new record.
      lineOpen = peekAt(start - 1, &last, 1) && last != '\n';
    }
    transfer = Transfer::Idle;
    length = cursor = 0;
    afterEnd = false;
    std::error_code ec;
    const auto size = std::filesystem::file_size(name, ec);
    if (!ec && static_cast<std::uintmax_t>(start) < size) {
      std::filesystem::resize_file(name, static_cast<std::uintmax_t>(start), ec);
      if (ec) return false;
    }
    if (!seekTo(start)) return false;
    transfer = Transfer::Writing;
    bufferOffset = start;
    if (lineOpen) buffer[length++] = '\n';
    return true;
  }

  // Appends bytes to the pending writes; a piece larger than the buffer
  // goes straight to the file.
  void put(const unsigned char* data, std::size_t n) {
    if (length + n > kBufferSize) {
      const std::int64_t end = bufferOffset + static_cast<std::int64_t>(length);
      flushWrites();
      transfer = Transfer::Writing;
      bufferOffset = end;
    }
    if (n <= kBufferSize) {
      std::memcpy(buffer.get() + length, data, n);
      length += n;
      return;
    }
    const std::size_t written = std::fwrite(data, 1, n, file.get());
    filePosition += static_cast<std::int64_t>(written);
    bufferOffset += static_cast<std::int64_t>(n);
    if (written != n) writeFailed = true;
  }
};

// The process-wide unit table. Few units are open at once, so a linear scan
// beats any map; the last unit used is tried first.
struct UnitTable {
  std::vector<std::unique_ptr<Unit>> units;
  Unit* last = nullptr;

  Unit* find(int number) {
    if (last != nullptr && last->number == number) return last;
    for (auto& u : units) {
      if (u->number == number) return last = u.get();
    }
    return nullptr;
  }

  std::unique_ptr<Unit> take(int number) {
    for (auto it = units.begin(); it != units.end(); ++it) {
      if ((*it)->number == number) {
        std::unique_ptr<Unit> u = std::move(*it);
        units.erase(it);
        if (last == u.get()) last = nullptr;
        return u;
      }
    }
    return nullptr;
  }
};

UnitTable& table() {
  static UnitTable instance;
  return instance;
}

std::FILE* openStream(const std::string& name, const char* mode) { return std::fopen(name.c_str(), mode); }

int writeStandardOutput(std::string_view record) {
  std::FILE* out = stdout;
  if (std::fwrite(record.data(), 1, record.size(), out) != record.size() || std::fputc('\n', out) == EOF) {
    std::clearerr(out);
    return kIoErrorSystem;
  }
  return kIoOk;
}

int recordError(Unit& u, std::int64_t start) {
  u.setPosition(start);
  if (u.readFailed) {
    u.readFailed = false;
    return kIoErrorSystem;
  }
  return kIoErrorRecord;
}

// A record that does not fit the buffer: its front is copied piece by piece
// and the rest skipped the same way, so that no allocation follows the count.
int readLongRecord(Unit& u, std::int64_t start, std::uint32_t count, unsigned char* data, std::size_t size) {
  u.cursor += kFrameSize;
  std::uint64_t remaining = count;
  std::size_t copied = 0;
  while (remaining > 0) {
    const std::size_t available = u.fill(1);
    if (available == 0) return recordError(u, start);
    const std::size_t take = static_cast<std::size_t>(std::min<std::uint64_t>(available, remaining));
    if (copied < size) {
      const std::size_t n = std::min(take, size - copied);
      std::memcpy(data + copied, u.buffer.get() + u.cursor, n);
      copied += n;
    }
    u.cursor += take;
    remaining -= take;
  }
  if (u.fill(kFrameSize) < kFrameSize || loadLE32(u.buffer.get() + u.cursor) != count) {
    return recordError(u, start);
  }
  u.cursor += kFrameSize;
  return kIoOk;
}

}  // namespace

int openUnit(int unit, const std::string& name, OpenDisposition disposition, FileForm form) {
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
  if (exists) {
    u->file.reset(openStream(path, "r+b"));
    u->writable = u->file != nullptr;
    if (!u->file) u->file.reset(openStream(path, "rb"));  // read-only files are still readable
  } else {
    u->file.reset(openStream(path, "w+b"));
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

int readRecord(int unit, void* data, std::size_t size) {
  Unit* u = table().find(unit);
  if (u == nullptr || u->form != FileForm::Unformatted) return kIoErrorUnit;
  if (data == nullptr && size > 0) return kIoErrorUnit;
  u->beginReading();
  const std::int64_t start = u->position();

  std::size_t available = u->fill(kFrameSize);
  if (available == 0) {
    if (u->readFailed) return recordError(*u, start);
    u->afterEnd = true;
    return kIoEnd;
  }
  if (available < kFrameSize) return recordError(*u, start);
  const unsigned char* head = u->buffer.get() + u->cursor;
  const std::uint32_t count = loadLE32(head);
  if (count > INT32_MAX || size > count) return recordError(*u, start);

  auto* out = static_cast<unsigned char*>(data);
  const std::size_t total = static_cast<std::size_t>(count) + 2 * kFrameSize;
  if (total > kBufferSize) return readLongRecord(*u, start, count, out, size);
  if (available < total) {
    available = u->fill(total);
    if (available < total) return recordError(*u, start);
    head = u->buffer.get() + u->cursor;
  }
  if (loadLE32(head + kFrameSize + count) != count) return recordError(*u, start);
  if (size > 0) std::memcpy(out, head + kFrameSize, size);
  u->cursor += total;
  return kIoOk;
}

int writeRecord(int unit, const void* data, std::size_t size) {
  Unit* u = table().find(unit);
  if (u == nullptr || u->form != FileForm::Unformatted || !u->writable) return kIoErrorUnit;
  if ((data == nullptr && size > 0) || size > static_cast<std::size_t>(INT32_MAX)) return kIoErrorUnit;
  if (u->writeFailed) return kIoErrorSystem;
  if (!u->beginWriting()) {
    u->writeFailed = true;
    return kIoErrorSystem;
  }
  unsigned char frame[kFrameSize];
  storeLE32(frame, static_cast<std::uint32_t>(size));
  if (size + 2 * kFrameSize <= kBufferSize - u->length) {
    // The common case: the whole record goes into the buffer in one piece.
    unsigned char* p = u->buffer.get() + u->length;
    std::memcpy(p, frame, kFrameSize);
    if (size > 0) std::memcpy(p + kFrameSize, data, size);
    std::memcpy(p + kFrameSize + size, frame, kFrameSize);
    u->length += size + 2 * kFrameSize;
  } else {
    u->put(frame, kFrameSize);
    u->put(static_cast<const unsigned char*>(data), size);
    u->put(frame, kFrameSize);
  }
  return u->writeFailed ? kIoErrorSystem : kIoOk;
}

int readTextRecord(int unit, std::string& record) {
  Unit* u = table().find(unit);
  if (u == nullptr || u->form != FileForm::Formatted) return kIoErrorUnit;
  u->beginReading();
  const std::int64_t start = u->position();
  record.clear();
  bool consumed = false;
  for (;;) {
    const std::size_t available = u->fill(1);
    if (available == 0) {
      if (u->readFailed) return recordError(*u, start);
      if (!consumed) {
        u->afterEnd = true;
        return kIoEnd;
      }
      break;  // a last line without its line end
    }
    const unsigned char* from = u->buffer.get() + u->cursor;
    const auto* newline = static_cast<const unsigned char*>(std::memchr(from, '\n', available));
    const std::size_t n = newline != nullptr ? static_cast<std::size_t>(newline - from) : available;
    if (record.size() + n > kMaxTextRecord) {
      record.clear();
      return recordError(*u, start);
    }
    record.append(reinterpret_cast<const char*>(from), n);
    consumed = true;
    if (newline != nullptr) {
      u->cursor += n + 1;
      break;
    }
    u->cursor += n;
  }
  if (!record.empty() && record.back() == '\r') record.pop_back();
  return kIoOk;
}

int writeTextRecord(int unit, std::string_view record) {
  if (unit == kStandardOutputUnit) return writeStandardOutput(record);
  Unit* u = table().find(unit);
  if (u == nullptr || u->form != FileForm::Formatted || !u->writable) return kIoErrorUnit;
  if (u->writeFailed) return kIoErrorSystem;
  if (!u->beginWriting()) {
    u->writeFailed = true;
    return kIoErrorSystem;
  }
  const unsigned char lineEnd = '\n';
  u->put(reinterpret_cast<const unsigned char*>(record.data()), record.size());
  u->put(&lineEnd, 1);
  return u->writeFailed ? kIoErrorSystem : kIoOk;
}

}  // namespace pc::fileio
