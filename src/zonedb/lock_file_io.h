// File primitives of the zone lock: exclusive creation and a bounded read of
// the holder's process number.
#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>

namespace pc::zonedb {

enum class LockCreation {
  Created,      // the file is new and holds `content`
  Exists,       // someone else's file is there
  Failed,       // any other failure of the creation
  WriteFailed,  // created but `content` could not be written (file removed again)
};

// Creates the file only if it does not exist, read-write for its owner only.
LockCreation createLockFile(const std::string& name, std::string_view content);

// Up to `limit` bytes of the file; nullopt when it cannot be opened or read.
std::optional<std::string> readLockFile(const std::string& name, std::size_t limit);

}  // namespace pc::zonedb
