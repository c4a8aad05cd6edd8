// The show subcommand: one file of a run, readable as text or as JSON.
#pragma once

#include <optional>
#include <string>

#include "file_kind.h"
#include "report.h"

namespace pc::inspect {

// Exit code: kExitClean, or kExitUnreadable after the report of the damage.
int showFile(const std::string& path, std::optional<FileKind> forced, const ShowOptions& options);

int showContourInfo(const std::string& path, const ShowOptions& options);
int showPockets(const std::string& path, FileKind kind, const ShowOptions& options);
int showLevelDump(const std::string& path, const ShowOptions& options);
int showZoneDatabase(const std::string& path, const ShowOptions& options);
int showToolParameters(const std::string& path, const ShowOptions& options);

}  // namespace pc::inspect
