// Tests of the environment layer: reference expansion and its entry points,
// the message channels and the expander's debugging aids, and the work zone.
// Every variable the layer reads is cleared for each case, the channels and
// the configuration table are recorded stand-ins, and the process-wide state
// is forgotten around each case.
#include <gtest/gtest.h>
#include <sys/stat.h>

#include <algorithm>
#include <csignal>
#include <cstdio>
#include <cstring>
#include <forward_list>
#include <map>
#include <regex>

#include "env/configuration_lookup.h"
#include "env/diagnostic_channels.h"
#include "env/env_testing.h"
#include "env/path_expander.h"
#include "env/reference_scanner.h"
#include "env/separators.h"
#include "env/variable_lookup.h"
#include "env/work_zone.h"
#include "platform/platform.h"
#include "support/test_support.h"

namespace pc::test {
namespace {

using Lines = std::vector<std::string>;
using Text = std::optional<std::string>;

// What the layer sent on its channels, and the configuration table it sees.
struct Recorded {
  Lines warnings, fatals, traces;
  std::map<std::string, ConfigurationValue> table;  // "section/KEY"
} rec;

class EnvTest : public ::testing::Test {
 protected:
  EnvTest() {
    for (const char* name : {"TRXTMPDIR", "TRXTMP", "TRXZONE", "TRXCONF", "TRXHOME", "TRXHOME_LS", "TRXNULL",
                             "TRX_TRXFILES_VERBOSE", "TRX_EXPAND_MIN_BUFFER_SIZE", "TRX_EXPAND_WATCH",
                             "TRX_EXPAND_LOGFILE_NAME", "TEMP", "TRX_BUFFER_TOO_SMALL_OPTION"}) {
      set(name, std::nullopt);
    }
    rec = {};
    setWarningHandler([](const char* m) { rec.warnings.emplace_back(m); });
    setFatalHandler([](const char* m) { rec.fatals.emplace_back(m); });
    setTraceHandler([](const char* m) { rec.traces.emplace_back(m); });
    setConfigurationLookup([](std::string_view section, std::string_view key) -> std::optional<ConfigurationValue> {
      const auto it = rec.table.find(std::string(section) + "/" + std::string(key));
      return it == rec.table.end() ? std::nullopt : std::optional(it->second);
    });
    env_testing::resetProcessState();
  }
  ~EnvTest() override {
    env_testing::resetProcessState();
    setWarningHandler(nullptr);  // back to the defaults
    setFatalHandler(nullptr);
    setTraceHandler(nullptr);
    setConfigurationLookup(nullptr);
  }
  // The latest setting is undone first, so that the first one restores the
  // value the process had.
  void set(const std::string& name, const Text& value) { env_.emplace_front(name, value); }
  void set(std::initializer_list<std::pair<std::string, std::string>> values) {
    for (const auto& [name, value] : values) set(name, value);
  }

