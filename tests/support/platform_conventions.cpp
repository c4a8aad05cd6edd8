#include "support/platform_conventions.h"

#include <array>
#include <cstdint>
#include <cstdio>
#include <filesystem>
#include <map>
#include <vector>

#include "platform/platform.h"
#include "support/test_support.h"

namespace pc::test {

namespace {

// Asks the C runtime itself how it stores a text-mode line end.
std::string measuredLineEnd() {
  TempDir dir;
  const std::string name = dir.file("line");
  if (std::FILE* out = std::fopen(name.c_str(), "w")) {
    std::fputs("\n", out);
    std::fclose(out);
  }
  const std::string bytes = readFile(name);
  return bytes.empty() ? std::string("\n") : bytes;
}

PlatformConventions measured() {
  PlatformConventions c;
  c.separator = platform::nativeSeparator();
  c.executableSuffix = PC_TEST_EXECUTABLE_SUFFIX;
  c.platformDirectory = platform::platformDirectoryName();
  c.configurationVariable = platform::platformConfigurationVariable();
  c.textLineEnd = measuredLineEnd();
  std::array<std::uint32_t, 13> fixed{};
  std::map<std::string, std::string> strings;
  c.nativeVersionResource =
      platform::readVersionResource("", {}, fixed, strings) != platform::VersionResource::NotNative;
  // Windows keeps the whole int of exit(-1); POSIX systems its low byte.
  c.fatalExitStatus = c.nativeVersionResource ? -1 : 255;
  c.posixFileKinds = !c.nativeVersionResource;
  c.forkedDeathTests = c.posixFileKinds;  // Windows starts death tests as new processes
  return c;
}

}  // namespace

const PlatformConventions& platformConventions() {
  static const PlatformConventions conventions = measured();
  return conventions;
}

std::string onDisk(const std::string& text) {
  const std::string& end = platformConventions().textLineEnd;
  if (end == "\n") return text;
  std::string out;
  for (const char ch : text) {
    if (ch == '\n') out += end;
    else out += ch;
  }
  return out;
}

}  // namespace pc::test
