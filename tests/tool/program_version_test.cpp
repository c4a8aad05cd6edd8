#include "tool/program_version.h"

#include <gtest/gtest.h>

#include <tuple>

#include "support/platform_conventions.h"
#include "support/test_support.h"

namespace pc {
namespace {

using Strings = std::map<std::string, std::string>;

// A minimal ELF file: header, section names, version section, then the table
// of three section headers (null, names, version).
struct Elf {
  bool wide, big;
  std::size_t entry = wide ? 64 : 40, table = 0;
  std::string bytes;

  void put(std::size_t at, std::uint64_t v, int n) {
    for (int i = 0; i < n; ++i) bytes[at + i] = static_cast<char>(v >> 8 * (big ? n - 1 - i : i));
  }

  Elf(bool w, bool b) : wide(w), big(b) {
    const std::size_t header = wide ? 64 : 52, versionAt = header + 22;
    const std::size_t at[3] = {0, header, versionAt}, size[3] = {0, 22, 86}, name[3] = {0, 1, 11};
    table = (versionAt + size[2] + 7) / 8 * 8;
    bytes.assign(table + 3 * entry, '\0');
    bytes.replace(0, 7, std::string("\x7f" "ELF") + char(wide ? 2 : 1) + char(big ? 2 : 1) + '\1');
    put(wide ? 40 : 32, table, wide ? 8 : 4);
    const std::size_t counts[3] = {entry, 3, 1};  // entry size, entries, index of the names
    for (int i = 0; i < 3; ++i) put((wide ? 58 : 46) + 2 * i, counts[i], 2);
    bytes.replace(header, 22, std::string("\0.shstrtab\0.pcversion\0", 22));
    put(versionAt, 0xFEEF04BD, 4);
    put(versionAt + 16, 0x30002, 4);
    put(versionAt + 52, 0x0409, 2);
    put(versionAt + 54, 1200, 2);
    bytes.replace(versionAt + 56, 30, std::string("ProductName\0Fixture\0Other\0x\0\0", 30));
    for (std::size_t i = 1; i < 3; ++i) {
      const std::size_t h = table + i * entry;
      put(h, name[i], 4);
      put(h + 4, i == 1 ? 3 : 1, 4);
      put(h + (wide ? 24 : 16), at[i], wide ? 8 : 4);
      put(h + (wide ? 32 : 20), size[i], wide ? 8 : 4);
    }
  }
};

TEST(ProgramVersion, BuiltAndDamagedExecutables) {
  Strings strings;
  FixedVersionInfo fixed;
  ASSERT_EQ(readVersionInfo(PC_VERSION_FIXTURE_3_2, strings, fixed), kVersionOk);
  EXPECT_EQ(std::tie(fixed.signature, fixed.fileVersionHigh, fixed.productVersionHigh, fixed.productVersionLow,
                     fixed.fileType),
            std::make_tuple(0xFEEF04BDu, 196610u, 196610u, (7u << 16) | 9u, 1u));
  const std::string p = "\\StringFileInfo\\040904b0\\", name = "pc_version_fixture_3_2";
  EXPECT_EQ(strings, (Strings{{p + "FileDescription", "Fixture \"three\\two\""}, {p + "FileVersion", "3.2.7.9"},
                              {p + "InternalName", name}, {p + "OriginalFilename", name + test::platformConventions().executableSuffix},
                              {p + "ProductName", "PocketClassifier"}, {p + "ProductVersion", "3.2.7.9"}}));

  ASSERT_EQ(readVersionInfo(PC_VERSION_FIXTURE_ZERO, strings, fixed), kVersionOk);
  EXPECT_EQ(fixed.productVersionHigh, 0u);
  EXPECT_EQ(strings[p + "ProductVersion"], "0.0.0.0");

  fixed.productVersionHigh = 77;
  EXPECT_EQ(readVersionInfo(PC_VERSION_FIXTURE_NONE, strings, fixed), kVersionMissing);
  EXPECT_EQ(std::pair(fixed.productVersionHigh, strings.size()), std::pair(0u, std::size_t{0}));

  // The running test program carries 7.5.0.1.
  EXPECT_EQ(readVersionInfo(nullptr, strings, fixed), kVersionOk);
  EXPECT_EQ(programVersion(), 7u * 65536u + 5u);

  // Where the system reads the version resource, our own section reader is
  // not used.
  if (test::platformConventions().nativeVersionResource) GTEST_SKIP() << "version read by the system";

  // Both word sizes and byte orders of a minimal file, then damaged ones.
  test::TempDir dir;
  const auto readBytes = [&](const std::string& bytes) {
    test::writeFile(dir.file("exe"), bytes);
    return readVersionInfo(dir.file("exe").c_str(), strings, fixed);
  };
  for (const bool wide : {false, true}) {
    for (const bool big : {false, true}) {
      ASSERT_EQ(readBytes(Elf(wide, big).bytes), kVersionOk) << wide << big;
      EXPECT_EQ(fixed.productVersionHigh, 0x30002u);
      EXPECT_EQ(strings, (Strings{{p + "ProductName", "Fixture"}}));
    }
  }
  const Elf good(true, false);
  EXPECT_EQ(readVersionInfo(dir.file("absent").c_str(), strings, fixed), kVersionUnreadable);
  EXPECT_NE(readVersionInfo(dir.path().c_str(), strings, fixed), kVersionOk);
  for (const std::string& bytes : {std::string(), std::string("#!/bin/sh\necho not an executable\n"),
                                   good.bytes.substr(0, 40), good.bytes.substr(0, good.table + 10)}) {
    EXPECT_EQ(readBytes(bytes), kVersionNotElf) << bytes.size();
  }

  // Offset, value and width of the damage, and the answer.
  const std::size_t names = good.table + good.entry, version = names + good.entry;
  const std::tuple<std::size_t, std::uint64_t, int, int> damage[] = {
      {40, 0xFFFFFFFFFFFFFFF0ull, 8, kVersionNotElf},         // table offset
      {60, 0xFFFF, 2, kVersionNotElf},                        // section count
      {58, 0, 2, kVersionNotElf},                             // entry size
      {62, 7, 2, kVersionNotElf},                             // names index
      {names + 32, 1ull << 40, 8, kVersionNotElf},            // names size
      {version, 2, 4, kVersionMissing},                       // another name
      {version + 24, good.bytes.size(), 8, kVersionDamaged},  // offset at the end
      {version + 32, 1ull << 62, 8, kVersionDamaged},         // huge size
      {version + 32, 51, 8, kVersionDamaged},                 // below the fixed block
      {64 + 22, 0x12345678, 4, kVersionDamaged}};             // signature
  for (const auto& [at, value, width, result] : damage) {
    Elf e = good;
    e.put(at, value, width);
    EXPECT_EQ(readBytes(e.bytes), result) << at;
    EXPECT_EQ(fixed.productVersionHigh, 0u) << at;
  }
}

}  // namespace
}  // namespace pc
