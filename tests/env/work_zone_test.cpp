#include <sys/stat.h>

#include "env/path_expander.h"
#include "env/work_zone.h"
#include "env/zone_number.h"
#include "platform/platform.h"
#include "env_fixture.h"

namespace pc::test {
namespace {

// A suite layout in real temporary directories: <root>/zone, <root>/conf
// with the counter, <root>/tmp for the zones' temporary directories.
class WorkZone : public EnvTest {
 protected:
  WorkZone() {
    ::mkdir(zone().c_str(), 0777);
    ::mkdir(conf().c_str(), 0777);
    set("TRXZONE", zone());
    set("TRXCONF", conf());
    set("TRXTMP", root_.file("tmp"));
  }
  std::string zone() const { return root_.file("zone"); }
  std::string conf() const { return root_.file("conf"); }
  std::string zoneFile() const { return zone() + "/workzone.num"; }
  std::string counterFile() const { return conf() + "/workzone.num"; }
  std::string tmp(const std::string& number) const { return root_.file("tmp/" + number); }

  TempDir root_;
};

TEST_F(WorkZone, FixedDirectoryIsTakenAsItStands) {
  set("TRXTMPDIR", root_.file("not/there"));
  EXPECT_EQ(temporaryDirectory(), std::optional<std::string>(root_.file("not/there")));
  EXPECT_FALSE(fileExists(zoneFile()));
  EXPECT_FALSE(fileExists(root_.file("not")));
}

TEST_F(WorkZone, NewZoneTakesTheNextNumberAndKeepsIt) {
  writeFile(counterFile(), "0000002a\n");
  char buffer[512];
  ASSERT_EQ(expandName("$TMP/contour.bin", buffer, sizeof buffer), EXPAND_OK);
  EXPECT_EQ(std::string(buffer), tmp("0000002b") + "/contour.bin");
  EXPECT_EQ(readFile(counterFile()), "0000002b\n");
  EXPECT_EQ(readFile(zoneFile()), "0000002b\n");
  EXPECT_TRUE(isExistingDirectory(tmp("0000002b")));
  EXPECT_EQ(Recorded::traces.back(), "TMP = '" + tmp("0000002b") + "' from work zone");
  // Later references read no file and remake a removed directory.
  std::remove(zoneFile().c_str());
  ::rmdir(tmp("0000002b").c_str());
  EXPECT_EQ(temporaryDirectory(), std::optional<std::string>(tmp("0000002b")));
  EXPECT_TRUE(isExistingDirectory(tmp("0000002b")));
  EXPECT_FALSE(fileExists(zoneFile()));
  // A second run in the same zone reuses its number.
  writeFile(zoneFile(), "0000002b  \r\n");
  env_testing::resetWorkZone();
  EXPECT_EQ(temporaryDirectory(), std::optional<std::string>(tmp("0000002b")));
  EXPECT_EQ(readFile(counterFile()), "0000002b\n");
  EXPECT_TRUE(Recorded::fatals.empty());
}

TEST_F(WorkZone, CounterContents) {
  const std::vector<std::pair<std::string, std::string>> cases = {
      {"zz\n", "00000001\n"},
      {"\n", "00000001\n"},
      {"ffffffff\n", "00000001\n"},
      {"  0x1F tail\nsecond line\n", "00000020\nil\nsecond line\n"},
      {std::string("\0\xff\xfe garbage\n", 12), "00000001\n"},
  };
  for (const auto& [before, after] : cases) {
    writeFile(counterFile(), before);
    std::remove(zoneFile().c_str());
    env_testing::resetWorkZone();
    const std::string number = after.substr(0, 8);
    EXPECT_EQ(temporaryDirectory(), std::optional<std::string>(tmp(number))) << before;
    EXPECT_EQ(readFile(counterFile()).substr(0, after.size()), after) << before;
    EXPECT_EQ(readFile(zoneFile()), number + "\n");
  }
  // 10 MB without a line end: only the start of the file is replaced.
  writeFile(counterFile(), std::string(10 << 20, 'q'));
  std::remove(zoneFile().c_str());
  env_testing::resetWorkZone();
  EXPECT_EQ(temporaryDirectory(), std::optional<std::string>(tmp("00000001")));
  const std::string counter = readFile(counterFile());
  EXPECT_EQ(counter.size(), std::size_t{10 << 20});
  EXPECT_EQ(counter.substr(0, 10), "00000001\nq");
  EXPECT_TRUE(Recorded::fatals.empty());
}

TEST_F(WorkZone, CounterFallsBackToTheInstallation) {
  set("TRXCONF", std::nullopt);
  set("TRXHOME", root_.path());
  ::mkdir(root_.file("client").c_str(), 0777);
  ::mkdir(root_.file("client/trxconf").c_str(), 0777);
  writeFile(root_.file("client/trxconf/workzone.num"), "00000007\n");
  EXPECT_EQ(temporaryDirectory(), std::optional<std::string>(tmp("00000008")));
  const auto& traces = Recorded::traces;
  const auto undefined = std::find(traces.begin(), traces.end(), "TRXCONF = <undefined variable>");
  ASSERT_NE(undefined, traces.end());
  ASSERT_NE(undefined + 1, traces.end());
  EXPECT_EQ(undefined[1], "$TRXCONF/workzone.num expansion error : -43");
  EXPECT_EQ(readFile(root_.file("client/trxconf/workzone.num")), "00000008\n");
}

TEST_F(WorkZone, FatalMessages) {
  const auto expectFatal = [&](const std::string& message) {
    Recorded::fatals.clear();
    env_testing::resetWorkZone();
    EXPECT_EQ(temporaryDirectory(), std::nullopt) << message;
    EXPECT_EQ(Recorded::fatals, std::vector<std::string>{message});
  };
  expectFatal("Error opening '" + counterFile() + "' file\n");
  writeFile(counterFile(), "");
  expectFatal("Error reading '" + counterFile() + "' file\n");
  EXPECT_FALSE(fileExists(zoneFile()));
  set("TRXCONF", "");  // would put the counter at the root
  expectFatal("TRXHOME is not defined\n");
  set("TRXCONF", conf());
  writeFile(counterFile(), "00000001\n");
  set("TRXZONE", root_.file("no-zone"));
  expectFatal("Error creating '" + root_.file("no-zone") + "/workzone.num' file\n");
  set("TRXZONE", std::nullopt);
  expectFatal("TRXZONE is not defined\n");
  set("TRXZONE", "");
  expectFatal("TRXZONE is not defined\n");
  set("TRXZONE", "$TMP/z");  // must not start over for ever
  expectFatal("TRXZONE is not defined\n");
  set("TRXZONE", zone());
  for (const std::string& garbage : {std::string(""), std::string("../../etc\n"), std::string("2b x\n"),
                                     std::string("\x01\x02\xff"), std::string(10 << 20, 'z')}) {
    writeFile(zoneFile(), garbage);
    expectFatal("Error reading file '" + zoneFile() + "'\n");
  }
  writeFile(root_.file("plain"), "");
  set("TRXTMP", root_.file("plain"));
  writeFile(zoneFile(), "0000002b\n");
  expectFatal("Could not create temporary directory '" + root_.file("plain") + "/0000002b'");
}

TEST_F(WorkZone, UndefinedTemporaryRootLeavesTmpUndefined) {
  writeFile(zoneFile(), "0000002b\n");
  for (const std::optional<std::string>& value : {std::optional<std::string>(), std::optional<std::string>("")}) {
    set("TRXTMP", value);
    env_testing::resetWorkZone();
    char buffer[64];
    EXPECT_EQ(expandName("$TMP/x", buffer, sizeof buffer), EXPAND_UNDEFINED);
    EXPECT_STREQ(buffer, "/x");
  }
  EXPECT_TRUE(Recorded::fatals.empty());
  EXPECT_FALSE(fileExists("/0000002b"));
}

TEST_F(WorkZone, MakeDirectoriesAndDirectoryTests) {
  const std::string base = root_.path();
  EXPECT_EQ(makeDirectories(base + "/a\\b//c"), 0);
  EXPECT_TRUE(isDirectory(base + "//a\\\\b/c/"));
  EXPECT_EQ(makeDirectories(base + "/a/b/c"), 0);
  writeFile(base + "/file", "");
  EXPECT_EQ(makeDirectories(base + "/file/sub"), -1);
  EXPECT_EQ(makeDirectories(base + "/file"), -1);
  EXPECT_FALSE(isExistingFile(""));
  EXPECT_TRUE(isExistingFile(base + "/file"));
  EXPECT_FALSE(isExistingDirectory(base + "/file"));
}

TEST_F(WorkZone, FileExistsWithPatterns) {
  writeFile(conf() + "/environ.cfg", "");
  EXPECT_TRUE(pc::fileExists(conf() + "/environ.cfg"));
  EXPECT_TRUE(pc::fileExists(conf() + "/*.CFG"));
  EXPECT_TRUE(pc::fileExists(conf() + "/env?ron.*"));
  EXPECT_FALSE(pc::fileExists(conf() + "/*.txt"));
  EXPECT_FALSE(pc::fileExists(conf() + "/environ.cfg?"));
  EXPECT_FALSE(pc::fileExists(root_.file("c*/environ.cfg")));  // patterns in the last part only
  EXPECT_FALSE(pc::fileExists(""));
  EXPECT_TRUE(wildcardMatch("*a*b", "xxaxxab"));
  EXPECT_TRUE(wildcardMatch("A?c*", "abc"));
  EXPECT_TRUE(wildcardMatch("*", ""));
  EXPECT_FALSE(wildcardMatch("?", ""));
  EXPECT_FALSE(wildcardMatch("*a*b", "xxaxxa"));
  EXPECT_FALSE(wildcardMatch(std::string(200, '*') + "b", std::string(10000, 'a')));
}

TEST_F(WorkZone, InstallationDirectory) {
  EXPECT_EQ(installationFromExecutable("/opt/t/exe/linux/pocket-classifier", "linux"),
            std::optional<std::string>("/opt/t"));
  EXPECT_EQ(installationFromExecutable("C:\\T\\EXE\\Msw\\tool.exe", "msw"), std::optional<std::string>("C:/T"));
  EXPECT_EQ(installationFromExecutable("/opt/t/bin/linux/p", "linux"), std::nullopt);
  EXPECT_EQ(installationFromExecutable("linux/p", "linux"), std::nullopt);
  // The test executable is not installed in that layout.
  EXPECT_EQ(installationDirectory(true), std::nullopt);
  set("TRXHOME_LS", "/ls/home");
  EXPECT_EQ(installationDirectory(false), std::optional<std::string>("/ls/home"));
  EXPECT_EQ(platform::getEnv("TRXHOME"), std::nullopt);
  EXPECT_EQ(installationDirectory(true), std::optional<std::string>("/ls/home"));
  EXPECT_EQ(platform::getEnv("TRXHOME"), std::optional<std::string>("/ls/home"));
  set("TRXHOME", "/h");
  EXPECT_EQ(installationDirectory(true), std::optional<std::string>("/h"));
}

TEST(ZoneNumbers, CounterArithmetic) {
  EXPECT_EQ(counterValue("\t0XfFz"), std::optional<std::uint32_t>(0xff));
  EXPECT_EQ(counterValue("123456789abcdef"), std::optional<std::uint32_t>(0xffffffffu));
  EXPECT_EQ(counterValue("-1"), std::nullopt);
  EXPECT_EQ(nextZoneNumber(0x2a), 0x2bu);
  EXPECT_EQ(nextZoneNumber(0xffffffffu), 1u);
}

}  // namespace
}  // namespace pc::test
