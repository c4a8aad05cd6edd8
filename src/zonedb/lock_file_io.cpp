#include "zonedb/lock_file_io.h"

#include <cerrno>
#include <cstdio>
#include <memory>

#ifdef _WIN32
#include <fcntl.h>
#include <io.h>
#include <sys/stat.h>
#else
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>
#endif

#include "platform/platform.h"

namespace pc::zonedb {

namespace {

#ifdef _WIN32
int openExclusive(const std::string& name) {
  return ::_open(name.c_str(), _O_CREAT | _O_EXCL | _O_RDWR | _O_BINARY, _S_IREAD | _S_IWRITE);
}
bool writeAll(int fd, std::string_view content) {
  return ::_write(fd, content.data(), static_cast<unsigned>(content.size())) ==
         static_cast<int>(content.size());
}
int closeFile(int fd) { return ::_close(fd); }
#else
int openExclusive(const std::string& name) {
  return ::open(name.c_str(), O_CREAT | O_EXCL | O_RDWR, S_IRUSR | S_IWUSR);
}
bool writeAll(int fd, std::string_view content) {
  std::size_t done = 0;
  while (done < content.size()) {
    const ssize_t n = ::write(fd, content.data() + done, content.size() - done);
    if (n < 0 && errno == EINTR) continue;
    if (n <= 0) return false;
    done += static_cast<std::size_t>(n);
  }
  return true;
}
int closeFile(int fd) { return ::close(fd); }
#endif

}  // namespace

LockCreation createLockFile(const std::string& name, std::string_view content) {
  const int fd = openExclusive(name);
  if (fd < 0) return errno == EEXIST ? LockCreation::Exists : LockCreation::Failed;
  const bool written = writeAll(fd, content);
  if (closeFile(fd) != 0 || !written) {
    // A lock without its holder's number would be taken for an abandoned
    // one by everybody, us included: leave nothing behind.
    platform::removeFile(name);
    return LockCreation::WriteFailed;
  }
  return LockCreation::Created;
}

std::optional<std::string> readLockFile(const std::string& name, std::size_t limit) {
  struct Closer {
    void operator()(std::FILE* file) const { std::fclose(file); }
  };
  std::unique_ptr<std::FILE, Closer> file(std::fopen(name.c_str(), "rb"));
  if (!file) return std::nullopt;
  std::string content(limit, '\0');
  const std::size_t n = std::fread(content.data(), 1, limit, file.get());
  if (std::ferror(file.get())) return std::nullopt;
  content.resize(n);
  return content;
}

}  // namespace pc::zonedb
