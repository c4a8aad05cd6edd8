// The pieces of the environ.cfg syntax that need no table: line kinds,
// comments, conditions and directory lists.
#pragma once

#include <string>
#include <string_view>
#include <vector>

namespace pc {

inline bool isConfigurationBlank(char c) { return static_cast<unsigned char>(c) <= 0x20; }

// `text` without the bytes 0x00 to 0x20 at its start and end.
std::string_view stripConfigurationBlanks(std::string_view text);

// Cuts `line` at its first single '#'; every "##" before that becomes '#'.
void cutComment(std::string& line);

enum class ConfigurationLine { If, Else, Endif, UnknownKeyword, Section, Entry };

// The kind of a stripped, non-empty line: a '/' not followed by a second
// '/' starts a keyword, known by its first letters (if, else, endif); '['
// opens a section; anything else is an entry.
ConfigurationLine classifyLine(std::string_view line);

// The name of a section line "[name]": up to the first ']', or to the end.
std::string_view sectionNameOf(std::string_view line);

// The three parts of an /if condition ("NAME", "NAME == text",
// "NAME != text", optionally within () or {}). `op` is empty when no
// operator follows the name.
struct ConditionParts {
  std::string_view name;
  std::string_view op;
  std::string_view text;
};
ConditionParts parseCondition(std::string_view condition);

// The keywords seen while a false branch is skipped (the line stripped of
// leading blanks only); Other for every other line.
enum class SkippedLine { If, Else, Endif, Other };
SkippedLine classifySkippedLine(std::string_view line);

// A list of directories cut at ';' and ',': pieces trimmed of the bytes
// 0x01 to 0x20, empty ones dropped, and `separator` appended to those that
// end in neither '/' nor '\\'.
std::vector<std::string> splitDirectoryList(std::string_view list, char separator);

// The files that a directory list names, in load order (the last directory
// first): each piece trimmed, without one final '\\', '/' or blank, then
// `separator` and `fileName`. Empty pieces name no file.
std::vector<std::string> listFilesFromEnd(std::string_view list, std::string_view fileName, char separator);

// The configuration directory of an installation: `home` without one final
// '/' or '\\', then "<separator>config<separator>".
std::string configurationDirectoryOf(std::string_view home, char separator);

// ASCII letters compared without regard to case.
bool sameTextIgnoringCase(std::string_view a, std::string_view b);
std::string foldedText(std::string_view text);

}  // namespace pc
