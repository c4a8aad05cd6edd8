// The inter-process lock of a work zone's tool database: a lock file created
// exclusively that holds its holder's process number. A holder that works for
// long keeps touching the file; a lock left untouched for 10 seconds is
// considered abandoned and broken.
#pragma once

#include <cstdint>
#include <functional>
#include <string>
#include <string_view>

namespace pc::zonedb {

inline constexpr unsigned kLockPollMilliseconds = 200;
inline constexpr std::int64_t kLockAbandonMilliseconds = 10000;
inline constexpr std::int64_t kLockValiditySeconds = 6;

// The clock and the sleep of the waiting loop, replaceable so that the
// abandonment rules can be exercised without real waiting.
struct LockTiming {
  std::function<std::int64_t()> nowMilliseconds;
  std::function<void(unsigned)> sleepMilliseconds;
};
LockTiming systemLockTiming();

enum LockState { kLockTaken = 0, kLockBroken = 1, kLockGivenUp = 2 };

struct ZoneLock {
  // The lock file's modification time once taken; 0: not obtained.
  std::int64_t token = 0;
  // kLockBroken when an abandoned lock was removed on the way,
  // kLockGivenUp when the lock could not be had.
  int state = kLockTaken;
};

// Waits, polling every 200 ms, while another live holder keeps the lock.
// Gives up at once when the lock's name is taken by something that is not a
// regular file (a directory, a FIFO), and after 10 s when an abandoned lock
// cannot be removed.
ZoneLock acquireZoneLock(const std::string& lockName, const LockTiming& timing);
ZoneLock acquireZoneLock(const std::string& lockName);

// True while the lock file's time is less than 6 seconds after the token.
bool zoneLockValid(const std::string& lockName, std::int64_t token);

inline constexpr int kLockRemoved = 1;
inline constexpr int kLockNotRemoved = 2;

// Removes the lock file while it still holds this process's number:
// kLockRemoved, or kLockNotRemoved (also when another process holds it).
int releaseZoneLock(const std::string& lockName);

// True when the text is a process number equal to `processId` (digits,
// then the end, a NUL or a blank).
bool lockHeldBy(std::string_view content, std::uint32_t processId);

// Holds the lock for a scope.
class ZoneLockGuard {
 public:
  ZoneLockGuard(std::string lockName, const LockTiming& timing);
  ~ZoneLockGuard();
  ZoneLockGuard(const ZoneLockGuard&) = delete;
  ZoneLockGuard& operator=(const ZoneLockGuard&) = delete;
  bool held() const { return lock_.token != 0; }

 private:
  std::string name_;
  ZoneLock lock_;
};

}  // namespace pc::zonedb
