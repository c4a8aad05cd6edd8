#include "file_kind.h"

#include <array>
#include <cstdio>
#include <cstring>
#include <filesystem>

#include "fileio/little_endian.h"
#include "output/level_dump.h"
#include "output/tagged_file.h"

namespace pc::inspect {

namespace {

struct KindName {
  FileKind kind;
  std::string_view name;
};

constexpr std::array<KindName, 7> kKindNames{{
    {FileKind::ContourInfo, "contour-info"},
    {FileKind::TaggedContours, "tagged-contours"},
    {FileKind::RecordContours, "record-contours"},
    {FileKind::LevelDump, "level-dump"},
    {FileKind::PocketResult, "pocket-result"},
    {FileKind::ZoneDatabase, "zone-database"},
    {FileKind::ToolParameters, "tool-parameters"},
}};

std::optional<FileKind> kindFromFileName(const std::string& path) {
  const std::string name = std::filesystem::path(path).filename().string();
  const std::string ext = std::filesystem::path(path).extension().string();
  if (name == "trxcon.inf") return FileKind::ContourInfo;
  if (name == "wlevel.tmp") return FileKind::LevelDump;
  if (name == "poches.res") return FileKind::PocketResult;
  if (name == "zone.inf") return FileKind::ZoneDatabase;
  if (ext == ".par") return FileKind::ToolParameters;
  return std::nullopt;
}

}  // namespace

std::string_view kindName(FileKind kind) {
  for (const KindName& k : kKindNames) {
    if (k.kind == kind) return k.name;
  }
  return "?";
}

std::optional<FileKind> kindFromName(std::string_view name) {
  for (const KindName& k : kKindNames) {
    if (k.name == name) return k.kind;
  }
  return std::nullopt;
}

std::string kindNames() {
  std::string all;
  for (const KindName& k : kKindNames) {
    if (!all.empty()) all += ", ";
    all += k.name;
  }
  return all;
}

std::optional<FileKind> detectKind(const std::string& path) {
  std::FILE* file = std::fopen(path.c_str(), "rb");
  if (file == nullptr) return kindFromFileName(path);
  unsigned char head[40] = {};
  const std::size_t got = std::fread(head, 1, sizeof head, file);
  std::fclose(file);
  std::error_code ec;
  const auto size = static_cast<std::int64_t>(std::filesystem::file_size(path, ec));

  if (got >= 4 && (std::memcmp(head, "QZTB", 4) == 0 || std::memcmp(head, "BTZQ", 4) == 0)) {
    return FileKind::ZoneDatabase;
  }
  if (got >= 12 && !ec) {
    // A level dump's size follows from its header's counts exactly.
    const std::int64_t entries = fileio::loadInt32LE(head), records = fileio::loadInt32LE(head + 4);
    const std::int32_t ordered = fileio::loadInt32LE(head + 8);
    if (entries >= 0 && records >= 0 && (ordered == 0 || ordered == 1) &&
        size == kLevelDumpHeaderBytes + kLevelDumpRecordBytes * records + (kLevelDumpIndexBytes + 4) * entries) {
      return FileKind::LevelDump;
    }
    if (entries == -1 && records == -1 && ordered == -1) return FileKind::LevelDump;  // never finished
  }
  if (got >= 4) {
    const std::uint32_t first = fileio::loadLE32(head);
    if (first == 12) return FileKind::ContourInfo;
    if (first == 18) return FileKind::RecordContours;
    const bool mark = first == 256 || first == 0x00010000u;
    if (mark && (got == 4 || taggedPayloadSize(static_cast<char>(head[4])) > 0)) return FileKind::TaggedContours;
  }
  if (got >= 10 && std::memcmp(head, " 99999.000", 10) == 0) return FileKind::PocketResult;
  return kindFromFileName(path);
}

}  // namespace pc::inspect
