#include "zonedb/zone_lock.h"

#include <gtest/gtest.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <cstdlib>
#include <filesystem>
#include <optional>
#include <thread>

#include "platform/platform.h"
#include "support/test_support.h"

namespace pc::zonedb {
namespace {

namespace fs = std::filesystem;
using namespace std::string_literals;

const std::string kForeign = "999999999\0"s;
std::string ownContent() { return std::to_string(platform::processId()) + '\0'; }

int childStatus(pid_t pid) {
  int status = 0;
  if (pid < 0 || ::waitpid(pid, &status, 0) != pid || !WIFEXITED(status)) return -1;
  return WEXITSTATUS(status);
}

// A clock that moves only when the lock sleeps; during the first
// `touchedPolls_` polls the holder touches the lock file each time.
class ZoneLockTest : public testing::Test {
 protected:
  ZoneLock acquire(const std::string& name) {
    sleeps_ = 0;
    return acquireZoneLock(name, {[this] { return now_; }, [this](unsigned ms) {
                                    EXPECT_EQ(ms, 200u);
                                    now_ += ms;
                                    if (++sleeps_ < touchedPolls_) {
                                      fs::last_write_time(lock_, fs::file_time_type::clock::now() +
                                                                     std::chrono::seconds(sleeps_));
                                    }
                                  }});
  }

  test::TempDir dir_;
  std::string lock_ = dir_.file("zone.lck");
  std::int64_t now_ = 1000;
  int sleeps_ = 0;
  int touchedPolls_ = 0;
};

TEST_F(ZoneLockTest, FreshLockHoldsTheProcessNumberAndIsReleased) {
  const ZoneLock lock = acquire(lock_);
  EXPECT_EQ(lock.state, kLockTaken);
  EXPECT_EQ(sleeps_, 0);
  EXPECT_EQ(test::readFile(lock_), ownContent());
  EXPECT_EQ(fs::status(lock_).permissions(), fs::perms::owner_read | fs::perms::owner_write);
  ASSERT_NE(lock.token, 0);
  EXPECT_EQ(lock.token, platform::modificationTime(lock_).value());

  fs::last_write_time(lock_, fs::last_write_time(lock_) + std::chrono::seconds(5));
  EXPECT_TRUE(zoneLockValid(lock_, lock.token));
  fs::last_write_time(lock_, fs::last_write_time(lock_) + std::chrono::seconds(1));
  EXPECT_FALSE(zoneLockValid(lock_, lock.token));

  EXPECT_EQ(releaseZoneLock(lock_), kLockRemoved);
  EXPECT_FALSE(test::fileExists(lock_));
  EXPECT_FALSE(zoneLockValid(lock_, lock.token));
  EXPECT_EQ(releaseZoneLock(lock_), kLockNotRemoved);
}

TEST_F(ZoneLockTest, WaitsForLiveHoldersAndBreaksAbandonedLocks) {
  const std::string own = std::to_string(platform::processId()) + "\n";
  const struct {
    std::optional<std::string> content;  // nullopt: a directory in the way
    int touchedPolls;
    int state;
    int sleeps;
  } cases[] = {
      {own, 0, kLockTaken, 0},  // ours already: taken at once and not rewritten
      {kForeign, 0, kLockBroken, 50},  // untouched for 10 s
      {"garbage\xff", 0, kLockBroken, 50},
      {"", 0, kLockBroken, 50},
      {kForeign, 100, kLockBroken, 149},  // waited for while touched, broken 10 s after the last touch
      {std::nullopt, 0, kLockGivenUp, 50},  // neither readable nor removable as a file
  };
  for (const auto& c : cases) {
    if (c.content) test::writeFile(lock_, *c.content);
    else fs::create_directory(lock_);
    touchedPolls_ = c.touchedPolls;
    const ZoneLock lock = acquire(lock_);
    EXPECT_EQ(lock.state, c.state) << &c - cases;
    EXPECT_EQ(sleeps_, c.sleeps) << &c - cases;
    EXPECT_EQ(lock.token != 0, c.state != kLockGivenUp);
    if (lock.token == 0) continue;
    EXPECT_EQ(test::readFile(lock_), c.content == own ? own : ownContent());
    EXPECT_EQ(releaseZoneLock(lock_), kLockRemoved);
  }
  EXPECT_TRUE(fs::is_directory(lock_));
}

TEST(ZoneLockContent, ProcessNumberParsing) {
  for (const std::string& yes : {"123"s, "0000123"s, "123 \n"s, "123\0junk"s}) EXPECT_TRUE(lockHeldBy(yes, 123));
  for (const char* no : {"1234", "12", "123x", " 123", "", "00000000000000000000123"}) {
    EXPECT_FALSE(lockHeldBy(no, 123)) << no;
  }
}

TEST_F(ZoneLockTest, ReleaseFallsBackToTheBareNameOnlyForOurOwnLock) {
  const auto previous = fs::current_path();
  fs::current_path(dir_.path());
  test::writeFile("zone.lck", kForeign);
  EXPECT_EQ(releaseZoneLock("gone/zone.lck"), kLockNotRemoved);
  EXPECT_TRUE(test::fileExists("zone.lck"));
  test::writeFile("zone.lck", ownContent());
  EXPECT_EQ(releaseZoneLock("gone/zone.lck"), kLockRemoved);
  EXPECT_FALSE(test::fileExists("zone.lck"));
  fs::current_path(previous);
}

// Real processes and the real clock from here on.

TEST_F(ZoneLockTest, TwoProcessesNeverHoldTheLockTogether) {
  const std::string inside = dir_.file("inside");  // present while a holder works
  auto contend = [&] {
    for (int i = 0; i < 4; ++i) {
      if (acquireZoneLock(lock_).token == 0) return 3;
      if (test::fileExists(inside)) return 4;
      test::writeFile(inside, "");
      std::this_thread::sleep_for(std::chrono::milliseconds(60));
      fs::remove(inside);
      if (releaseZoneLock(lock_) != kLockRemoved) return 5;
      std::this_thread::sleep_for(std::chrono::milliseconds(10));
    }
    return 0;
  };
  std::fflush(nullptr);
  const pid_t child = ::fork();
  const int failure = contend();
  if (child == 0) ::_exit(failure);
  EXPECT_EQ(failure, 0);
  EXPECT_EQ(childStatus(child), 0);
  EXPECT_FALSE(test::fileExists(lock_));
}

TEST_F(ZoneLockTest, LockStillHeldAtExitIsRemovedWhenStillOurs) {
  for (const int how : {0, 1, 2}) {
    fs::remove(lock_);
    std::fflush(nullptr);
    const pid_t child = ::fork();
    if (child == 0) {
      if (acquireZoneLock(lock_).token == 0) ::_exit(3);
      if (how == 1) ::_exit(0);  // no exit handlers: the lock stays behind
      if (how == 2) test::writeFile(lock_, kForeign);  // taken over by another process
      std::exit(0);
    }
    EXPECT_EQ(childStatus(child), 0);
    EXPECT_EQ(test::fileExists(lock_), how != 0) << how;
  }
  EXPECT_EQ(test::readFile(lock_), kForeign);
}

}  // namespace
}  // namespace pc::zonedb
