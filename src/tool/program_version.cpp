// The program version, read back from the version section that the build
// places in the executable (cmake/VersionInfo.cmake writes it). On Windows
// the build writes a real version resource instead, which the platform layer
// reads through the system; what follows is the layout of our own section.
//
// The executable is an ELF file; the section is found by its name,
// ".pcversion", through the section header table. Its contents, all numbers
// in the byte order of the ELF file:
//
// | offset | size | type       | meaning                                        |
// |--------|------|------------|------------------------------------------------|
// | 0      | 52   | 13 x u32   | fixed version block, fields in the order of    |
// |        |      |            | FixedVersionInfo; signature 0xFEEF04BD          |
// | 52     | 2    | u16        | language of the strings (0x0409)               |
// | 54     | 2    | u16        | code page of the strings (1200)                |
// | 56     | n    | char       | pairs "name\0value\0", ended by an empty name  |
// |        |      |            | ("\0") or by the end of the section            |
//
// Only the twelve predefined names are taken from the string pairs.
#include "tool/program_version.h"

#include <algorithm>
#include <array>
#include <cstdint>
#include <cstdio>
#include <fstream>
#include <limits>
#include <optional>
#include <string_view>
#include <vector>

#include "platform/platform.h"

namespace pc {

namespace {

constexpr std::string_view kSectionName = ".pcversion";
constexpr std::size_t kFixedBlockSize = 52;
constexpr std::size_t kStringsOffset = 56;
// The build writes a few hundred bytes; anything much larger is not ours.
constexpr std::uint64_t kMaxSectionSize = 64 * 1024;
constexpr std::uint32_t kNoBitsSection = 8;
constexpr std::uint32_t kExtendedIndex = 0xFFFF;

constexpr std::array<std::string_view, 12> kStringNames = {
    "Comments",         "CompanyName",     "FileDescription", "FileVersion",
    "InternalName",     "LegalCopyright",  "LegalTrademarks", "OriginalFilename",
    "PrivateBuild",     "ProductName",     "ProductVersion",  "SpecialBuild"};

// Bounds-checked reads at absolute offsets of the file.
class FileBytes {
 public:
  explicit FileBytes(const std::string& name) : in_(name, std::ios::binary) {
    if (!in_) return;
    in_.seekg(0, std::ios::end);
    const std::streamoff end = in_.tellg();
    if (end >= 0) size_ = static_cast<std::uint64_t>(end);
    else in_.setstate(std::ios::failbit);
  }
  bool isOpen() const { return static_cast<bool>(in_); }
  std::uint64_t size() const { return size_; }
  bool holds(std::uint64_t offset, std::uint64_t length) const {
    return offset <= size_ && length <= size_ - offset;
  }
  bool read(std::uint64_t offset, void* data, std::size_t length) {
    if (!holds(offset, length)) return false;
    in_.clear();
    in_.seekg(static_cast<std::streamoff>(offset));
    in_.read(static_cast<char*>(data), static_cast<std::streamsize>(length));
    return static_cast<std::size_t>(in_.gcount()) == length;
  }

 private:
  std::ifstream in_;
  std::uint64_t size_ = 0;
};

// Integers of the ELF file in its own byte order.
struct ByteOrder {
  bool bigEndian = false;
  std::uint64_t get(const unsigned char* p, int bytes) const {
    std::uint64_t v = 0;
    for (int i = 0; i < bytes; ++i) {
      const unsigned char b = bigEndian ? p[i] : p[bytes - 1 - i];
      v = (v << 8) | b;
    }
    return v;
  }
  std::uint16_t u16(const unsigned char* p) const { return static_cast<std::uint16_t>(get(p, 2)); }
  std::uint32_t u32(const unsigned char* p) const { return static_cast<std::uint32_t>(get(p, 4)); }
  std::uint64_t u64(const unsigned char* p) const { return get(p, 8); }
};

struct SectionHeader {
  std::uint32_t name = 0;
  std::uint32_t type = 0;
  std::uint64_t offset = 0;
  std::uint64_t size = 0;
  std::uint32_t link = 0;
};

class ElfFile {
 public:
  explicit ElfFile(FileBytes& file) : file_(file) {}

