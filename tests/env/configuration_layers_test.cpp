// Tests of the layers: the installation's file, the directories of ?ENV
// from the last to the first, the program's entries, the lookups of $NAME
// and ?NAME through the loaded table, and the failures of a whole load.
#include <sys/stat.h>

#include <filesystem>
#include <string>

#include "env/configuration_test_support.h"
#include "env/message_table.h"
#include "env/variable_lookup.h"

namespace pc::test {
namespace {

class LayersTest : public ConfigurationTest {
 protected:
  LayersTest() {
    std::filesystem::create_directories(home() + "/config");
    set("TRXHOME", home());
    set("TRXTMPDIR", root.file("tmp"));
  }
  std::string home() const { return root.file("T"); }
  std::string config() const { return home() + "/config/"; }
  // Writes environ.cfg into `directory` (created when missing).
  void layer(const std::string& directory, const std::string& text) const {
    std::filesystem::create_directories(directory);
    writeFile(directory + "/environ.cfg", text);
  }
  std::string var(const std::string& name) { return lookupVariable(name).value_or("<undefined>"); }
  std::string origin(const std::string& name) {
    const auto found = findVariable(name);
    return found ? found->origin : "<undefined>";
  }
  Lines loadingTraces() const {
    Lines lines;
    for (const auto& line : channels.traces) {
      if (line.rfind("LOADING", 0) == 0 || line.rfind("loading", 0) == 0 || line.rfind("Overloading", 0) == 0) {
        lines.push_back(line);
      }
    }
    return lines;
  }

