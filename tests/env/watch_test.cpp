#include <csignal>
#include <regex>

#include "env/expansion_watch.h"
#include "env/path_expander.h"
#include "env_fixture.h"

namespace pc::test {
namespace {

using Watch = EnvTest;
using WatchDeathTest = EnvTest;

TEST_F(Watch, SettingsAndLogLineFormat) {
  set("TRX_EXPAND_MIN_BUFFER_SIZE", "  -12abc");
  set("TRX_EXPAND_WATCH", "a| b;;c ");
  set("TEMP", "/t");
  EXPECT_EQ(expanderSettings().minimumBufferSize, -12);
  EXPECT_EQ(expanderSettings().watchList, (std::vector<std::string>{"a", "b", "c"}));
  EXPECT_EQ(expanderSettings().logFileName, "/t/tarnex_expand_log.txt");
  EXPECT_EQ(expanderSettings().programName, "test_env");
  set("TRX_EXPAND_MIN_BUFFER_SIZE", "99999999999");
  EXPECT_EQ(expanderSettings().minimumBufferSize, -12);  // read once
  env_testing::resetExpanderSettings();
  EXPECT_EQ(expanderSettings().minimumBufferSize, 2147483647);
  EXPECT_EQ(expansionLogLine("2024-01-02@03:04:05", 513, 512, 'C', "prog", "$TMP/x"),
            "[2024-01-02@03:04:05] MinBufferSize=513 > 512 (C) prog expanding '$TMP/x'\n");
  EXPECT_EQ(expansionLogLine("t", 7, 6, 'Z', "p", nullptr),
            "[t] MinBufferSize=7 > 6 (<UnknownStringFormat>) p expanding '<nullptr>'\n");
}

TEST_F(Watch, SmallBuffersAreLogged) {
  TempDir dir;
  set("TEMP", dir.path());
  set("TRX_EXPAND_MIN_BUFFER_SIZE", "600");
  char buffer[601];
  std::vector<char> field(600);
  EXPECT_EQ(expandName("abc", buffer, 601), EXPAND_OK);  // 600 + 1 fits
  EXPECT_EQ(expandPath("abc", field), EXPAND_OK);        // 600 fits a field
  EXPECT_FALSE(fileExists(dir.file("tarnex_expand_log.txt")));
  EXPECT_EQ(expandName("abc", buffer, 600), EXPAND_OK);
  field.resize(599);
  EXPECT_EQ(expandFileName("?X/y", field), EXPAND_UNDEFINED);
  EXPECT_EQ(expandText("not watched", field), EXPAND_OK);
  const std::string stamp = R"(\[\d{4}-\d\d-\d\d@\d\d:\d\d:\d\d\] )";
  EXPECT_TRUE(std::regex_match(readFile(dir.file("tarnex_expand_log.txt")),
                               std::regex(stamp + "MinBufferSize=601 > 600 \\(C\\) test_env expanding 'abc'\n" +
                                          stamp + "MinBufferSize=600 > 599 \\(F\\) test_env expanding '\\?X/y'\n")));
}

TEST_F(WatchDeathTest, NegativeMinimumOrWatchedNameTraps) {
  set("TRX_EXPAND_MIN_BUFFER_SIZE", "-600");
  char buffer[16];
  EXPECT_EXIT(expandName("abc", buffer, sizeof buffer), testing::KilledBySignal(SIGTRAP), "");
  set("TRX_EXPAND_MIN_BUFFER_SIZE", "600");
  set("TRX_EXPAND_WATCH", "x.bin|contour");
  env_testing::resetExpanderSettings();
  EXPECT_EXIT(expandName("$TMP/contour.bin", buffer, sizeof buffer), testing::KilledBySignal(SIGTRAP), "");
  EXPECT_EQ(expandName("other", buffer, sizeof buffer), EXPAND_OK);
}

}  // namespace
}  // namespace pc::test
