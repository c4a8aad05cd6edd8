#include "zonedb/zone_lock.h"

#include <gtest/gtest.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <thread>

#include "platform/platform.h"
#include "support/test_support.h"
#include "zonedb/zone_database.h"
#include "zonedb/zone_database_testing.h"
#include "zonedb/zone_file_builder.h"

namespace pc::zonedb {
namespace {

namespace fs = std::filesystem;

std::string ownContent() { return std::to_string(platform::processId()) + '\0'; }

// A clock that moves only when the lock sleeps; `onSleep` plays the other
// party between two polls.
class FakeTiming {
 public:
  std::int64_t now = 1000;
  int sleeps = 0;
  std::function<void(int)> onSleep;
  LockTiming timing() {
    return {[this] { return now; }, [this](unsigned ms) {
              EXPECT_EQ(ms, 200u);
              now += ms;
              ++sleeps;
              if (onSleep) onSleep(sleeps);
            }};
  }
};

void touch(const std::string& name, int secondsAhead) {
  fs::last_write_time(name, fs::file_time_type::clock::now() + std::chrono::seconds(secondsAhead));
}

class ZoneLockTest : public testing::Test {
 protected:
  test::TempDir dir_;
  std::string lock_ = dir_.file("zone.lck");
  FakeTiming fake_;
};

TEST_F(ZoneLockTest, FreshLockHoldsTheProcessNumberAndIsReleased) {
  const ZoneLock lock = acquireZoneLock(lock_, fake_.timing());
  ASSERT_NE(lock.token, 0);
  EXPECT_EQ(lock.state, kLockTaken);
  EXPECT_EQ(fake_.sleeps, 0);
  EXPECT_EQ(test::readFile(lock_), ownContent());
  struct stat st {};
  ASSERT_EQ(::stat(lock_.c_str(), &st), 0);
  EXPECT_EQ(st.st_mode & 0777, 0600u);
  EXPECT_EQ(lock.token, platform::modificationTime(lock_).value());

  EXPECT_TRUE(zoneLockValid(lock_, lock.token));
  fs::last_write_time(lock_, fs::last_write_time(lock_) + std::chrono::seconds(5));
  EXPECT_TRUE(zoneLockValid(lock_, lock.token));
  fs::last_write_time(lock_, fs::last_write_time(lock_) + std::chrono::seconds(1));
  EXPECT_FALSE(zoneLockValid(lock_, lock.token));

  EXPECT_EQ(releaseZoneLock(lock_), kLockRemoved);
  EXPECT_FALSE(test::fileExists(lock_));
  EXPECT_FALSE(zoneLockValid(lock_, lock.token));
  EXPECT_EQ(releaseZoneLock(lock_), kLockNotRemoved);
}

TEST_F(ZoneLockTest, OwnLockIsTakenAtOnce) {
  test::writeFile(lock_, std::to_string(platform::processId()) + "\n");
  const ZoneLock lock = acquireZoneLock(lock_, fake_.timing());
  EXPECT_NE(lock.token, 0);
  EXPECT_EQ(lock.state, kLockTaken);
  EXPECT_EQ(fake_.sleeps, 0);
  EXPECT_EQ(test::readFile(lock_), std::to_string(platform::processId()) + "\n");  // not rewritten
  EXPECT_EQ(releaseZoneLock(lock_), kLockRemoved);
}

TEST_F(ZoneLockTest, LockUntouchedForTenSecondsIsBroken) {
  for (const std::string& content : {std::string("999999999") + '\0', std::string("garbage\xff"), std::string()}) {
    test::writeFile(lock_, content);
    FakeTiming fake;
    const ZoneLock lock = acquireZoneLock(lock_, fake.timing());
    EXPECT_NE(lock.token, 0);
    EXPECT_EQ(lock.state, kLockBroken);
    EXPECT_EQ(fake.sleeps, 50);
    EXPECT_EQ(test::readFile(lock_), ownContent());
    releaseZoneLock(lock_);
  }
}

TEST_F(ZoneLockTest, HolderThatKeepsTouchingIsWaitedFor) {
  test::writeFile(lock_, std::string("999999999") + '\0');
  fake_.onSleep = [this](int n) {
    if (n < 100) {
      touch(lock_, n);  // a new time at each poll
    } else {
      fs::remove(lock_);
    }
  };
  const ZoneLock lock = acquireZoneLock(lock_, fake_.timing());
  EXPECT_NE(lock.token, 0);
  EXPECT_EQ(lock.state, kLockTaken);  // 20 s of waiting, never broken
  EXPECT_EQ(fake_.sleeps, 100);
  EXPECT_EQ(test::readFile(lock_), ownContent());
  releaseZoneLock(lock_);
}

TEST_F(ZoneLockTest, TouchesRestartTheAbandonClock) {
  test::writeFile(lock_, std::string("999999999") + '\0');
  // One touch after 5 s: the lock is broken 10 s after that touch.
  fake_.onSleep = [this](int n) {
    if (n == 25) touch(lock_, 30);
  };
  const ZoneLock lock = acquireZoneLock(lock_, fake_.timing());
  EXPECT_EQ(lock.state, kLockBroken);
  EXPECT_EQ(fake_.sleeps, 75);
  releaseZoneLock(lock_);
}

TEST_F(ZoneLockTest, GivesUpOnLocksThatCannotBeHad) {
  fs::create_directory(lock_);  // exists, unreadable as a lock, not removable as a file
  ZoneLock lock = acquireZoneLock(lock_, fake_.timing());
  EXPECT_EQ(lock.token, 0);
  EXPECT_EQ(lock.state, kLockGivenUp);
  EXPECT_EQ(fake_.sleeps, 50);
  EXPECT_TRUE(fs::is_directory(lock_));

  FakeTiming fake;
  lock = acquireZoneLock(dir_.file("absent/zone.lck"), fake.timing());
  EXPECT_EQ(lock.token, 0);
  EXPECT_EQ(lock.state, kLockGivenUp);
  EXPECT_EQ(fake.sleeps, 0);
}

TEST(ZoneLockContent, ProcessNumberParsing) {
  for (const char* yes : {"123", "0000123", "123 \n"}) EXPECT_TRUE(lockHeldBy(yes, 123)) << yes;
  EXPECT_TRUE(lockHeldBy(std::string("123\0junk", 8), 123));
  for (const char* no : {"1234", "12", "123x", " 123", "", "00000000000000000000123"}) {
    EXPECT_FALSE(lockHeldBy(no, 123)) << no;
  }
}

TEST_F(ZoneLockTest, ReleaseFallsBackToTheBareNameOnlyForOurOwnLock) {
  const auto previous = fs::current_path();
  fs::current_path(dir_.path());
  test::writeFile("zone.lck", std::string("999999999") + '\0');
  EXPECT_EQ(releaseZoneLock("gone/zone.lck"), kLockNotRemoved);
  EXPECT_TRUE(test::fileExists("zone.lck"));
  test::writeFile("zone.lck", ownContent());
  EXPECT_EQ(releaseZoneLock("gone/zone.lck"), kLockRemoved);
  EXPECT_FALSE(test::fileExists("zone.lck"));
  fs::current_path(previous);
}

// Real processes and the real clock from here on.

double secondsSince(std::chrono::steady_clock::time_point start) {
  return std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
}

int childStatus(pid_t pid) {
  int status = 0;
  if (::waitpid(pid, &status, 0) != pid || !WIFEXITED(status)) return -1;
  return WEXITSTATUS(status);
}

TEST_F(ZoneLockTest, QueryWaitsForALiveHolderAndProceedsOnRelease) {
  test::ScopedEnv zone("TRXZONE", dir_.path());
  resetZoneNamesForTesting();
  setLockTimingForTesting({});
  const test::ZoneBytes z;
  test::writeFile(dir_.file("zone.inf"),
                  z.file({test::ZoneBytes::record("001C 002C 001R ", ' ', "EC", z.real(25.4f))}));
  int ready[2];
  ASSERT_EQ(::pipe(ready), 0);
  std::fflush(nullptr);
  const pid_t child = ::fork();
  ASSERT_GE(child, 0);
  if (child == 0) {
    const ZoneLock lock = acquireZoneLock(lock_);
    const char byte = lock.token != 0 ? '1' : '0';
    if (::write(ready[1], &byte, 1) != 1) ::_exit(3);
    const auto start = std::chrono::steady_clock::now();
    while (secondsSince(start) < 1.5) {
      std::this_thread::sleep_for(std::chrono::milliseconds(100));
      touch(lock_, 0);
    }
    ::_exit(releaseZoneLock(lock_) == kLockRemoved ? 0 : 4);
  }
  char byte = 0;
  ASSERT_EQ(::read(ready[0], &byte, 1), 1);
  ASSERT_EQ(byte, '1');
  const auto start = std::chrono::steady_clock::now();
  float value = 0;
  EXPECT_EQ(zoneRealValue(6, value), 1);
  const double waited = secondsSince(start);
  EXPECT_EQ(value, 25.4f);
  EXPECT_GE(waited, 1.3);
  EXPECT_LT(waited, 4.0);  // soon after the release, long before the 10 s
  EXPECT_EQ(childStatus(child), 0);
  ::close(ready[0]);
  ::close(ready[1]);
  resetZoneNamesForTesting();
}

TEST_F(ZoneLockTest, TwoProcessesNeverHoldTheLockTogether) {
  const std::string log = dir_.file("log");
  std::fflush(nullptr);
  pid_t children[2];
  for (pid_t& child : children) {
    child = ::fork();
    ASSERT_GE(child, 0);
    if (child == 0) {
      const std::string me = std::to_string(::getpid());
      for (int i = 0; i < 4; ++i) {
        if (acquireZoneLock(lock_).token == 0) ::_exit(3);
        std::ofstream(log, std::ios::app) << "enter " << me << "\n";
        std::this_thread::sleep_for(std::chrono::milliseconds(60));
        std::ofstream(log, std::ios::app) << "leave " << me << "\n";
        if (releaseZoneLock(lock_) != kLockRemoved) ::_exit(4);
        std::this_thread::sleep_for(std::chrono::milliseconds(10));
      }
      ::_exit(0);
    }
  }
  for (const pid_t child : children) EXPECT_EQ(childStatus(child), 0);
  std::ifstream in(log);
  std::string word, pid, leaveWord, leavePid;
  int pairs = 0;
  while (in >> word >> pid) {
    ASSERT_EQ(word, "enter");
    ASSERT_TRUE(in >> leaveWord >> leavePid);
    EXPECT_EQ(leaveWord, "leave");
    EXPECT_EQ(leavePid, pid);
    ++pairs;
  }
  EXPECT_EQ(pairs, 8);
  EXPECT_FALSE(test::fileExists(lock_));
}

TEST_F(ZoneLockTest, LockStillHeldAtExitIsRemoved) {
  for (const bool normalExit : {true, false}) {
    std::fflush(nullptr);
    const pid_t child = ::fork();
    ASSERT_GE(child, 0);
    if (child == 0) {
      if (acquireZoneLock(lock_).token == 0) ::_exit(3);
      if (normalExit) std::exit(0);
      ::_exit(0);  // no exit handlers: the lock stays behind
    }
    EXPECT_EQ(childStatus(child), 0);
    EXPECT_EQ(test::fileExists(lock_), !normalExit);
  }
  // A lock file taken over by another process is not removed at our exit.
  std::fflush(nullptr);
  const pid_t child = ::fork();
  ASSERT_GE(child, 0);
  if (child == 0) {
    fs::remove(lock_);
    if (acquireZoneLock(lock_).token == 0) ::_exit(3);
    test::writeFile(lock_, std::string("999999999") + '\0');
    std::exit(0);
  }
  EXPECT_EQ(childStatus(child), 0);
  EXPECT_EQ(test::readFile(lock_), std::string("999999999") + '\0');
}

}  // namespace
}  // namespace pc::zonedb