  // Reads the file header; false when this is not a usable ELF file.
  bool open() {
    std::array<unsigned char, 64> header{};
    if (!file_.read(0, header.data(), 16)) return false;
    if (header[0] != 0x7F || header[1] != 'E' || header[2] != 'L' || header[3] != 'F') return false;
    if (header[4] != 1 && header[4] != 2) return false;
    if (header[5] != 1 && header[5] != 2) return false;
    wide_ = header[4] == 2;
    order_.bigEndian = header[5] == 2;
    if (!file_.read(0, header.data(), wide_ ? 64 : 52)) return false;
    const unsigned char* h = header.data();
    std::uint64_t tableOffset = wide_ ? order_.u64(h + 40) : order_.u32(h + 32);
    entrySize_ = order_.u16(h + (wide_ ? 58 : 46));
    std::uint64_t count = order_.u16(h + (wide_ ? 60 : 48));
    std::uint32_t namesIndex = order_.u16(h + (wide_ ? 62 : 50));
    if (tableOffset == 0 || entrySize_ < (wide_ ? 64u : 40u)) return false;
    tableOffset_ = tableOffset;
    // Large tables keep their real count and string table index in entry 0.
    if (count == 0 || namesIndex == kExtendedIndex) {
      SectionHeader first;
      if (!section(0, first, true)) return false;
      if (count == 0) count = first.size;
      if (namesIndex == kExtendedIndex) namesIndex = first.link;
    }
    if (count == 0 || count > (file_.size() - std::min(file_.size(), tableOffset)) / entrySize_) return false;
    count_ = count;
    if (namesIndex >= count_ || !section(namesIndex, names_)) return false;
    return names_.type != kNoBitsSection && file_.holds(names_.offset, names_.size);
  }

  std::optional<SectionHeader> find(std::string_view wanted) {
    for (std::uint64_t i = 0; i < count_; ++i) {
      SectionHeader s;
      if (!section(i, s)) return std::nullopt;
      if (nameIs(s.name, wanted)) return s;
    }
    return std::nullopt;
  }

  const ByteOrder& order() const { return order_; }

 private:
  bool section(std::uint64_t index, SectionHeader& out, bool beforeCount = false) {
    if (!beforeCount && index >= count_) return false;
    std::array<unsigned char, 64> raw{};
    const std::size_t size = wide_ ? 64 : 40;
    if (index > (std::numeric_limits<std::uint64_t>::max() - tableOffset_) / entrySize_) return false;
    if (!file_.read(tableOffset_ + index * entrySize_, raw.data(), size)) return false;
    const unsigned char* p = raw.data();
    out.name = order_.u32(p);
    out.type = order_.u32(p + 4);
    out.offset = wide_ ? order_.u64(p + 24) : order_.u32(p + 16);
    out.size = wide_ ? order_.u64(p + 32) : order_.u32(p + 20);
    out.link = order_.u32(p + (wide_ ? 40 : 24));
    return true;
  }

  // True when the string table holds exactly `wanted` followed by NUL at
  // `offset`.
  bool nameIs(std::uint32_t offset, std::string_view wanted) {
    if (offset >= names_.size || names_.size - offset < wanted.size() + 1) return false;
    std::array<char, 64> text{};
    if (wanted.size() + 1 > text.size()) return false;
    if (!file_.read(names_.offset + offset, text.data(), wanted.size() + 1)) return false;
    return std::string_view(text.data(), wanted.size()) == wanted && text[wanted.size()] == '\0';
  }

