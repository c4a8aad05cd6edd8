// What the platform the tests run on writes and expects, so that tests take
// their expected values from here instead of spelling out one system's
// conventions.
#pragma once

#include <string>

namespace pc::test {

struct PlatformConventions {
  char separator = '/';               // what path expansion writes
  std::string executableSuffix;       // ".exe" on Windows, empty elsewhere
  std::string platformDirectory;      // <home>/exe/<this>/<program>
  std::string configurationVariable;  // set to 1 by the configuration
  std::string textLineEnd;            // what a text-mode "\n" becomes on disk
  int fatalExitStatus = 255;          // exit status seen for exit(-1)
  bool nativeVersionResource = false; // the system reads the version, not our ELF reader
  bool posixFileKinds = true;         // FIFOs, fork, resource limits, permission bits
  bool forkedDeathTests = true;       // a death test's child shares the parent's state
};

const PlatformConventions& platformConventions();

// `text` with every "\n" as the platform's text files hold it.
std::string onDisk(const std::string& text);

}  // namespace pc::test
