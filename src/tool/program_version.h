// The program's own version, read at run time from its executable file.
#pragma once

#include <cstdint>
#include <map>
#include <string>

namespace pc {

// The 52-byte fixed version block, thirteen unsigned 32-bit fields.
struct FixedVersionInfo {
  std::uint32_t signature = 0;
  std::uint32_t structureVersion = 0;
  std::uint32_t fileVersionHigh = 0;
  std::uint32_t fileVersionLow = 0;
  std::uint32_t productVersionHigh = 0;
  std::uint32_t productVersionLow = 0;
  std::uint32_t fileFlagsMask = 0;
  std::uint32_t fileFlags = 0;
  std::uint32_t fileOs = 0;
  std::uint32_t fileType = 0;
  std::uint32_t fileSubtype = 0;
  std::uint32_t fileDateHigh = 0;
  std::uint32_t fileDateLow = 0;
};

// 0 on success; `file` null means the running program's own file.
int readVersionInfo(const char* file, std::map<std::string, std::string>& strings,
                    FixedVersionInfo& fixed);

// Product version high field (major * 65536 + minor), or 0 when unreadable.
std::uint32_t programVersion();

}  // namespace pc