 private:
  std::forward_list<ScopedEnv> env_;
};
using EnvDeathTest = EnvTest;

TEST_F(EnvTest, SubstitutionCodesAndResults) {
  std::string result;
  set({{"PCT_A", "x"}, {"PCT_LPATH", "/l1;/l2"}, {"PCT_B", "C:/b"}, {"PCT_EQ", "=yes"}, {"PCT_SELF", "a$PCT_SELF"}});
  // A chain of 64 values below PCT_C0 (one too many), and values that double
  // at every level below PCT_D0 (too many references, or bytes with text).
  const auto n = [](const char* prefix, int i) { return prefix + std::to_string(i); };
  for (int i = 0; i < 64; ++i) set(n("PCT_C", i), n("$PCT_C", i + 1));
  set("PCT_C64", "end");
  for (int i = 0; i < 40; ++i) set(n("PCT_D", i), n("$PCT_D", i + 1) + n("$PCT_D", i + 1));
  std::string opened;
  for (int i = 0; i < 10000; ++i) opened += "$(";
  const std::string bytes = std::string(1 << 20, 'n') + std::string("\xff\xfe\x01\t\x7f\0z", 7);
  const struct { Text trxnull; std::string text; int code; std::string result; } cases[] = {
      {{}, "a$$b??c$$|$PCT_A/$(PCT_A)${PCT_A}.$PCT_A.b|?PCT_L|?(PCT_L)", EXPAND_OK, "a$b?c$|x/xx.x.b|/l1;/l2|/l1;/l2"},
      {{}, "$PCT_C1", EXPAND_OK, "end"},  // the text and 63 nested values
      {{}, bytes, EXPAND_OK, bytes},      // passed through as bytes
      {{}, "$PCT_UNSET/x", EXPAND_UNDEFINED, "/x"},
      {{}, "$(PCT_EQ=)", EXPAND_UNDEFINED, ""},  // must not find PCT_EQ
      {{}, opened + std::string(10000, ')'), EXPAND_UNDEFINED, std::string(9999, ')')},
      {"<$>", "$PCT_UNSET/x?PCT_NOLIST", EXPAND_UNDEFINED, "<PCT_UNSET>/x<PCT_NOLIST>"},
      {"none", "$/x", EXPAND_UNDEFINED, "none/x"},  // the empty name
      // A replacement that expands cleanly still reports the missing name.
      {"$$(PCT_B)", "$PCT_UNSET/x", EXPAND_UNDEFINED, "PCT_UNSETC:/b/x"},
      // Hard errors empty the result, even after a -43.
      {{}, "$PCT_UNSET?{x", EXPAND_SYNTAX, ""},
      {{}, opened, EXPAND_SYNTAX, ""},
      {{}, "$PCT_SELF", EXPAND_TOO_DEEP, ""},
      {{}, "$PCT_C0", EXPAND_TOO_DEEP, ""},
      {{}, "$PCT_D0", EXPAND_TOO_DEEP, ""},
      {std::string(4096, 'b'), "$PCT_D0", EXPAND_BUFFER_TOO_SMALL, ""},
      {"$$", "$PCT_UNSET", EXPAND_TOO_DEEP, ""},  // an undefined-value text that is itself undefined
  };
  for (const auto& c : cases) {
    set("TRXNULL", c.trxnull);
    result = "stale";
    EXPECT_EQ(substituteReferences(c.text, result), c.code) << c.text.substr(0, 60);
    EXPECT_TRUE(result == c.result) << c.text.substr(0, 60) << " gave " << result.substr(0, 60);
  }
}

TEST_F(EnvTest, LookupOrderAndTraceLines) {
  std::string result;
  set({{"PCT_A", "env"}, {"PCT_MPATH", "/e"}, {"TRXTMPDIR", "/w/tmp/"}});
  rec.table = {{"var/PCT_A", {"table", "set by program"}}, {"var/TMP", {"never", "set by program"}},
               {"var/PCT_T", {"v \t\x01", "from '/i/config/environ.cfg' line 3"}},
               {"path/PCT_L", {"/p ", "set by program"}}, {"path/PCT_M", {"/never", "set by program"}}};
  EXPECT_EQ(substituteReferences("$PCT_A|$PCT_T|$TMP|?PCT_L|?PCT_M|$PCT_U|?PCT_U", result), EXPAND_UNDEFINED);
  EXPECT_EQ(result, "env|v|/w/tmp/|/p|/e||");
  EXPECT_EQ(rec.traces,
            (Lines{"PCT_A = 'env' from environment", "PCT_T = 'v' from '/i/config/environ.cfg' line 3",
                   "TMP = '/w/tmp/' from environment variable TRXTMPDIR", "PCT_L = '/p' set by program",
                   "PCT_M = '/e' from environment 'PCT_MPATH'", "PCT_U = <undefined variable>",
                   "PCT_U = <undefined path>"}));
}

TEST(Separators, BothPlatformsRewrites) {
  struct Case { char separator; std::string text, expected; };
  for (Case c : {Case{'/', "//server\\share\\\\f//", "/server/share/f/"},
                 Case{'\\', "\\\\server\\share//f", "\\server\\share\\f"}, Case{'\\', "C:/a/\\/b", "C:\\a\\b"}}) {
    normaliseSeparators(c.text, c.separator);
    EXPECT_EQ(c.text, c.expected);
  }
}

TEST_F(EnvTest, EntryPointsCodesAndBuffers) {
  TempDir dir;
  for (const char* sub : {"a", "b", "b/sub"}) ASSERT_EQ(::mkdir(dir.file(sub).c_str(), 0777), 0);
  writeFile(dir.file("b/environ.cfg"), "");
  // Blank pieces of a list are no directory (not the current one); PCT_EMPTY
  // holds no directory at all: the file part is taken alone.
  set({{"CFGPATH", " ;" + dir.file("a") + "; " + dir.file("b") + "/ ,"}, {"PCT_EMPTYPATH", " ; ,"}});
  set({{"PCT_S", "a//b\\c"}, {"TRXNULL", "<$>"}});
  using Entry = int (*)(std::string_view, std::span<char>);
  const Entry name = [](std::string_view s, std::span<char> d) {
    return expandName(std::string(s).c_str(), d.data(), d.size());
  };
  const auto pad = [](std::string s, std::size_t n) { return s.append(n - s.size(), ' '); };
  const std::string big(1 << 20, 'n');
  // Each case starts from a buffer of '#': failures must leave it so.
  const struct { Entry entry; std::string source; std::size_t size; int code; std::string buffer; } cases[] = {
      {name, "$PCT_S\\\\x", 64, EXPAND_OK, "a/b/c/x"},
      {name, "$PCT_UNSET/x", 64, EXPAND_UNDEFINED, "<PCT_UNSET>/x"},
      {name, "abcdefghij", 10, EXPAND_BUFFER_TOO_SMALL, "##########"},  // room for the NUL is needed
      {name, "abcdefghij", 11, EXPAND_OK, "abcdefghij"},
      // Fixed fields: no terminator, blank-padded, trailing blanks of the source ignored.
      {expandPath, "abcdefghij  ", 10, EXPAND_OK, "abcdefghij"},
      {expandPath, "$PCT_S", 10, EXPAND_OK, "a/b/c     "},
      {expandText, "$PCT_S", 10, EXPAND_OK, "a//b\\c    "},
      {expandText, "$PCT_UNSET\\x", 16, EXPAND_UNDEFINED, "<PCT_UNSET>\\x   "},
      {expandPath, "abcdefghij", 9, EXPAND_BUFFER_TOO_SMALL, "#########"},
      {expandText, "$(x", 9, EXPAND_SYNTAX, "#########"},
      // The search form; an undefined reference leaves the field blank.
      {expandFileName, "?CFG/environ.cfg", 200, EXPAND_OK, pad(dir.file("b/environ.cfg"), 200)},
      {expandFileName, "?CFG/none.cfg", 200, EXPAND_NOT_FOUND, pad(dir.file("a/none.cfg"), 200)},  // new files go here
      {expandFileName, "?CFG\\sub", 200, EXPAND_OK, pad(dir.file("b/sub"), 200)},  // a directory counts
      {expandFileName, dir.file("b//environ.cfg"), 200, EXPAND_OK, pad(dir.file("b/environ.cfg"), 200)},
      {expandFileName, dir.file("b/none"), 200, EXPAND_NOT_FOUND, pad(dir.file("b/none"), 200)},
      {expandFileName, "   ", 20, EXPAND_NOT_FOUND, pad("", 20)},
      {expandFileName, "?PCT_EMPTY/f//g", 20, EXPAND_NOT_FOUND, pad("f/g", 20)},
      {expandFileName, "$PCT_UNSET/x", 20, EXPAND_UNDEFINED, pad("", 20)},
      {expandFileName, "?PCT_NOLIST/x", 20, EXPAND_UNDEFINED, pad("", 20)},
      {expandFileName, "?CFG", 20, EXPAND_INVALID_ARGUMENT, std::string(20, '#')},
      {expandFileName, big, 20, EXPAND_BUFFER_TOO_SMALL, std::string(20, '#')},
  };
  for (const auto& c : cases) {
    std::vector<char> buffer(c.size, '#');
    EXPECT_EQ(c.entry(c.source, buffer), c.code) << c.source.substr(0, 60);
    EXPECT_EQ(std::string(buffer.data(), strnlen(buffer.data(), c.size)), c.buffer) << c.source.substr(0, 60);
  }
  set("PCT_SELF", "a$PCT_SELF");
  char buffer[16] = "$PCT_SELF";
  EXPECT_EQ(expandNameInPlace(buffer, sizeof buffer), EXPAND_TOO_DEEP);
  EXPECT_STREQ(buffer, "$PCT_SELF");
  EXPECT_EQ(expandName(nullptr, buffer, sizeof buffer), EXPAND_INVALID_ARGUMENT);
  EXPECT_EQ(expandName("n", nullptr, 4), EXPAND_INVALID_ARGUMENT);
  EXPECT_EQ(rec.warnings,
            (Lines{"_Expand(\"abcdefghij\") = error -32 - buffer size 10 too small",
                   "_Expand(\"abcdefghij\") = error -32 - buffer size 9 too small",
                   "_Expand(\"$(x\") = error -31 - syntax error", "_Expand(\"?CFG\") = error -44 - invalid argument",
                   "_Expand(\"" + big + "\") = error -32 - buffer size 20 too small",
                   "_Expand(\"$PCT_SELF\") = error -45 - references nested too deeply",
                   "_Expand(<nullptr>) = error -44 - invalid argument",
                   "_Expand(\"n\") = error -44 - invalid argument"}));
}

TEST_F(EnvDeathTest, DefaultChannels) {
  setWarningHandler(nullptr);
  setTraceHandler(nullptr);
  // Standard output and standard error of a warning and a trace, joined by '|'.
  const auto streams = [] {
    testing::internal::CaptureStdout();
    testing::internal::CaptureStderr();
    warning("w");
    trace(std::string("t"));
    const std::string out = testing::internal::GetCapturedStdout();
    return out + "|" + testing::internal::GetCapturedStderr();
  };
  EXPECT_EQ(streams(), "|w\n");
  EXPECT_EXIT(setFatalHandler(nullptr); fatal("TRXZONE is not defined\n"), testing::ExitedWithCode(255),
              "^TRXZONE is not defined\n\n$");
  set("TRX_TRXFILES_VERBOSE", "off");
  EXPECT_EQ(streams(), "|w\n");
  set("TRX_TRXFILES_VERBOSE", "OFF");  // only the exact "off" is quiet
  EXPECT_EQ(streams(), "w\nt\n|");
  EXPECT_EXIT(std::freopen("/dev/null", "w", stdout); setFatalHandler(nullptr); fatal("quiet"),
              testing::ExitedWithCode(255), "^$");  // on standard output: nothing on stderr
}

TEST_F(EnvDeathTest, ExpanderDebuggingAids) {
  TempDir dir;
  set({{"TEMP", dir.path()}, {"TRX_EXPAND_MIN_BUFFER_SIZE", " 600abc"}});  // the minimum is read like atoi
  char buffer[601];
  std::vector<char> field(600);
  EXPECT_EQ(expandName("abc", buffer, 601), EXPAND_OK);  // 600 + 1 fits
  EXPECT_EQ(expandPath("abc", field), EXPAND_OK);        // 600 fits a field
  EXPECT_EQ(expandName(nullptr, buffer, 600), EXPAND_INVALID_ARGUMENT);
  field.resize(599);
  EXPECT_EQ(expandFileName("?X/y", field), EXPAND_UNDEFINED);
  EXPECT_EQ(expandText("not watched", field), EXPAND_OK);
  set("TRX_EXPAND_MIN_BUFFER_SIZE", "99999999999");  // clamped
  env_testing::resetExpanderSettings();
  EXPECT_EQ(expandPath("abc", field), EXPAND_OK);
  const std::string stamp = R"(\[\d{4}-\d\d-\d\d@\d\d:\d\d:\d\d\] MinBufferSize=)";
  EXPECT_TRUE(std::regex_match(readFile(dir.file("tarnex_expand_log.txt")),
                               std::regex(stamp + "601 > 600 \\(C\\) test_env expanding '<nullptr>'\n" + stamp +
                                          "600 > 599 \\(F\\) test_env expanding '\\?X/y'\n" + stamp +
                                          "2147483647 > 599 \\(F\\) test_env expanding 'abc'\n")));
  // Traps: a negative minimum, a watched name, and the option for undersized buffers.
  set("TRX_EXPAND_MIN_BUFFER_SIZE", "-600");
  env_testing::resetExpanderSettings();
  EXPECT_EXIT(expandName("abc", buffer, 16), testing::KilledBySignal(SIGTRAP), "");
  set({{"TRX_EXPAND_MIN_BUFFER_SIZE", "600"}, {"TRX_EXPAND_WATCH", "x.bin| ;contour"}});
  EXPECT_EXIT(expandName("$TMP/contour.bin", buffer, 16), testing::KilledBySignal(SIGTRAP), "");
  EXPECT_EQ(expandName("other", buffer, 16), EXPAND_OK);
  set("TRX_BUFFER_TOO_SMALL_OPTION", "crash");
  EXPECT_EXIT(expandName("too long", buffer, 4), testing::KilledBySignal(SIGTRAP), "");
  set("TRX_BUFFER_TOO_SMALL_OPTION", "Crash");  // the exact word only
  EXPECT_EQ(expandName("too long", buffer, 4), EXPAND_BUFFER_TOO_SMALL);
  EXPECT_EQ(rec.warnings, (Lines{"_Expand(<nullptr>) = error -44 - invalid argument",
                                  "_Expand(\"too long\") = error -32 - buffer size 4 too small"}));
}

// A suite layout in a real temporary directory: <root>/zone, <root>/conf
// with the counter, <root>/tmp for the zones' temporary directories.
class WorkZone : public EnvTest {
 protected:
  WorkZone() {
    for (const std::string& d : {zone, conf}) ::mkdir(d.c_str(), 0777);
    set({{"TRXZONE", zone}, {"TRXCONF", conf}, {"TRXTMP", root.file("tmp")}});
  }
  std::string tmp(const std::string& number) const { return root.file("tmp/" + number); }
  // The directory as a new process decides it.
  Text fresh() {
    env_testing::resetWorkZone();
    return temporaryDirectory();
  }

