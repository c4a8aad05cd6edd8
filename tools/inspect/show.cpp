#include "show.h"

#include <cstdio>
#include <filesystem>

namespace pc::inspect {

int showFile(const std::string& path, std::optional<FileKind> forced, const ShowOptions& options) {
  std::error_code ec;
  if (!std::filesystem::is_regular_file(path, ec)) {
    std::fprintf(stderr, "pocket-inspect: %s: not a readable file\n", path.c_str());
    return kExitUnreadable;
  }
  const std::optional<FileKind> kind = forced ? forced : detectKind(path);
  if (!kind) {
    std::fprintf(stderr, "pocket-inspect: %s: not a file of the run (give --type: %s)\n", path.c_str(),
                 kindNames().c_str());
    return kExitUnreadable;
  }
  switch (*kind) {
    case FileKind::ContourInfo: return showContourInfo(path, options);
    case FileKind::TaggedContours:
    case FileKind::RecordContours:
    case FileKind::PocketResult: return showPockets(path, *kind, options);
    case FileKind::LevelDump: return showLevelDump(path, options);
    case FileKind::ZoneDatabase: return showZoneDatabase(path, options);
    case FileKind::ToolParameters: return showToolParameters(path, options);
  }
  return kExitUnreadable;
}

}  // namespace pc::inspect
