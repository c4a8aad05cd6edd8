#include <gtest/gtest.h>

#include <cstdio>

#include "env/diagnostic_channels.h"
#include "support/test_support.h"

namespace pc::test {
namespace {

std::vector<std::string> seen;
void record(const char* message) { seen.emplace_back(message); }

// Standard output and standard error of `action`, joined by '|'.
template <typename F>
std::string streams(F action) {
  testing::internal::CaptureStdout();
  testing::internal::CaptureStderr();
  action();
  std::fflush(nullptr);
  const std::string out = testing::internal::GetCapturedStdout();
  return out + "|" + testing::internal::GetCapturedStderr();
}

TEST(Channels, DefaultsFollowTheVerboseSwitch) {
  const auto both = [] {
    warning("w");
    trace(std::string("t"));
  };
  ScopedEnv unset("TRX_TRXFILES_VERBOSE", std::nullopt);
  EXPECT_EQ(streams(both), "|w\n");
  EXPECT_FALSE(traceActive());
  ScopedEnv off("TRX_TRXFILES_VERBOSE", "off");
  EXPECT_EQ(streams(both), "|w\n");
  ScopedEnv upper("TRX_TRXFILES_VERBOSE", "OFF");  // only the exact "off" is quiet
  EXPECT_EQ(streams(both), "w\nt\n|");
  EXPECT_TRUE(traceActive());
}

TEST(Channels, HandlersAreReplacedAndRestored) {
  ScopedEnv unset("TRX_TRXFILES_VERBOSE", std::nullopt);
  seen.clear();
  EXPECT_EQ(setWarningHandler(record), &defaultWarningHandler);
  EXPECT_EQ(setTraceHandler(record), &defaultTraceHandler);
  EXPECT_EQ(setFatalHandler(record), &defaultFatalHandler);
  EXPECT_TRUE(traceActive());
  EXPECT_EQ(streams([] {
              warning(std::string("w"));
              trace("t");
              fatal("f");
              fatal(std::string("g"));
            }),
            "|");
  EXPECT_EQ(seen, (std::vector<std::string>{"w", "t", "f", "g"}));
  EXPECT_EQ(setWarningHandler(nullptr), &record);
  EXPECT_EQ(setTraceHandler(nullptr), &record);
  EXPECT_EQ(setFatalHandler(nullptr), &record);
  EXPECT_EQ(setFatalHandler(nullptr), &defaultFatalHandler);
}

TEST(ChannelsDeathTest, FatalEndsWithStatusMinusOne) {
  ScopedEnv unset("TRX_TRXFILES_VERBOSE", std::nullopt);
  EXPECT_EXIT(fatal("TRXZONE is not defined\n"), testing::ExitedWithCode(255), "^TRXZONE is not defined\n\n$");
  ScopedEnv on("TRX_TRXFILES_VERBOSE", "1");  // verbose: on standard output, nothing on stderr
  EXPECT_EXIT(std::freopen("/dev/null", "w", stdout); fatal("quiet"), testing::ExitedWithCode(255), "^$");
}

}  // namespace
}  // namespace pc::test
