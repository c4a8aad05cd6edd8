// The work zone's temporary directory (the value of $TMP), the installation
// directory, and the small file-system tests that expansion relies on.
#pragma once

#include <optional>
#include <string>
#include <string_view>

namespace pc {

// $TRXTMPDIR as it stands when set; otherwise $TRXTMP/<zone number>, the
// zone being numbered from the suite-wide counter on its first use. The
// directory is created (with its parents) whenever it is missing. nullopt
// when the name cannot be expanded or a fatal message was sent.
std::optional<std::string> temporaryDirectory();

// $TRXHOME; else $TRXHOME_LS; else the directory the executable is installed
// under (<home>/exe/<platform>/<program>). With `publish`, TRXHOME is set in
// the process environment to the value found.
std::optional<std::string> installationDirectory(bool publish);

// The installation directory of an executable path: the path without its
// last three components, which must be the file name, `platformDirectory`
// and "exe" (compared without regard to case). '\\' counts as '/'.
std::optional<std::string> installationFromExecutable(std::string_view executable,
                                                      std::string_view platformDirectory);

// True when `name` exists. A name holding '*' or '?' in its last component
// is a pattern: true when an entry of its directory matches it.
bool fileExists(const std::string& name);

// Pattern match: '*' any run of characters, '?' any one character, ASCII
// letters compared without regard to case.
bool wildcardMatch(std::string_view pattern, std::string_view text);

// True when `name` is an existing directory; runs of '/' and '\\' count as
// one separator.
bool isDirectory(const std::string& name);

// Creates `name` and every missing parent. 0 when the directory exists at
// the end, -1 otherwise.
int makeDirectories(const std::string& name);

// The two existence tests of the search form; an empty name is neither.
bool isExistingFile(const std::string& name);
bool isExistingDirectory(const std::string& name);

}  // namespace pc
