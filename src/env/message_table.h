// The message and variable table: named sections of `key = value` entries,
// each remembering its origin (file and line, or set by the program) and the
// entry it overloaded. A `+` in an overloading entry refers to the value it
// replaced. Strings live in storage pools and are addressed by offsets.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include "env/configuration_lookup.h"

namespace pc {

struct MessageTable;  // root, string and section pools

// The section number addSection gives on refusal.
constexpr int refusedSection = 65535;

// A new empty table, or nullptr on exhausted storage.
MessageTable* createTable();
// Releases a table and its pools. The process-wide tables live to the end of
// the process; this is for tables of a passing use (tests, fuzzing).
void destroyTable(MessageTable* table);

// Number of the first section named exactly `name`, or -1.
int findSection(const MessageTable* table, std::string_view name);
// Number of a new section, or refusedSection for a name of 100 characters or
// more, too many sections or exhausted storage.
int addSection(MessageTable* table, std::string_view name);
int findOrAddSection(MessageTable* table, std::string_view name);

// Appends a new entry (overloading nothing). 0, or -1 on a bad section
// number or exhausted storage. `originFile` is an offset from storeFileName,
// or -1 for an entry set by the program (then `line` is 0).
int addEntry(MessageTable* table, int section, std::string_view text, std::int32_t originFile,
             std::uint16_t line);
// Replaces the entry in slot `index` by `text`, whose single `+` signs then
// refer to the replaced value. 0 or -1.
int overloadEntry(MessageTable* table, int section, int index, std::string_view text,
                  std::int32_t originFile, std::uint16_t line);
// Overloads the entry with the same key (exact case), else adds one. A text
// without '=' is reported: ignored (0) from a file, refused (-1) from the program.
int setEntry(MessageTable* table, int section, std::string_view text, std::int32_t originFile,
             std::uint16_t line);
// setEntry for an entry set by the program.
int set_parameter(MessageTable* table, int section, std::string_view text);
// Entries stored while the mode is on are marked as parameters; on at start.
// Returns the previous setting.
bool setParameterMode(bool on);

// Offset of a stored copy of the file name, or -1.
std::int32_t storeFileName(MessageTable* table, std::string_view fileName);
// Every pool of the table down to its used size.
void shrinkTable(MessageTable* table);

// Value text (nullptr when absent); valid until the next lookup. Resolves +
// references, sends the trace lines; a resolved value passing 1 MiB gives
// nullptr and one warning naming section and key.
const char* lookup(MessageTable* table, int section, std::string_view key);
// The value with the origin of the entry looked up ("from '<file>' line <n>",
// "set by program", or "").
std::optional<ConfigurationValue> lookupWithOrigin(MessageTable* table, int section, std::string_view key);
// Writes the origin of a value given by lookup into `buffer`: 0, or -1 (and
// an empty text) when no origin can be found.
int originText(std::string& buffer, const MessageTable* table, const char* value);

// The process-wide tables.
MessageTable*& environmentTable();  // nullptr until the loader creates it
MessageTable* fileNamesTable();     // the "Tarnex files names" table: never loaded, nullptr
// Looks `key` up in the never-loaded file-names table: always absent.
std::optional<std::string> lookupFileName(std::string_view key);

// Read access for the loader and the tests.
int sectionCount(const MessageTable* table);
// Name of a section, or nullptr for a bad number.
const char* sectionName(const MessageTable* table, int section);
// Entries in a section (0 for a bad number).
int entryCount(const MessageTable* table, int section);
// Stored text of the entry in a slot, or nullptr.
const char* entryText(const MessageTable* table, int section, int index);

}  // namespace pc
