// The layout of a message table inside its pools, shared by the files of the
// table. Not for other modules: they use message_table.h.
#pragma once

#include <cstdint>
#include <cstring>
#include <optional>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

#include "env/message_table.h"
#include "memory/dynamic_storage.h"

namespace pc {

// Key to the first slot holding it, per section: the exact keys for the
// overloading search and the case-folded keys for lookups. Both keep the
// first match in slot order, so they only speed up the scans they replace.
struct SectionIndex {
  std::unordered_map<std::string, std::int32_t> exact;
  std::unordered_map<std::string, std::int32_t> folded;
  bool valid = true;
};

struct MessageTable {
  DynamicStorage* root = nullptr;     // section count, string pool, section pools
  DynamicStorage* strings = nullptr;  // file names and entry records
  std::vector<SectionIndex> indexes;
  std::unordered_map<std::string, int> sectionNumbers;  // name to first section
  bool indexesUsable = true;  // false after the index ran out of memory: plain scans then
  // Values whose resolution took many steps, by entry text offset (nullopt:
  // too large). Records never change once stored, so neither do these.
  std::unordered_map<std::int32_t, std::optional<std::string>> resolved;
  std::size_t resolvedBytes = 0;
};

namespace table_layout {

// Root pool: the section count, the string pool, then one slot per section.
constexpr std::int32_t rootCount = 0;
constexpr std::int32_t rootStrings = 8;
constexpr std::int32_t rootHeader = 16;
constexpr std::int32_t rootSlot = 8;
constexpr std::int32_t rootPoolSize = 128;
// String pool.
constexpr std::int32_t stringPoolSize = 1024;
constexpr std::int32_t recordHeader = 12;
// Section pool: the name field, the entry count, then 4-byte entry slots;
// every entry reserves 8 bytes.
constexpr std::int32_t sectionPoolSize = 148;
constexpr std::int32_t nameField = 100;
constexpr std::int32_t sectionCountField = 100;
constexpr std::int32_t sectionHeader = 104;
constexpr std::int32_t entryReservation = 8;
// More sections would collide with the refusal number.
constexpr int maximumSections = refusedSection;

template <typename T>
T read(const DynamicStorage* pool, std::int32_t offset) {
  T value;
  std::memcpy(&value, pool->data + offset, sizeof value);
  return value;
}

template <typename T>
void write(DynamicStorage* pool, std::int32_t offset, T value) {
  std::memcpy(pool->data + offset, &value, sizeof value);
}

}  // namespace table_layout

struct EntryRecord {
  std::int32_t originFile;
  std::int32_t previous;
  std::uint16_t line;
  std::uint8_t parameter;
};

inline bool isBlank(char c) { return static_cast<unsigned char>(c) <= 0x20; }

// The key of an entry text: before its first '=', without the blanks around
// it; nullopt for a text without '='.
std::optional<std::string_view> entryKey(std::string_view text);
// The value of an entry text: after its first '=' and the blanks that follow.
std::string_view entryValue(std::string_view text);
std::string foldCase(std::string_view text);

DynamicStorage* sectionPool(const MessageTable* table, int section);
// Text offset in the string pool of the entry in a slot.
std::int32_t slotText(const DynamicStorage* section, std::int32_t index);
// The NUL-terminated text at a string pool offset, bounded by the pool;
// empty for an offset outside it.
std::string_view storedText(const MessageTable* table, std::int32_t offset);
// The record header in front of a text offset, when it lies inside the pool.
std::optional<EntryRecord> recordOf(const MessageTable* table, std::int32_t textOffset);
// "from '<file>' line <n>", "set by program", or "" (nullopt) for an entry text.
std::optional<std::string> originOf(const MessageTable* table, std::int32_t textOffset);
// Forgets a lookup result that came from `table`.
void forgetResult(const MessageTable* table);
// The slot of the first entry whose key is `key` (exact, or without regard to case), or -1.
std::int32_t findSlot(MessageTable* table, int section, std::string_view key, bool foldedKey);

}  // namespace pc
