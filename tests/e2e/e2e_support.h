// Runs the built executable in a temporary work zone and captures what it
// prints and how it ends.
#pragma once

#include <string>
#include <vector>

#include "support/test_support.h"

namespace pc::test {

struct RunResult {
  int exitStatus = -1000;  // 0..255, or -1000 when it did not exit normally
  std::string out;
  std::string err;  // standard error
};

// The installation file of a minimal installation: empty sections and an
// ENV list of the installation's configuration directory alone.
inline constexpr const char* kMinimalEnviron = "[var]\n[path]\nENV = $(TRXHOME)/config/\n";

// Writes `home`/config/environ.cfg with `environ` (directories created).
void writeInstallation(const std::string& home, const std::string& environ = kMinimalEnviron);

// Runs the executable with exactly the environment `env` ("NAME=value", on top
// of this process's environment without its TRX* variables) in `cwd`.
RunResult runProgram(const std::vector<std::string>& args, const std::vector<std::string>& env,
                     const std::string& cwd);

// A work zone whose temporary directory ($TMP, through TRXTMPDIR) is zone/tmp,
// in a minimal installation (TRXHOME) beside it.
class WorkZone {
 public:
  WorkZone();
  std::string home() const { return dir_.file("home"); }
  std::string zone() const { return dir_.file("zone"); }
  std::string tmp() const { return dir_.file("zone/tmp"); }
  std::string tmpFile(const std::string& name) const { return tmp() + "/" + name; }
  std::string zoneFile(const std::string& name) const { return zone() + "/" + name; }

  // A parameter file whose line i holds `values[i]` for the given slots, 0
  // elsewhere (580 lines).
  void writeParameters(const std::vector<std::pair<int, std::string>>& lines) const;
  void writeContours(const std::vector<std::vector<float>>& records) const;

  // Runs the program with the arguments, in directory zone(), with TRXHOME,
  // TRXZONE and TRXTMPDIR set plus `extraEnv` ("NAME=value").
  RunResult run(const std::vector<std::string>& args, const std::vector<std::string>& extraEnv = {}) const;

 private:
  TempDir dir_;
};

// The five banner lines of every run.
std::string expectedBanner();

// Records of a closed square of side `size` at (x0, y0), z, and a separator.
void appendSquare(std::vector<std::vector<float>>& records, float x0, float y0, float size, float z);

}  // namespace pc::test
