// The contour information file of the contour tests. $TMP is resolved once
// per process, so every test of the program shares one temporary directory.
#pragma once

#include <cstdio>
#include <string>
#include <vector>

#include "support/test_support.h"

namespace pc::test {

inline std::string contourInfoPath() {
  static TempDir dir;
  static ScopedEnv tmp("TRXTMPDIR", dir.path());
  return dir.file("trxcon.inf");
}

inline void writeContourInfo(const std::vector<std::vector<float>>& records) {
  writeFile(contourInfoPath(), contourInfoBytes(records));
}

inline constexpr float kSep = 99999.0f;

}  // namespace pc::test
