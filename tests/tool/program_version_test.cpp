#include "tool/program_version.h"

#include <gtest/gtest.h>

#include <random>
#include <string>

#include "support/test_support.h"

namespace pc {
namespace {

using Strings = std::map<std::string, std::string>;

int readFrom(const std::string& file, Strings& strings, FixedVersionInfo& fixed) {
  return readVersionInfo(file.c_str(), strings, fixed);
}

TEST(ProgramVersion, BuiltExecutables) {
  Strings strings;
  FixedVersionInfo fixed;
  ASSERT_EQ(readFrom(PC_VERSION_FIXTURE_3_2, strings, fixed), kVersionOk);
  EXPECT_EQ(fixed.signature, 0xFEEF04BDu);
  EXPECT_EQ(fixed.productVersionHigh, 196610u);
  EXPECT_EQ(fixed.productVersionLow, (7u << 16) | 9u);
  EXPECT_EQ(fixed.fileVersionHigh, 196610u);
  EXPECT_EQ(fixed.fileType, 1u);
  const std::string prefix = "\\StringFileInfo\\040904b0\\";
  EXPECT_EQ(strings[prefix + "ProductVersion"], "3.2.7.9");
  EXPECT_EQ(strings[prefix + "FileDescription"], "Fixture \"three\\two\"");
  EXPECT_EQ(strings[prefix + "InternalName"], "pc_version_fixture_3_2");
  EXPECT_EQ(strings.size(), 6u);

  ASSERT_EQ(readFrom(PC_VERSION_FIXTURE_ZERO, strings, fixed), kVersionOk);
  EXPECT_EQ(fixed.productVersionHigh, 0u);
  EXPECT_EQ(strings[prefix + "ProductVersion"], "0.0.0.0");

  fixed.productVersionHigh = 77;
  EXPECT_EQ(readFrom(PC_VERSION_FIXTURE_NONE, strings, fixed), kVersionMissing);
  EXPECT_EQ(fixed.productVersionHigh, 0u);
  EXPECT_TRUE(strings.empty());

  // The running test program carries 7.5.0.1.
  EXPECT_EQ(readVersionInfo(nullptr, strings, fixed), kVersionOk);
  EXPECT_EQ(programVersion(), 7u * 65536u + 5u);
}

// A minimal ELF file: header, section name table, version section, then
// the table of three section headers (null, names, version).
struct ElfImage {
  std::string bytes;
  std::size_t table = 0;       // offset of the section header table
  std::size_t entry = 0;       // size of one section header
  bool wide = false;
  bool big = false;
  void put(std::size_t at, std::uint64_t v, int n) {
    for (int i = 0; i < n; ++i) {
      const int shift = 8 * (big ? n - 1 - i : i);
      bytes[at + static_cast<std::size_t>(i)] = static_cast<char>((v >> shift) & 0xFF);
    }
  }
  std::size_t versionHeader() const { return table + 2 * entry; }
};

ElfImage buildElf(bool wide, bool big, std::uint32_t productHigh) {
  ElfImage e;
  e.wide = wide;
  e.big = big;
  const std::size_t header = wide ? 64 : 52;
  const std::string names("\0.shstrtab\0.pcversion\0", 22);
  const std::size_t versionAt = header + names.size();
  const std::size_t versionSize = 56 + 30;
  e.entry = wide ? 64 : 40;
  e.table = (versionAt + versionSize + 7) / 8 * 8;
  e.bytes.assign(e.table + 3 * e.entry, '\0');
  e.bytes.replace(0, 4, "\x7f" "ELF");
  e.bytes[4] = wide ? 2 : 1;
  e.bytes[5] = big ? 2 : 1;
  e.bytes[6] = 1;
  e.put(wide ? 40 : 32, e.table, wide ? 8 : 4);
  e.put(wide ? 58 : 46, e.entry, 2);
  e.put(wide ? 60 : 48, 3, 2);
  e.put(wide ? 62 : 50, 1, 2);
  e.bytes.replace(header, names.size(), names);
  e.put(versionAt, 0xFEEF04BD, 4);
  e.put(versionAt + 16, productHigh, 4);
  e.put(versionAt + 52, 0x0409, 2);
  e.put(versionAt + 54, 1200, 2);
  e.bytes.replace(versionAt + 56, 30, std::string("ProductName\0Fixture\0Other\0x\0\0", 30));
  const std::size_t at[3] = {0, header, versionAt};
  const std::size_t size[3] = {0, names.size(), versionSize};
  const std::uint32_t name[3] = {0, 1, 11};
  for (std::size_t i = 1; i < 3; ++i) {
    const std::size_t h = e.table + i * e.entry;
    e.put(h, name[i], 4);
    e.put(h + 4, i == 1 ? 3 : 1, 4);
    e.put(h + (wide ? 24 : 16), at[i], wide ? 8 : 4);
    e.put(h + (wide ? 32 : 20), size[i], wide ? 8 : 4);
  }
  return e;
}

class DamagedFiles : public testing::Test {
 protected:
  test::TempDir dir;
  Strings strings;
  FixedVersionInfo fixed;
  int readBytes(const std::string& bytes) {
    test::writeFile(dir.file("exe"), bytes);
    return readFrom(dir.file("exe"), strings, fixed);
  }
};

TEST_F(DamagedFiles, BothWidthsAndByteOrders) {
  for (const bool wide : {false, true}) {
    for (const bool big : {false, true}) {
      ASSERT_EQ(readBytes(buildElf(wide, big, 0x30002).bytes), kVersionOk) << wide << big;
      EXPECT_EQ(fixed.productVersionHigh, 0x30002u);
      EXPECT_EQ(strings, (Strings{{"\\StringFileInfo\\040904b0\\ProductName", "Fixture"}}));
    }
  }
}

TEST_F(DamagedFiles, FailWithoutCrashing) {
  const ElfImage good = buildElf(true, false, 1);
  EXPECT_EQ(readFrom(dir.file("absent"), strings, fixed), kVersionUnreadable);
  EXPECT_NE(readFrom(dir.path(), strings, fixed), kVersionOk);
  EXPECT_EQ(readBytes(""), kVersionNotElf);
  EXPECT_EQ(readBytes("#!/bin/sh\necho not an executable\n"), kVersionNotElf);
  EXPECT_EQ(readBytes(good.bytes.substr(0, 40)), kVersionNotElf);
  EXPECT_EQ(readBytes(good.bytes.substr(0, good.table + 10)), kVersionNotElf);

  auto damaged = [&](std::size_t at, std::uint64_t v, int n) {
    ElfImage e = good;
    e.put(at, v, n);
    return readBytes(e.bytes);
  };
  EXPECT_EQ(damaged(40, 0xFFFFFFFFFFFFFFF0ull, 8), kVersionNotElf);  // table offset
  EXPECT_EQ(damaged(60, 0xFFFF, 2), kVersionNotElf);                 // huge count
  EXPECT_EQ(damaged(58, 0, 2), kVersionNotElf);                      // entry size
  EXPECT_EQ(damaged(62, 7, 2), kVersionNotElf);                      // names index
  EXPECT_EQ(damaged(good.table + good.entry + 32, 1ull << 40, 8), kVersionNotElf);
  EXPECT_EQ(damaged(good.versionHeader() + 24, good.bytes.size(), 8), kVersionDamaged);
  EXPECT_EQ(damaged(good.versionHeader() + 32, 1ull << 62, 8), kVersionDamaged);
  EXPECT_EQ(damaged(good.versionHeader() + 32, 51, 8), kVersionDamaged);
  EXPECT_EQ(damaged(good.versionHeader(), 2, 4), kVersionMissing);  // another name
  EXPECT_EQ(damaged(64 + 22, 0x12345678, 4), kVersionDamaged);      // signature
  EXPECT_EQ(fixed.productVersionHigh, 0u);

  // Random damage anywhere in the headers: any answer but a crash, and a
  // success only with a sound block.
  std::mt19937 random(12345);
  for (int round = 0; round < 3000; ++round) {
    ElfImage e = good;
    for (int k = 0; k < 4; ++k) {
      const std::size_t at = random() % 2 == 0 ? random() % 64 : good.table + random() % (3 * good.entry);
      e.bytes[at] = static_cast<char>(random());
    }
    if (readBytes(e.bytes) == kVersionOk) {
      ASSERT_EQ(fixed.signature, 0xFEEF04BDu);
    }
  }
}

}  // namespace
}  // namespace pc
