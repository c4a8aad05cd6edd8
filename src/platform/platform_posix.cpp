#include "platform/platform.h"

#ifndef _WIN32

#include <dirent.h>
#include <fcntl.h>
#include <sys/mman.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <chrono>
#include <csignal>
#include <cstdlib>
#include <ctime>
#include <thread>

namespace pc::platform {

char nativeSeparator() { return '/'; }

std::optional<std::string> getEnv(const std::string& name) {
  const char* value = std::getenv(name.c_str());
  if (value == nullptr) return std::nullopt;
  return std::string(value);
}

bool setEnv(const std::string& name, const std::string& value) {
  return ::setenv(name.c_str(), value.c_str(), 1) == 0;
}

bool unsetEnv(const std::string& name) { return ::unsetenv(name.c_str()) == 0; }

std::optional<std::string> executablePath() {
  std::string buffer(4096, '\0');
  const ssize_t n = ::readlink("/proc/self/exe", buffer.data(), buffer.size() - 1);
  if (n <= 0) return std::nullopt;
  buffer.resize(static_cast<size_t>(n));
  return buffer;
}

std::uint32_t processId() { return static_cast<std::uint32_t>(::getpid()); }

void sleepMilliseconds(unsigned milliseconds) {
  std::this_thread::sleep_for(std::chrono::milliseconds(milliseconds));
}

bool pathExists(const std::string& name) {
  struct stat st {};
  return !name.empty() && ::stat(name.c_str(), &st) == 0;
}

bool isRegularFile(const std::string& name) {
  struct stat st {};
  return !name.empty() && ::stat(name.c_str(), &st) == 0 && S_ISREG(st.st_mode);
}

bool isDirectory(const std::string& name) {
  struct stat st {};
  return !name.empty() && ::stat(name.c_str(), &st) == 0 && S_ISDIR(st.st_mode);
}

std::optional<std::int64_t> modificationTime(const std::string& name) {
  struct stat st {};
  if (name.empty() || ::stat(name.c_str(), &st) != 0) return std::nullopt;
  return static_cast<std::int64_t>(st.st_mtime);
}

int makeDirectory(const std::string& name) {
  if (::mkdir(name.c_str(), 0777) == 0) return 0;
  if (errno == EEXIST || errno == EACCES) return 1;
  return -1;
}

bool removeFile(const std::string& name) { return ::unlink(name.c_str()) == 0; }

std::vector<std::string> listDirectory(const std::string& directory) {
  std::vector<std::string> names;
  DIR* dir = ::opendir(directory.empty() ? "." : directory.c_str());
  if (dir == nullptr) return names;
  while (const dirent* entry = ::readdir(dir)) {
    const std::string name = entry->d_name;
    if (name != "." && name != "..") names.push_back(name);
  }
  ::closedir(dir);
  return names;
}

DirectoryCreation createDirectory(const std::string& name) {
  if (name.empty()) return DirectoryCreation::failed;
  if (::mkdir(name.c_str(), 0777) == 0) return DirectoryCreation::created;
  switch (errno) {
    case EEXIST:
      return DirectoryCreation::alreadyExists;
    case EACCES:
    case EPERM:
    case EROFS:
      return DirectoryCreation::accessDenied;
    default:
      return DirectoryCreation::failed;
  }
}

const char* platformDirectoryName() { return "linux"; }

const char* platformConfigurationVariable() { return "LINUX"; }

std::size_t utf8ToProcessCodePage(char* text, std::size_t length, std::size_t size) {
  if (text == nullptr || size == 0) return 0;
  if (length >= size) length = size - 1;
  text[length] = '\0';
  return length;
}

void breakpointTrap() { std::raise(SIGTRAP); }

std::int64_t currentTime() { return static_cast<std::int64_t>(std::time(nullptr)); }

std::optional<LocalTime> localTime(std::int64_t secondsSinceEpoch) {
  const std::time_t t = static_cast<std::time_t>(secondsSinceEpoch);
  std::tm tm {};
  if (::localtime_r(&t, &tm) == nullptr) return std::nullopt;
  return LocalTime{tm.tm_year + 1900, tm.tm_mon + 1, tm.tm_mday, tm.tm_hour, tm.tm_min, tm.tm_sec};
}

void* allocateLarge(std::size_t bytes) {
  constexpr std::size_t kHugePage = std::size_t{2} << 20;
  if (bytes < 2 * kHugePage) return std::malloc(bytes == 0 ? 1 : bytes);
  const std::size_t rounded = (bytes + kHugePage - 1) / kHugePage * kHugePage;
  void* block = nullptr;
  if (::posix_memalign(&block, kHugePage, rounded) != 0) return nullptr;
#ifdef MADV_HUGEPAGE
  ::madvise(block, rounded, MADV_HUGEPAGE);  // a hint: refused advice changes nothing
#endif
  return block;
}

void releaseLarge(void* block) { std::free(block); }

ExclusiveCreation createExclusiveFile(const std::string& name, std::string_view content) {
  const int fd = ::open(name.c_str(), O_CREAT | O_EXCL | O_RDWR, S_IRUSR | S_IWUSR);
  if (fd < 0) return errno == EEXIST ? ExclusiveCreation::Exists : ExclusiveCreation::Failed;
  std::size_t done = 0;
  bool written = true;
  while (done < content.size()) {
    const ssize_t n = ::write(fd, content.data() + done, content.size() - done);
    if (n < 0 && errno == EINTR) continue;
    if (n <= 0) {
      written = false;
      break;
    }
    done += static_cast<std::size_t>(n);
  }
  if (::close(fd) != 0 || !written) {
    ::unlink(name.c_str());
    return ExclusiveCreation::WriteFailed;
  }
  return ExclusiveCreation::Created;
}

std::FILE* openExistingFile(const std::string& name, const char* mode, bool regularOnly) {
  if (name.empty() || mode == nullptr || mode[0] != 'r') return nullptr;
  const bool update = std::string_view(mode).find('+') != std::string_view::npos;
  // Without O_NONBLOCK the open of a FIFO waits for a writer, for ever.
  const int fd = ::open(name.c_str(), (update ? O_RDWR : O_RDONLY) | O_NONBLOCK | O_CLOEXEC);
  if (fd < 0) return nullptr;
  struct stat st {};
  const bool refused = ::fstat(fd, &st) != 0 || S_ISFIFO(st.st_mode) || S_ISSOCK(st.st_mode) ||
                       S_ISDIR(st.st_mode) || (regularOnly && !S_ISREG(st.st_mode));
  const int flags = refused ? -1 : ::fcntl(fd, F_GETFL);
  if (flags < 0 || ::fcntl(fd, F_SETFL, flags & ~O_NONBLOCK) != 0) {
    ::close(fd);
    return nullptr;
  }
  std::FILE* file = ::fdopen(fd, mode);
  if (file == nullptr) ::close(fd);
  return file;
}

std::FILE* openMemoryStream(const void* data, std::size_t size) {
  // The stream is only read, so the bytes are never written through it.
  static unsigned char empty = 0;
  return ::fmemopen(size == 0 ? &empty : const_cast<void*>(data), size, "rb");
}

VersionResource readVersionResource(const std::string&, const std::vector<std::string>&,
                                    std::array<std::uint32_t, 13>&, std::map<std::string, std::string>&) {
  return VersionResource::NotNative;
}

}  // namespace pc::platform

#endif  // !_WIN32
