#include "platform/platform.h"

#include <gtest/gtest.h>

#include <ctime>

#include "support/platform_conventions.h"
#include "support/test_support.h"

namespace pc::platform {
namespace {

using namespace pc::test;

TEST(Platform, ExecutableEnvironmentAndFiles) {
  const std::string exe = executablePath().value_or("");
  EXPECT_EQ(exe.substr(exe.rfind(platformConventions().separator) + 1),
            "test_platform" + platformConventions().executableSuffix);
  ScopedEnv guard("PC_PLATFORM_TEST_VAR", std::nullopt);
  ASSERT_TRUE(setEnv("PC_PLATFORM_TEST_VAR", ""));
  EXPECT_EQ(getEnv("PC_PLATFORM_TEST_VAR"), std::optional<std::string>(""));  // set but empty
  ASSERT_TRUE(unsetEnv("PC_PLATFORM_TEST_VAR"));
  EXPECT_EQ(getEnv("PC_PLATFORM_TEST_VAR"), std::nullopt);
  TempDir dir;
  writeFile(dir.file("f"), "x");
  EXPECT_TRUE(isRegularFile(dir.file("f")));
  EXPECT_FALSE(isDirectory(dir.file("f")));
  EXPECT_EQ(createDirectory(dir.file("sub")), DirectoryCreation::created);
  EXPECT_EQ(createDirectory(dir.file("sub")), DirectoryCreation::alreadyExists);
  EXPECT_EQ(makeDirectory(dir.file("sub")), 1);  // an existing directory is benign
  for (const std::string& bad : {std::string(), dir.file("no/parent"), dir.file("f/x")}) {
    EXPECT_EQ(createDirectory(bad), DirectoryCreation::failed) << bad;
  }
  EXPECT_TRUE(removeFile(dir.file("f")));
  EXPECT_FALSE(removeFile(dir.file("f")));
  EXPECT_EQ(listDirectory(dir.path()), std::vector<std::string>{"sub"});
}

TEST(Platform, LocalTimeOfAKnownSecond) {
  EXPECT_LE(std::abs(currentTime() - static_cast<std::int64_t>(std::time(nullptr))), 2);
  ScopedEnv tz("TZ", "UTC0");
  ::tzset();
  const LocalTime t = localTime(951782400 + 3723).value_or(LocalTime{});  // 2000-02-29 01:02:03 UTC
  EXPECT_EQ((std::vector<int>{t.year, t.month, t.day, t.hour, t.minute, t.second}),
            (std::vector<int>{2000, 2, 29, 1, 2, 3}));
}

}  // namespace
}  // namespace pc::platform
