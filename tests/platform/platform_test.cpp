#include "platform/platform.h"

#include <gtest/gtest.h>

#include <csignal>
#include <ctime>

#include "support/test_support.h"

namespace pc::platform {
namespace {

using pc::test::ScopedEnv;
using pc::test::TempDir;
using pc::test::writeFile;

TEST(Platform, ExecutableEnvironmentAndFiles) {
  const auto exe = executablePath();
  ASSERT_TRUE(exe.has_value());
  EXPECT_EQ(exe->substr(exe->rfind('/') + 1), "test_platform");
  EXPECT_TRUE(isRegularFile(*exe));
  ScopedEnv guard("PC_PLATFORM_TEST_VAR", std::nullopt);
  ASSERT_TRUE(setEnv("PC_PLATFORM_TEST_VAR", ""));
  EXPECT_EQ(getEnv("PC_PLATFORM_TEST_VAR"), std::optional<std::string>(""));  // set but empty
  ASSERT_TRUE(unsetEnv("PC_PLATFORM_TEST_VAR"));
  EXPECT_EQ(getEnv("PC_PLATFORM_TEST_VAR"), std::nullopt);
  TempDir dir;
  writeFile(dir.file("f"), "x");
  EXPECT_TRUE(isRegularFile(dir.file("f")));
  EXPECT_FALSE(isDirectory(dir.file("f")));
  EXPECT_FALSE(pathExists(""));
  EXPECT_TRUE(removeFile(dir.file("f")));
  EXPECT_FALSE(removeFile(dir.file("f")));
  EXPECT_TRUE(listDirectory(dir.path()).empty());
}

TEST(Platform, DirectoryCreationOutcomes) {
  TempDir dir;
  EXPECT_EQ(createDirectory(dir.file("sub")), DirectoryCreation::created);
  EXPECT_EQ(createDirectory(dir.file("sub")), DirectoryCreation::alreadyExists);
  EXPECT_EQ(createDirectory(dir.file("no/parent")), DirectoryCreation::failed);
  EXPECT_EQ(createDirectory(""), DirectoryCreation::failed);
  writeFile(dir.file("plain"), "");
  EXPECT_EQ(createDirectory(dir.file("plain/x")), DirectoryCreation::failed);
  EXPECT_EQ(makeDirectory(dir.file("sub")), 1);
  EXPECT_EQ(listDirectory(dir.path()).size(), 2u);
}

TEST(Platform, LocalTimeOfAKnownSecond) {
  EXPECT_LE(std::abs(currentTime() - static_cast<std::int64_t>(std::time(nullptr))), 2);
  std::optional<LocalTime> t;
  {
    ScopedEnv tz("TZ", "UTC0");
    ::tzset();
    t = localTime(951782400 + 3723);  // 2000-02-29 01:02:03 UTC
  }
  ::tzset();
  ASSERT_TRUE(t.has_value());
  EXPECT_EQ((std::vector<int>{t->year, t->month, t->day, t->hour, t->minute, t->second}),
            (std::vector<int>{2000, 2, 29, 1, 2, 3}));
}

TEST(PlatformDeathTest, BreakpointTrapStopsTheProcessWithoutDebugger) {
  EXPECT_EXIT(breakpointTrap(), testing::KilledBySignal(SIGTRAP), "");
}

}  // namespace
}  // namespace pc::platform
