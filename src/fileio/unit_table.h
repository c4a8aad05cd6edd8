// The numbered units behind the record I/O runtime: each open unit is one
// file read and written through a large buffer, kept in a process-wide table.
// Shared by the runtime's files only; callers use record_runtime.h.
#pragma once

#include <algorithm>
#include <climits>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <filesystem>
#include <memory>
#include <string>
#include <vector>

#include "fileio/little_endian.h"
#include "fileio/record_runtime.h"
#include "platform/platform.h"

namespace pc::fileio::detail {

inline constexpr std::size_t kBufferSize = std::size_t{1} << 20;
inline constexpr std::size_t kFrameSize = 4;
inline constexpr std::size_t kBackScanChunk = std::size_t{1} << 16;

struct FileCloser {
  void operator()(std::FILE* f) const {
    if (f != nullptr) std::fclose(f);
  }
};
using FileHandle = std::unique_ptr<std::FILE, FileCloser>;

enum class Transfer { Idle, Reading, Writing };

inline std::string trimTrailingBlanks(const std::string& name) {
  const auto end = name.find_last_not_of(' ');
  return end == std::string::npos ? std::string{} : name.substr(0, end + 1);
}

// The buffers of closed units are kept for the next unit: a run opens the
// same file several times, and each fresh megabyte costs its page faults.
std::unique_ptr<unsigned char[]> takeUnitBuffer();
void returnUnitBuffer(std::unique_ptr<unsigned char[]> buffer);

struct Unit {
  int number = 0;
  std::string name;
  FileForm form = FileForm::Formatted;
  bool writable = false;
  FileHandle file;
  std::unique_ptr<unsigned char[]> buffer{takeUnitBuffer()};

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
  ~Unit() {
    flushWrites();
    returnUnitBuffer(std::move(buffer));
  }

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


UnitTable& table();

// Puts the unit back at the start of the failed record and gives the status.
int recordError(Unit& u, std::int64_t start);

}  // namespace pc::fileio::detail