  TempDir root;
};

TEST_F(LayersTest, PathListsExtendTheValuesTheyOverload) {
  const std::string u = root.file("u"), x = root.file("x");
  layer(config(), "[path]\nP = /T/config\nENV = " + u + ";" + x + "," + config() + "\n");
  layer(u, "[path]\nP = " + u + ";+\n");
  layer(x, "[path]\nP = " + x + ",+\n");
  // x is loaded before u: u overloads x, which overloaded the installation.
  EXPECT_EQ(lookupPathList("P"), u + ";" + x + ",/T/config");
  EXPECT_EQ(loadingTraces(),
            (Lines{"LOADING ENVIRONMENT FILES ....", "loading configuration file '" + config() + "environ.cfg'",
                   "loading configuration file '" + x + "/environ.cfg'", "Overloading '" + u + "/environ.cfg'\n",
                   "LOADING ENVIRONMENT FILES ....done."}));
  EXPECT_TRUE(channels.fatals.empty());
}

TEST_F(LayersTest, TheFirstDirectoryOfTheListHasTheLastWord) {
  const std::string u = root.file("u");
  set("PCT_A", "1");
  layer(config(),
        "[var]\nTRXTMP = /inst/tmp\nSHARED = inst\nONLY = inst\n"
        "/if PCT_A == 1\nCHOSEN = one\n/else\nCHOSEN = other\n/endif\n"
        "/if LINUX\nBEFORE = set\n/endif\n"
        "[path]\nENV = " + u + "; " + config() + "\n");
  layer(u, "[var]\nTRXTMP = /user/tmp\nSHARED = user+\n/if LINUX\nOS = linux\n/endif\n/if WINDOWS\nOS = windows\n/endif\n");
  EXPECT_EQ(var("TRXTMP"), "/user/tmp");
  EXPECT_EQ(var("SHARED"), "userinst");
  EXPECT_EQ(var("ONLY"), "inst");
  EXPECT_EQ(var("CHOSEN"), "one");
  EXPECT_EQ(var("OS"), "linux");
  // The program's entries come after the installation's own file.
  EXPECT_EQ(var("BEFORE"), "<undefined>");
  EXPECT_EQ(var("LINUX"), "1");
  EXPECT_EQ(var("pc"), "1");
  EXPECT_EQ(var("WINDOWS"), "<undefined>");
  EXPECT_EQ(origin("TRXTMP"), "from '" + u + "/environ.cfg' line 2");
  EXPECT_EQ(origin("ONLY"), "from '" + config() + "environ.cfg' line 4");
  EXPECT_EQ(origin("PC"), "set by program");
  EXPECT_EQ(origin("SHARED"), "from '" + u + "/environ.cfg' line 3");
  // The environment comes first.
  set("ONLY", "env");
  EXPECT_EQ(var("ONLY"), "env");
}

TEST_F(LayersTest, DirectoriesInsideTheConfigurationAndDuplicates) {
  const std::string site = config() + "site", u = root.file("u");
  // site lies inside the configuration directory: loaded together with the
  // first one outside it; the list's tail of loaded directories is dropped.
  layer(config(), "[var]\nV = inst\n[path]\nENV = " + u + ";" + site + ";" + config() + "\n");
  layer(site, "[var]\nV = site\n");
  layer(u, "[var]\nV = +,user\n");
  EXPECT_EQ(var("V"), "site,user");
  EXPECT_EQ(loadingTraces(),
            (Lines{"LOADING ENVIRONMENT FILES ....", "loading configuration file '" + config() + "environ.cfg'",
                   "loading configuration file '" + site + "/environ.cfg'",
                   "loading configuration file '" + u + "/environ.cfg'", "LOADING ENVIRONMENT FILES ....done."}));
}

TEST_F(LayersTest, AnEmptyListLoadsOnlyTheInstallationAndTheLoadHappensOnce) {
  layer(config(), "[var]\nA = 1\n[path]\nENV = ;, ;\n");
  EXPECT_EQ(var("A"), "1");
  EXPECT_EQ(var("B"), "<undefined>");
  EXPECT_EQ(loadingTraces(),
            (Lines{"LOADING ENVIRONMENT FILES ....", "loading configuration file '" + config() + "environ.cfg'",
                   "LOADING ENVIRONMENT FILES ....done."}));
  loadEnvironment();
  EXPECT_EQ(loadingTraces().size(), 3u);
}

TEST_F(LayersTest, LoadingListsFromTheirEnd) {
  const std::string a = root.file("a"), b = root.file("b");
  layer(a, "[var]\nK = a+\n");
  layer(b, "[var]\nK = b\n");
  MessageTable* table = loadConfigurationList(nullptr, " " + a + "/ ;;" + b + "\\", "environ.cfg");
  ASSERT_NE(table, nullptr);
  EXPECT_EQ(channels.traces, (Lines{"Overloading '" + b + "/environ.cfg'\n", "Overloading '" + a + "/environ.cfg'\n"}));
  EXPECT_EQ(lookup(table, findSection(table, "var"), "k"), std::string("ab"));
  destroyTable(table);
  table = loadConfigurationList(nullptr, "", "environ.cfg");
  ASSERT_NE(table, nullptr);
  EXPECT_EQ(sectionCount(table), 0);
  destroyTable(table);
}

TEST_F(LayersTest, FailuresOfAWholeLoad) {
  // Each case: what the installation holds, and the one fatal message.
  set("TRXHOME", std::nullopt);
  set("TRXHOME_LS", std::nullopt);
  EXPECT_EQ(var("X"), "<undefined>");
  EXPECT_EQ(channels.fatals, Lines{"The environment variable 'TRXHOME' is not defined\n"});

  env_testing::resetConfigurationLoader();
  channels = {};
  set("TRXHOME", home() + "/");
  EXPECT_EQ(var("X"), "<undefined>");
  EXPECT_EQ(channels.fatals, Lines{"Error loading '" + config() + "environ.cfg'\n"});

  env_testing::resetConfigurationLoader();
  channels = {};
  layer(config(), "[var]\nX = 1\n");
  EXPECT_EQ(var("X"), "1");
  EXPECT_EQ(channels.fatals, Lines{"Error evaluation '?ENV' path\n"});

  env_testing::resetConfigurationLoader();
  channels = {};
  layer(config(), "[path]\nENV = $(UNCLOSED\n");
  EXPECT_EQ(var("X"), "<undefined>");
  EXPECT_EQ(channels.warnings, Lines{"_Expand(\"?ENV\") = error -31 - syntax error"});
  EXPECT_EQ(channels.fatals, Lines{"Error evaluation '?ENV' path\n"});
}

TEST_F(LayersTest, FilesThatCannotBeRead) {
  const std::string dir = root.file("d"), fifo = root.file("f");
  layer(config(), "[path]\nENV = " + dir + "," + fifo + "," + config() + "\n");
  std::filesystem::create_directories(dir + "/environ.cfg");
  std::filesystem::create_directories(fifo);
  ASSERT_EQ(mkfifo((fifo + "/environ.cfg").c_str(), 0600), 0);
  // The FIFO has no writer: opening it blocking would never return.
  EXPECT_EQ(var("X"), "<undefined>");
  EXPECT_EQ(channels.fatals, Lines{"load_messages: file '" + fifo +
                                   "/environ.cfg', line 0 : Error opening file - Not a regular file"});
  env_testing::resetConfigurationLoader();
  channels = {};
  layer(config(), "[path]\nENV = " + dir + "," + config() + "\n");
  EXPECT_EQ(var("X"), "<undefined>");
  EXPECT_EQ(channels.fatals,
            Lines{"load_messages: file '" + dir + "/environ.cfg', line 0 : Error opening file - Is a directory"});
  // What was loaded before stays.
  EXPECT_EQ(lookupPathList("ENV"), dir + "," + config());
}

TEST_F(LayersTest, HostileLayers) {
  // A value that doubles at every one of 30 layers is refused once it
  // passes 1 MiB; the lookup then finds nothing.
  std::string env;
  for (int i = 0; i < 30; ++i) {
    std::string dir = root.file("l");
    dir += std::to_string(i);
    layer(dir, "[var]\nD = ++x++" + std::string(i == 29 ? "" : "+;+") + "\n");
    env += dir + ";";
  }
  // 10,000 directories, nearly all of them without a file: a list that only
  // the environment can hold, the lines of a file being too short for it.
  for (int i = 0; i < 10000; ++i) {
    env += root.file("none");
    env += std::to_string(i) + ",";
  }
  set("ENVPATH", env + config());
  layer(config(), "[var]\nD = seed\n");
  EXPECT_EQ(var("D"), "<undefined>");
  ASSERT_EQ(channels.warnings.size(), 1u);
  EXPECT_NE(channels.warnings[0].find("[var] D"), std::string::npos) << channels.warnings[0];
  EXPECT_TRUE(channels.fatals.empty());
  EXPECT_EQ(loadingTraces().size(), 10033u);
}

}  // namespace
}  // namespace pc::test