  TempDir root;
  const std::string zone = root.file("zone"), conf = root.file("conf");
  const std::string zoneFile = zone + "/workzone.num", counterFile = conf + "/workzone.num";
};

TEST_F(WorkZone, NewZoneTakesTheNextNumberAndKeepsIt) {
  writeFile(counterFile, "0000002a\n");
  char buffer[512];
  ASSERT_EQ(expandName("$TMP/contour.bin", buffer, sizeof buffer), EXPAND_OK);
  EXPECT_EQ(std::string(buffer), tmp("0000002b") + "/contour.bin");
  EXPECT_EQ(readFile(counterFile), "0000002b\n");
  EXPECT_EQ(readFile(zoneFile), "0000002b\n");
  EXPECT_TRUE(isExistingDirectory(tmp("0000002b")));
  EXPECT_EQ(rec.traces.back(), "TMP = '" + tmp("0000002b") + "' from work zone");
  // Later references read no file and remake a removed directory.
  std::remove(zoneFile.c_str());
  ::rmdir(tmp("0000002b").c_str());
  EXPECT_EQ(temporaryDirectory(), Text(tmp("0000002b")));
  EXPECT_TRUE(isExistingDirectory(tmp("0000002b")));
  EXPECT_FALSE(fileExists(zoneFile));
  // A second run in the same zone reuses its number.
  writeFile(zoneFile, "0000002b  \r\n");
  EXPECT_EQ(fresh(), Text(tmp("0000002b")));
  EXPECT_EQ(readFile(counterFile), "0000002b\n");
}

TEST_F(WorkZone, CounterContents) {
  const std::string huge(10 << 20, 'q');  // no line end: only the start is replaced
  const std::pair<std::string, std::string> cases[] = {
      {"ffffffff\n", "00000001\n"},
      {"123456789abcdef\n", "00000001\nabcdef\n"},  // saturates, then starts again
      {"  0x1F tail\nsecond line\n", "00000020\nil\nsecond line\n"},
      {std::string("\0\xff\xfe garbage\n", 12), "00000001\nge\n"},
      {huge, std::string(huge).replace(0, 9, "00000001\n")},
  };
  for (const auto& [before, after] : cases) {
    writeFile(counterFile, before);
    std::remove(zoneFile.c_str());
    EXPECT_EQ(fresh(), Text(tmp(after.substr(0, 8)))) << before.substr(0, 20);
    EXPECT_TRUE(readFile(counterFile) == after) << before.substr(0, 20);
    EXPECT_EQ(readFile(zoneFile), after.substr(0, 9));
  }
}

TEST_F(WorkZone, CounterFallsBackToTheInstallation) {
  set("TRXCONF", std::nullopt);
  set("TRXHOME", root.path());
  ASSERT_EQ(makeDirectories(root.file("client/trxconf")), 0);
  writeFile(root.file("client/trxconf/workzone.num"), "00000007\n");
  EXPECT_EQ(temporaryDirectory(), Text(tmp("00000008")));
  EXPECT_EQ(readFile(root.file("client/trxconf/workzone.num")), "00000008\n");
  const Lines& t = rec.traces;
  EXPECT_NE(std::find(t.begin(), t.end(), "$TRXCONF/workzone.num expansion error : -43"), t.end());
}

TEST_F(WorkZone, FatalMessages) {
  const auto expectFatal = [&](const std::string& message) {
    rec.fatals.clear();
    EXPECT_EQ(fresh(), std::nullopt) << message;
    EXPECT_EQ(rec.fatals, Lines{message});
  };
  expectFatal("Error opening '" + counterFile + "' file\n");
  writeFile(counterFile, "");
  expectFatal("Error reading '" + counterFile + "' file\n");
  EXPECT_FALSE(fileExists(zoneFile));
  set("TRXCONF", "");  // would put the counter at the root
  expectFatal("TRXHOME is not defined\n");
  set("TRXCONF", conf);
  writeFile(counterFile, "00000001\n");
  set("TRXZONE", root.file("no-zone"));
  expectFatal("Error creating '" + root.file("no-zone") + "/workzone.num' file\n");
  for (const Text& value : {Text(), Text(""), Text("$TMP/z")}) {  // the last must not start over for ever
    set("TRXZONE", value);
    expectFatal("TRXZONE is not defined\n");
  }
  set("TRXZONE", zone);
  for (const std::string& garbage :
       {std::string(""), std::string("../../etc\n"), std::string("2b x\x01\xff\n"), std::string(10 << 20, 'z')}) {
    writeFile(zoneFile, garbage);
    expectFatal("Error reading file '" + zoneFile + "'\n");
  }
  writeFile(root.file("plain"), "");
  set("TRXTMP", root.file("plain"));
  writeFile(zoneFile, "0000002b\n");
  expectFatal("Could not create temporary directory '" + root.file("plain") + "/0000002b'");
}

TEST_F(WorkZone, TemporaryRootVariables) {
  set("TRXTMPDIR", root.file("not/there"));  // taken as it stands: no zone number, no directory
  EXPECT_EQ(temporaryDirectory(), Text(root.file("not/there")));
  EXPECT_FALSE(fileExists(root.file("not")));
  set("TRXTMPDIR", std::nullopt);
  writeFile(zoneFile, "0000002b\n");
  set("TRXTMP", "");  // TMP stays undefined rather than at the root
  char buffer[64];
  EXPECT_EQ(expandName("$TMP/x", buffer, sizeof buffer), EXPAND_UNDEFINED);
  EXPECT_STREQ(buffer, "/x");
  EXPECT_FALSE(fileExists("/0000002b"));
  EXPECT_TRUE(rec.fatals.empty());
}

TEST_F(WorkZone, DirectoriesAndPatterns) {
  EXPECT_EQ(makeDirectories(root.file("a\\b//c")), 0);
  EXPECT_TRUE(isDirectory(root.path() + "//a\\\\b/c/"));
  writeFile(root.file("file"), "");
  EXPECT_EQ(makeDirectories(root.file("file/sub")), -1);
  EXPECT_EQ(makeDirectories(root.file("file")), -1);
  writeFile(conf + "/environ.cfg", "");
  EXPECT_TRUE(pc::fileExists(conf + "/environ.cfg"));
  EXPECT_TRUE(pc::fileExists(conf + "/*.CFG"));
  EXPECT_TRUE(pc::fileExists(conf + "/env?ron.*"));
  EXPECT_FALSE(pc::fileExists(conf + "/*.txt"));
  EXPECT_FALSE(pc::fileExists(root.file("c*/environ.cfg")));  // patterns in the last part only
  EXPECT_TRUE(wildcardMatch("*a*b", "xxaxxab"));
  EXPECT_FALSE(wildcardMatch(std::string(200, '*') + "b", std::string(10000, 'a')));
}

TEST_F(EnvTest, InstallationDirectory) {
  EXPECT_EQ(installationFromExecutable("/opt/t/exe/linux/pocket-classifier", "linux"), Text("/opt/t"));
  EXPECT_EQ(installationFromExecutable("C:\\T\\EXE\\Msw\\tool.exe", "msw"), Text("C:/T"));
  EXPECT_EQ(installationFromExecutable("/opt/t/bin/linux/p", "linux"), std::nullopt);
  EXPECT_EQ(installationFromExecutable("linux/p", "linux"), std::nullopt);
  EXPECT_EQ(installationDirectory(true), std::nullopt);  // the test is not installed in that layout
  set("TRXHOME_LS", "/ls/home");
  EXPECT_EQ(installationDirectory(false), Text("/ls/home"));
  EXPECT_EQ(platform::getEnv("TRXHOME"), std::nullopt);
  EXPECT_EQ(installationDirectory(true), Text("/ls/home"));
  EXPECT_EQ(platform::getEnv("TRXHOME"), Text("/ls/home"));
  set("TRXHOME", "/h");
  EXPECT_EQ(installationDirectory(true), Text("/h"));
}

}  // namespace
}  // namespace pc::test
