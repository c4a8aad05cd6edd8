#include "tool/line_file_table.h"

#include <algorithm>
#include <array>
#include <cstdio>
#include <cstdlib>
#include <string>

#include "fileio/memory_files.h"
#include "platform/platform.h"

namespace pc {

namespace {

constexpr std::size_t kMaxNameLength = 1024;
constexpr std::size_t kLineWorkArea = 1024;
constexpr std::size_t kMaxLineBytes = kLineWorkArea - 1;

constexpr std::array<const char*, 4> kModes = {"r+b", "rb", "w+b", "a+b"};

// The streams of the process; whatever is still open when the process ends
// is closed here.
struct StreamTable {
  std::array<std::FILE*, kLineFileSlots> streams{};
  StreamTable() = default;
  StreamTable(const StreamTable&) = delete;
  StreamTable& operator=(const StreamTable&) = delete;
  ~StreamTable() {
    for (std::FILE*& f : streams) {
      if (f != nullptr) std::fclose(f);
      f = nullptr;
    }
  }
};

StreamTable& table() {
  static StreamTable instance;
  return instance;
}

std::FILE* streamOf(int handle) {
  if (handle < 0 || handle >= kLineFileSlots) return nullptr;
  return table().streams[static_cast<std::size_t>(handle)];
}

}  // namespace

void lineFileOpen(int& handle, std::string_view name, int mode, int& status) {
  handle = -1;
  const long long index = std::llabs(static_cast<long long>(mode));
  if (index >= static_cast<long long>(kModes.size())) {
    status = kLineBadMode;
    return;
  }
  const int failure = index == 2 ? kLineCreateFailed : kLineIoError;

  std::string path(name.substr(0, std::min(name.size(), kMaxNameLength)));
  path.erase(path.find_last_not_of(' ') + 1);
  // A NUL inside the name would silently open a different, shorter name.
  if (path.find('\0') != std::string::npos) {
    status = failure;
    return;
  }

  // Look for a free entry first: opening "w+b" and then finding no room
  // would have emptied the file for nothing.
  auto& streams = table().streams;
  const auto free = std::find(streams.begin(), streams.end(), nullptr);
  if (free == streams.end()) {
    status = failure;
    return;
  }
  std::FILE* f = nullptr;
  if (index < 2) {
    // The two reading modes: never a FIFO, a socket or a device, which could
    // block the run for ever; a memory file stands in for the file when one
    // is registered under its name.
    f = fileio::openMemoryFile(path);
    if (f == nullptr) f = platform::openExistingFile(path, kModes[static_cast<std::size_t>(index)], true);
  } else {
    f = std::fopen(path.c_str(), kModes[static_cast<std::size_t>(index)]);
  }
  if (f == nullptr) {
    status = failure;
    return;
  }
  *free = f;
  handle = static_cast<int>(free - streams.begin());
  status = kLineOk;
}

void lineFileClose(int handle, int& status) {
  std::FILE* f = streamOf(handle);
  if (f == nullptr) {
    status = kLineIoError;
    return;
  }
  // The stream is gone after fclose whatever it reports, so the entry is
  // freed in both cases; keeping it would invite a second fclose.
  table().streams[static_cast<std::size_t>(handle)] = nullptr;
  status = std::fclose(f) == 0 ? kLineOk : kLineIoError;
}

void lineFileReadLine(int handle, std::span<char> buffer, int& status) {
  std::fill(buffer.begin(), buffer.end(), ' ');
  std::FILE* f = streamOf(handle);
  if (f == nullptr) {
    status = kLineIoError;
    return;
  }
  std::array<char, kLineWorkArea> work{};
  std::size_t count = 0;
  bool lineFeed = false;
  status = kLineOk;
  while (count < kMaxLineBytes) {
    const int c = std::fgetc(f);
    if (c == EOF) {
      if (std::ferror(f) != 0) status = kLineIoError;
      else status = count == 0 ? kLineEnd : kLinePartial;
      break;
    }
    if (c == '\n') {
      lineFeed = true;
      break;
    }
    work[count++] = static_cast<char>(c);
  }
  if (status == kLineOk && !lineFeed) status = kLineTooLong;
  while (count > 0 && work[count - 1] == '\r') --count;
  std::copy_n(work.data(), std::min(count, buffer.size()), buffer.data());
}

}  // namespace pc
