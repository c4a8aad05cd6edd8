#include "zonedb/zone_lock.h"

#include <gtest/gtest.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <cstdlib>
#include <filesystem>
#include <thread>

#include "platform/platform.h"
#include "support/test_support.h"

namespace pc::zonedb {
namespace {

namespace fs = std::filesystem;
using namespace std::chrono_literals;

const std::string kForeign("999999999\0", 10);

int childStatus(pid_t pid) {
  int status = 0;
  return pid > 0 && ::waitpid(pid, &status, 0) == pid && WIFEXITED(status) ? WEXITSTATUS(status) : -1;
}

// A clock that moves only when the lock sleeps; during the first
// `touchedPolls_` polls the holder touches the lock file each time.
class ZoneLockTest : public testing::Test {
 protected:
  ZoneLock acquire() {
    sleeps_ = 0;
    const auto sleep = [this](unsigned ms) {
      EXPECT_EQ(ms, 200u);
      now_ += ms;
      if (++sleeps_ < touchedPolls_) fs::last_write_time(lock_, fs::file_time_type::clock::now() + sleeps_ * 1s);
    };
    return acquireZoneLock(lock_, {[this] { return now_; }, sleep});
  }

  test::TempDir dir_;
  std::string lock_ = dir_.file("zone.lck");
  std::int64_t now_ = 1000;
  int sleeps_ = 0, touchedPolls_ = 0;
};

TEST_F(ZoneLockTest, TakenAtOnceOrAfterWaitingForLiveHolders) {
  const std::string pid = std::to_string(platform::processId()), own = pid + "\n", written = pid + '\0';
  // Lock file content (none yet), polls during which its holder touches it,
  // then the state and the number of polls of the acquisition.
  const std::tuple<std::optional<std::string>, int, int, int> cases[] = {
      {std::nullopt, 0, kLockTaken, 0},
      {own, 0, kLockTaken, 0},           // ours already: taken at once and not rewritten
      {kForeign, 100, kLockBroken, 149},  // waited for while touched, broken 10 s after the last touch
      {kForeign, 0, kLockBroken, 50},     // untouched for 10 s
  };
  for (const auto& [content, touchedPolls, state, sleeps] : cases) {
    if (content) test::writeFile(lock_, *content);
    touchedPolls_ = touchedPolls;
    const ZoneLock lock = acquire();
    EXPECT_EQ(std::tuple(lock.state, sleeps_), std::tuple(state, sleeps)) << content.value_or("(none)");
    EXPECT_EQ(lock.token, platform::modificationTime(lock_).value());
    EXPECT_EQ(test::readFile(lock_), content == own ? own : written);
    EXPECT_EQ(releaseZoneLock(lock_), kLockRemoved);
  }

  // A new lock is for its owner only, and valid while the file is less
  // than 6 s newer than the token.
  const ZoneLock lock = acquire();
  EXPECT_EQ(fs::status(lock_).permissions(), fs::perms::owner_read | fs::perms::owner_write);
  fs::last_write_time(lock_, fs::last_write_time(lock_) + 5s);
  EXPECT_TRUE(zoneLockValid(lock_, lock.token));
  fs::last_write_time(lock_, fs::last_write_time(lock_) + 1s);
  EXPECT_FALSE(zoneLockValid(lock_, lock.token));
  EXPECT_EQ(releaseZoneLock(lock_), kLockRemoved);
  EXPECT_FALSE(zoneLockValid(lock_, lock.token));
  EXPECT_EQ(releaseZoneLock(lock_), kLockNotRemoved);

  // A lock held by another process is left alone by our release.
  test::writeFile(lock_, kForeign);
  EXPECT_EQ(releaseZoneLock(lock_), kLockNotRemoved);
  EXPECT_EQ(test::readFile(lock_), kForeign);
  fs::remove(lock_);

  // A directory or a FIFO in the way can never be a lock: given up at once,
  // without waiting, without blocking and without removing it.
  fs::create_directory(lock_);
  const ZoneLock refused = acquire();
  EXPECT_EQ(std::tuple(refused.state, refused.token, sleeps_), std::tuple(kLockGivenUp, 0, 0));
  EXPECT_TRUE(fs::is_directory(lock_));
  fs::remove(lock_);
  ASSERT_EQ(::mkfifo(lock_.c_str(), 0600), 0);
  const ZoneLock fifo = acquire();
  EXPECT_EQ(std::tuple(fifo.state, fifo.token, sleeps_), std::tuple(kLockGivenUp, 0, 0));
  EXPECT_TRUE(fs::is_fifo(lock_));
}

TEST_F(ZoneLockTest, OwnLockByProcessNumberAndReleaseByTheBareName) {
  using namespace std::string_literals;
  for (const std::string& yes : {"123"s, "0000123"s, "123 \n"s, "123\0junk"s}) EXPECT_TRUE(lockHeldBy(yes, 123));
  for (const char* no : {"1234", "12", "123x", " 123", "", "00000000000000000000123"}) {
    EXPECT_FALSE(lockHeldBy(no, 123)) << no;
  }

  // When the zone's directory is gone, only a lock of our own is removed
  // under its bare name.
  const auto previous = fs::current_path();
  fs::current_path(dir_.path());
  test::writeFile("zone.lck", kForeign);
  EXPECT_EQ(releaseZoneLock("gone/zone.lck"), kLockNotRemoved);
  EXPECT_TRUE(test::fileExists("zone.lck"));
  test::writeFile("zone.lck", std::to_string(platform::processId()));
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
      std::this_thread::sleep_for(60ms);
      fs::remove(inside);
      if (releaseZoneLock(lock_) != kLockRemoved) return 5;
      std::this_thread::sleep_for(10ms);
    }
    return 0;
  };
  std::fflush(nullptr);
  const pid_t child = ::fork();
  const int failure = contend();
  if (child == 0) ::_exit(failure);
  EXPECT_EQ(std::pair(failure, childStatus(child)), std::pair(0, 0));
  EXPECT_FALSE(test::fileExists(lock_));
}

TEST_F(ZoneLockTest, LockStillHeldAtExitIsRemovedOnlyWhenStillOurs) {
  for (const bool takenOver : {false, true}) {
    std::fflush(nullptr);
    const pid_t child = ::fork();
    if (child == 0) {
      if (acquireZoneLock(lock_).token == 0) ::_exit(3);
      if (takenOver) test::writeFile(lock_, kForeign);
      std::exit(0);
    }
    EXPECT_EQ(childStatus(child), 0);
    EXPECT_EQ(test::fileExists(lock_), takenOver);
  }
  EXPECT_EQ(test::readFile(lock_), kForeign);
}

}  // namespace
}  // namespace pc::zonedb
