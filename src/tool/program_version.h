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

inline constexpr std::uint32_t kFixedVersionSignature = 0xFEEF04BD;

// Results of readVersionInfo.
inline constexpr int kVersionOk = 0;
inline constexpr int kVersionNoFileName = 1;  // own file name not available
inline constexpr int kVersionUnreadable = 2;  // cannot open the file
inline constexpr int kVersionNotElf = 3;      // not an ELF file, or damaged headers
inline constexpr int kVersionMissing = 4;     // no version section
inline constexpr int kVersionDamaged = 5;     // section present but unusable

// 0 on success; `file` null means the running program's own file. The
// strings are keyed "\StringFileInfo\<language><code page>\<name>" (eight
// lower-case hexadecimal digits), for the twelve predefined names found.
int readVersionInfo(const char* file, std::map<std::string, std::string>& strings,
                    FixedVersionInfo& fixed);

// Product version high field (major * 65536 + minor), or 0 when unreadable.
std::uint32_t programVersion();

}  // namespace pc
