#include "zonedb/lock_file_io.h"

#include <cstdio>
#include <memory>

#include "platform/platform.h"

namespace pc::zonedb {

LockCreation createLockFile(const std::string& name, std::string_view content) {
  // A lock without its holder's number would be taken for an abandoned one
  // by everybody, us included: the platform removes such a file again.
  switch (platform::createExclusiveFile(name, content)) {
    case platform::ExclusiveCreation::Created: return LockCreation::Created;
    case platform::ExclusiveCreation::Exists: return LockCreation::Exists;
    case platform::ExclusiveCreation::WriteFailed: return LockCreation::WriteFailed;
    case platform::ExclusiveCreation::Failed: break;
  }
  return LockCreation::Failed;
}

std::optional<std::string> readLockFile(const std::string& name, std::size_t limit) {
  struct Closer {
    void operator()(std::FILE* file) const { std::fclose(file); }
  };
  // A FIFO in place of the lock would block the open for ever.
  std::unique_ptr<std::FILE, Closer> file(platform::openExistingFile(name, "rb", true));
  if (!file) return std::nullopt;
  std::string content(limit, '\0');
  const std::size_t n = std::fread(content.data(), 1, limit, file.get());
  if (std::ferror(file.get())) return std::nullopt;
  content.resize(n);
  return content;
}

}  // namespace pc::zonedb