  FileBytes& file_;
  ByteOrder order_;
  bool wide_ = false;
  std::uint64_t tableOffset_ = 0;
  std::uint64_t entrySize_ = 0;
  std::uint64_t count_ = 0;
  SectionHeader names_;
};

bool isPredefinedName(std::string_view name) {
  for (const std::string_view n : kStringNames) {
    if (n == name) return true;
  }
  return false;
}

void readStrings(const std::string& data, const ByteOrder& order,
                 std::map<std::string, std::string>& strings) {
  if (data.size() < kStringsOffset) return;
  const auto* bytes = reinterpret_cast<const unsigned char*>(data.data());
  char prefix[32];
  std::snprintf(prefix, sizeof prefix, "\\StringFileInfo\\%04x%04x\\",
                static_cast<unsigned>(order.u16(bytes + 52)), static_cast<unsigned>(order.u16(bytes + 54)));
  const std::string_view all(data);
  std::size_t pos = kStringsOffset;
  while (pos < all.size()) {
    const std::size_t nameEnd = all.find('\0', pos);
    if (nameEnd == std::string_view::npos || nameEnd == pos) return;
    const std::size_t valueEnd = all.find('\0', nameEnd + 1);
    if (valueEnd == std::string_view::npos) return;  // a cut pair is dropped
    const std::string_view name = all.substr(pos, nameEnd - pos);
    if (isPredefinedName(name)) {
      strings[prefix + std::string(name)] = std::string(all.substr(nameEnd + 1, valueEnd - nameEnd - 1));
    }
    pos = valueEnd + 1;
  }
}

}  // namespace

int readVersionInfo(const char* file, std::map<std::string, std::string>& strings,
                    FixedVersionInfo& fixed) {
  strings.clear();
  fixed = FixedVersionInfo{};
  std::string name;
  if (file != nullptr) {
    name = file;
  } else {
    const auto own = platform::executablePath();
    if (!own) return kVersionNoFileName;
    name = *own;
  }

  // Where the system keeps a version resource of its own, the build puts
  // the version there and the system reads it.
  std::array<std::uint32_t, 13> nativeFixed{};
  const std::vector<std::string> names(kStringNames.begin(), kStringNames.end());
  switch (platform::readVersionResource(name, names, nativeFixed, strings)) {
    case platform::VersionResource::Found:
      if (nativeFixed[0] != kFixedVersionSignature) {
        strings.clear();
        return kVersionDamaged;
      }
      fixed = FixedVersionInfo{nativeFixed[0], nativeFixed[1], nativeFixed[2],  nativeFixed[3],  nativeFixed[4],
                               nativeFixed[5], nativeFixed[6], nativeFixed[7],  nativeFixed[8],  nativeFixed[9],
                               nativeFixed[10], nativeFixed[11], nativeFixed[12]};
      return kVersionOk;
    case platform::VersionResource::Missing:
      return kVersionMissing;
    case platform::VersionResource::Unreadable:
      return kVersionUnreadable;
    case platform::VersionResource::NotNative:
      break;
  }

  FileBytes bytes(name);
  if (!bytes.isOpen()) return kVersionUnreadable;
  ElfFile elf(bytes);
  if (!elf.open()) return kVersionNotElf;
  const auto section = elf.find(kSectionName);
  if (!section) return kVersionMissing;
  if (section->type == kNoBitsSection || section->size < kFixedBlockSize ||
      section->size > kMaxSectionSize || !bytes.holds(section->offset, section->size)) {
    return kVersionDamaged;
  }
  std::string data(static_cast<std::size_t>(section->size), '\0');
  if (!bytes.read(section->offset, data.data(), data.size())) return kVersionDamaged;

  const auto* p = reinterpret_cast<const unsigned char*>(data.data());
  const ByteOrder& order = elf.order();
  FixedVersionInfo block;
  std::uint32_t* fields[] = {&block.signature,     &block.structureVersion, &block.fileVersionHigh,
                             &block.fileVersionLow, &block.productVersionHigh, &block.productVersionLow,
                             &block.fileFlagsMask,  &block.fileFlags,        &block.fileOs,
                             &block.fileType,       &block.fileSubtype,      &block.fileDateHigh,
                             &block.fileDateLow};
  for (std::size_t i = 0; i < std::size(fields); ++i) *fields[i] = order.u32(p + 4 * i);
  if (block.signature != kFixedVersionSignature) return kVersionDamaged;
  fixed = block;
  readStrings(data, order, strings);
  return kVersionOk;
}

std::uint32_t programVersion() {
  std::map<std::string, std::string> strings;
  FixedVersionInfo fixed;
  return readVersionInfo(nullptr, strings, fixed) == kVersionOk ? fixed.productVersionHigh : 0;
}

}  // namespace pc
