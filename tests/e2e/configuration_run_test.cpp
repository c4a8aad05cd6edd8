// Runs in temporary installations whose layered environ.cfg files decide
// the run's variables, and the fatal messages of a configuration that
// cannot be loaded.
#include <gtest/gtest.h>

#include <filesystem>
#include <string>

#include "e2e/e2e_support.h"

namespace pc::test {
namespace {

namespace fs = std::filesystem;

// An installation with a user layer, and a zone numbered 5 whose temporary
// directory comes from $TRXTMP.
struct LayeredInstallation {
  TempDir root;
  std::string home() const { return root.file("home"); }
  std::string user() const { return root.file("user"); }
  std::string zone() const { return root.file("zone"); }
  std::string tmpOf(const std::string& name) const { return root.file(name) + "/00000005"; }
  std::vector<std::string> env(const std::string& site) const {
    return {"TRXHOME=" + home(), "TRXZONE=" + zone(), "PCT_SITE=" + site};
  }
  LayeredInstallation() {
    writeInstallation(home(), "[var]\n"
                              "/if PCT_SITE == a\n"
                              "TRXTMP = " + root.file("site_a") + "\n"
                              "/else\n"
                              "TRXTMP = " + root.file("site_b") + "\n"
                              "/endif\n"
                              "[path]\n"
                              "ENV = " + user() + ", $(TRXHOME)/config\n");
    fs::create_directories(zone());
    writeFile(zone() + "/workzone.num", "00000005\n");
    std::vector<std::vector<float>> records;
    appendSquare(records, 0, 0, 10, 10);
    for (const char* name : {"site_a", "site_b", "user_tmp"}) {
      fs::create_directories(tmpOf(name));
      writeFile(tmpOf(name) + "/trxcon.inf", contourInfoBytes(records));
    }
  }
};

TEST(ConfigurationRun, LayeredFilesDecideTheTemporaryDirectory) {
  LayeredInstallation inst;
  // The installation's condition chooses between its two values.
  for (const std::string site : {"a", "b"}) {
    const RunResult r = runProgram({}, inst.env(site), inst.zone());
    EXPECT_EQ(r.exitStatus, 0) << r.out << r.err;
    EXPECT_TRUE(fileExists(inst.tmpOf("site_" + site) + "/contour.bin")) << site;
    EXPECT_EQ(r.err, "");
  }
  EXPECT_FALSE(fileExists(inst.tmpOf("user_tmp") + "/contour.bin"));
  // The user layer wins over both.
  fs::create_directories(inst.user());
  writeFile(inst.user() + "/environ.cfg", "[var]\nTRXTMP = " + inst.root.file("user_tmp") + "\n");
  const RunResult r = runProgram({}, inst.env("a"), inst.zone());
  EXPECT_EQ(r.exitStatus, 0) << r.out << r.err;
  EXPECT_TRUE(fileExists(inst.tmpOf("user_tmp") + "/contour.bin"));
}

TEST(ConfigurationRun, VerboseRunTracesTheLayersAndTheOrigins) {
  LayeredInstallation inst;
  fs::create_directories(inst.user());
  writeFile(inst.user() + "/environ.cfg", "[var]\nTRXUNITS = metric+\n");
  // The site directory, second to last, is loaded at once; the user's, the
  // first of the list, is overloaded last.
  const std::string siteDir = inst.root.file("site");
  fs::create_directories(siteDir);
  writeFile(siteDir + "/environ.cfg", "[var]\nSITE = 1\n");
  writeFile(inst.home() + "/config/environ.cfg",
            "[var]\nTRXUNITS = (inst)\n[path]\nENV = " + inst.user() + ";" + siteDir + ",$(TRXHOME)/config\n");
  std::vector<std::string> env = {"TRXHOME=" + inst.home(), "TRXTMPDIR=" + inst.tmpOf("site_a"),
                                  "TRX_TRXFILES_VERBOSE=on"};
  const RunResult r = runProgram({"x"}, env, inst.zone());
  EXPECT_EQ(r.exitStatus, 0) << r.out;
  const std::string config = inst.home() + "/config/environ.cfg";
  const std::string user = inst.user() + "/environ.cfg";
  // The installation's first entry follows its file name in the table's
  // string storage (rounded to 4 bytes) and its 12-byte record header.
  char reference[16];
  std::snprintf(reference, sizeof reference, "%08zX", (config.size() + 1 + 3) / 4 * 4 + 12);
  const std::string list = "ENV = '" + inst.user() + ";" + siteDir + ",$(TRXHOME)/config' from '" + config + "' line 4\n";
  const std::string trace =
      "LOADING ENVIRONMENT FILES ....\n"
      "loading configuration file '" + config + "'\n" + list +
      "TRXHOME = '" + inst.home() + "' from environment\n"
      "loading configuration file '" + siteDir + "/environ.cfg'\n" + list +
      "TRXHOME = '" + inst.home() + "' from environment\n"
      "Overloading '" + user + "'\n\n"
      "LOADING ENVIRONMENT FILES ....done.\n"
      "   - TRXUNITS = metric+(" + reference + "\\) from '" + user + "' line 2\n"
      "   " + reference + " -> TRXUNITS = (inst) from '" + config + "' line 2\n"
      "metric(inst)\n"
      "TRXUNITS = 'metric(inst)' from '" + user + "' line 2\n";
  EXPECT_EQ(r.out.substr(expectedBanner().size(), trace.size()), trace) << r.out;
}

TEST(ConfigurationRun, TheExampleInstallationLoadsBothItsLayers) {
  WorkZone wz;
  const std::string home = std::string(PC_EXAMPLES_DIR) + "/installation";
  const RunResult r = runProgram({"x"}, {"TRXHOME=" + home, "TRXTMPDIR=" + wz.tmp(), "TRX_TRXFILES_VERBOSE=on"},
                                 wz.zone());
  EXPECT_EQ(r.exitStatus, 0) << r.out;
  EXPECT_NE(r.out.find("LOADING ENVIRONMENT FILES ....\n"
                       "loading configuration file '" + home + "/config/environ.cfg'\n"),
            std::string::npos) << r.out;
  EXPECT_NE(r.out.find("loading configuration file '" + home + "/../user/environ.cfg'\n"), std::string::npos);
  EXPECT_NE(r.out.find("TRXUNITS = 'metric' from '" + home + "/config/environ.cfg' line 4\n"), std::string::npos);
  // Verbose: warnings would be on standard output, and there are none.
  EXPECT_EQ(r.out.find("load_messages"), std::string::npos) << r.out;
}

TEST(ConfigurationRun, EachFatalMessageEndsTheRunWithStatus255) {
  struct Case {
    std::string environ;  // the installation's file; "" for none
    std::string message;  // "<file>" stands for that file's name
  };
  std::string eightConditions;
  for (int i = 0; i < 8; ++i) eightConditions += "/if TRXHOME\n";
  const std::vector<Case> cases = {
      {"", "Error loading '<file>'\n"},
      {"[var]\n", "Error evaluation '?ENV' path\n"},
      {"[var]\n/else\n", "load_messages: file '<file>', line 2 : '/else' without '/if'"},
      {"/endif\n", "load_messages: file '<file>', line 1 : '/endif' without '/if'"},
      {"/set x\n", "load_messages: file '<file>', line 1 : Unknown keyword : '/set x'"},
      {"/if TRXHOME = 1\n", "load_messages: file '<file>', line 1 : invalid condition: /if TRXHOME = 1"},
      {"/if TRXHOME\n", "load_messages: file '<file>', line -1 : '/if' without '/endif' at end of file."},
      {"/if UNSET\n", "load_messages: file '<file>', line 1 : '/if' without '/endif'"},
      {eightConditions, "load_messages: file '<file>', line 8 : too many nested conditions: /if TRXHOME"},
      {"[" + std::string(100, 'n') + "]\n", "load_messages: file '<file>', line 0 : Error loading file."},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.message);
    WorkZone wz;
    const std::string file = wz.home() + "/config/environ.cfg";
    if (c.environ.empty()) {
      fs::remove(file);
    } else {
      writeFile(file, c.environ);
    }
    const RunResult r = wz.run({});
    EXPECT_EQ(r.exitStatus, 255);
    std::string message = c.message;
    if (const std::size_t at = message.find("<file>"); at != std::string::npos) message.replace(at, 6, file);
    EXPECT_EQ(r.err, message + "\n");
    EXPECT_EQ(r.out, expectedBanner());
  }
  // A directory in place of the installation's file, and no installation.
  WorkZone wz;
  fs::remove(wz.home() + "/config/environ.cfg");
  fs::create_directories(wz.home() + "/config/environ.cfg");
  RunResult r = wz.run({});
  EXPECT_EQ(r.exitStatus, 255);
  EXPECT_EQ(r.err, "load_messages: file '" + wz.home() + "/config/environ.cfg', line 0 : Error opening file - Is a directory\n");
  r = runProgram({}, {"TRXZONE=" + wz.zone(), "TRXTMPDIR=" + wz.tmp()}, wz.zone());
  EXPECT_EQ(r.exitStatus, 255);
  EXPECT_EQ(r.err, "The environment variable 'TRXHOME' is not defined\n\n");
}

}  // namespace
}  // namespace pc::test
