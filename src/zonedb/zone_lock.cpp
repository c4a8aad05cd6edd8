#include "zonedb/zone_lock.h"

#include <chrono>
#include <cstdlib>

#include "platform/platform.h"
#include "zonedb/lock_file_io.h"

namespace pc::zonedb {

namespace {

// Bytes looked at when testing whether a lock is already ours, and when
// verifying a lock just taken.
constexpr std::size_t kOwnerProbeBytes = 19;
constexpr std::size_t kVerifyBytes = 257;

// The lock this process holds, removed by the exit handler. Never destroyed,
// so that the handler can still use it while statics are torn down.
std::string& heldLockName() {
  static std::string* name = new std::string;
  return *name;
}

bool heldByThisProcess(const std::string& name) {
  const auto content = readLockFile(name, kVerifyBytes);
  return content && lockHeldBy(*content, platform::processId());
}

void removeHeldLockAtExit() {
  std::string& name = heldLockName();
  // A lock broken by another process and taken over by it is not ours any
  // more; nor is a lock inherited by a forked child.
  if (!name.empty() && heldByThisProcess(name)) platform::removeFile(name);
}

void noteHeld(const std::string& name) {
  [[maybe_unused]] static const bool registered = std::atexit(removeHeldLockAtExit) == 0;
  heldLockName() = name;
}

}  // namespace

LockTiming systemLockTiming() {
  return LockTiming{
      [] {
        return static_cast<std::int64_t>(std::chrono::duration_cast<std::chrono::milliseconds>(
                                             std::chrono::steady_clock::now().time_since_epoch())
                                             .count());
      },
      [](unsigned milliseconds) { platform::sleepMilliseconds(milliseconds); }};
}

bool lockHeldBy(std::string_view content, std::uint32_t processId) {
  std::uint64_t number = 0;
  std::size_t digits = 0;
  while (digits < content.size() && content[digits] >= '0' && content[digits] <= '9') {
    if (digits == 19) return false;  // longer than any process number
    number = number * 10 + static_cast<std::uint64_t>(content[digits] - '0');
    ++digits;
  }
  if (digits == 0) return false;
  if (digits < content.size()) {
    const char next = content[digits];
    if (next != '\0' && next != ' ' && next != '\n' && next != '\r' && next != '\t') return false;
  }
  return number == processId;
}

ZoneLock acquireZoneLock(const std::string& lockName, const LockTiming& timing) {
  const std::uint32_t pid = platform::processId();
  std::string content = std::to_string(pid);
  content.push_back('\0');

  ZoneLock result;
  std::int64_t watchStart = timing.nowMilliseconds();
  std::int64_t lastSeen = platform::modificationTime(lockName).value_or(0);
  for (;;) {
    bool ours = false;
    switch (createLockFile(lockName, content)) {
      case LockCreation::Created:
        ours = true;
        break;
      case LockCreation::Exists: {
        // A directory, a FIFO or a device can never be a lock: neither
        // waiting nor breaking would ever take it.
        if (!platform::isRegularFile(lockName) && platform::pathExists(lockName)) {
          result.state = kLockGivenUp;
          return result;
        }
        const auto holder = readLockFile(lockName, kOwnerProbeBytes);
        ours = holder && lockHeldBy(*holder, pid);
        break;
      }
      case LockCreation::Failed:
      case LockCreation::WriteFailed:
        result.state = kLockGivenUp;
        return result;
    }
    if (ours && heldByThisProcess(lockName)) {
      const std::int64_t token = platform::modificationTime(lockName).value_or(0);
      if (token != 0) {
        result.token = token;
        noteHeld(lockName);
        return result;
      }
    }
    // Someone else's lock (or ours, lost before it could be verified):
    // watch it, and break it once it has been left untouched for too long.
    const std::int64_t now = timing.nowMilliseconds();
    const std::int64_t time = platform::modificationTime(lockName).value_or(0);
    if (time != lastSeen) {
      lastSeen = time;
      watchStart = now;
    } else if (now - watchStart >= kLockAbandonMilliseconds) {
      if (platform::removeFile(lockName)) {
        result.state = kLockBroken;
        lastSeen = 0;
        watchStart = now;
        continue;
      }
      if (platform::pathExists(lockName)) {
        result.state = kLockGivenUp;
        return result;
      }
    }
    timing.sleepMilliseconds(kLockPollMilliseconds);
  }
}

ZoneLock acquireZoneLock(const std::string& lockName) {
  return acquireZoneLock(lockName, systemLockTiming());
}

bool zoneLockValid(const std::string& lockName, std::int64_t token) {
  const auto time = platform::modificationTime(lockName);
  return token != 0 && time && *time < token + kLockValiditySeconds;
}

int releaseZoneLock(const std::string& lockName) {
  // A lock broken by another process while we stalled, and taken over by
  // it, is not ours to remove any more.
  bool removed = heldByThisProcess(lockName) && platform::removeFile(lockName);
  if (!removed) {
    // The zone was named relative to a directory that has gone from under
    // us (the current directory changed): the lock may sit under its bare
    // name, but only a file holding our own number is ours to remove.
    const auto slash = lockName.find_last_of("/\\");
    if (slash != std::string::npos && slash > 0) {
      const std::string directory = lockName.substr(0, slash);
      const std::string bare = lockName.substr(slash + 1);
      if (!platform::pathExists(directory) && heldByThisProcess(bare)) {
        removed = platform::removeFile(bare);
      }
    }
  }
  if (!removed) return kLockNotRemoved;
  if (heldLockName() == lockName) heldLockName().clear();
  return kLockRemoved;
}

ZoneLockGuard::ZoneLockGuard(std::string lockName, const LockTiming& timing)
    : name_(std::move(lockName)), lock_(acquireZoneLock(name_, timing)) {}

ZoneLockGuard::~ZoneLockGuard() {
  if (held()) releaseZoneLock(name_);
}

}  // namespace pc::zonedb
