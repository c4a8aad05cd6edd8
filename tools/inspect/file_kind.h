// Which of the run's files a given file is: told by its content, and by its
// name where the content cannot tell (an empty file, a parameter file).
#pragma once

#include <optional>
#include <string>
#include <string_view>

namespace pc::inspect {

enum class FileKind { ContourInfo, TaggedContours, RecordContours, LevelDump, PocketResult, ZoneDatabase, ToolParameters };

std::string_view kindName(FileKind kind);
// The kind of a name given with --type ("contour-info", ...).
std::optional<FileKind> kindFromName(std::string_view name);
// Every name accepted by kindFromName, separated by ", ".
std::string kindNames();

// The file's kind, or nothing when neither its bytes nor its name tell.
std::optional<FileKind> detectKind(const std::string& path);

}  // namespace pc::inspect
