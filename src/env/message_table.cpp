#include "env/message_table.h"

#include <cstdio>
#include <new>

#include "env/diagnostic_channels.h"
#include "env/message_table_internal.h"

namespace pc {

using namespace table_layout;

namespace {

bool parameterMode = true;

int sectionTotal(const MessageTable* table) { return read<std::int32_t>(table->root, rootCount); }

std::string_view cutAtNul(std::string_view text) { return text.substr(0, text.find('\0')); }

// Index upkeep may run out of memory; the table then falls back to scans.
template <typename Update>
void updateIndex(MessageTable* table, Update update) {
  if (!table->indexesUsable) return;
  try {
    update();
  } catch (const std::bad_alloc&) {
    table->indexesUsable = false;
  }
}

void indexSlot(SectionIndex& index, std::string_view text, std::int32_t slot) {
  const auto key = entryKey(text);
  if (!key) return;
  index.exact.emplace(std::string(*key), slot);
  index.folded.emplace(foldCase(*key), slot);
}

// Stores an entry record and gives the offset of its text, or -1.
std::int32_t storeRecord(MessageTable* table, std::string_view text, const EntryRecord& record) {
  if (text.size() > static_cast<std::size_t>(INT32_MAX - recordHeader - 1)) {
    warning("Dynamic storage: no more memory\n");
    return -1;
  }
  const std::int32_t offset = reserve(table->strings, static_cast<std::int32_t>(text.size()) + recordHeader + 1);
  if (offset < 0) return -1;
  write(table->strings, offset, record.originFile);
  write(table->strings, offset + 4, record.previous);
  write(table->strings, offset + 8, record.line);
  write(table->strings, offset + 10, record.parameter);
  write(table->strings, offset + 11, std::uint8_t{0});
  std::memcpy(table->strings->data + offset + recordHeader, text.data(), text.size());
  return offset + recordHeader;
}

// The text with every single '+' turned into a reference to `older`.
std::string withReferences(std::string_view text, std::int32_t older) {
  char reference[16];
  std::snprintf(reference, sizeof reference, "+(%08X\\)", static_cast<unsigned>(older));
  std::string converted;
  converted.reserve(text.size() + 16);
  for (std::size_t i = 0; i < text.size(); ++i) {
    if (text[i] != '+') {
      converted += text[i];
    } else if (i + 1 < text.size() && text[i + 1] == '+') {
      converted += "++";
      ++i;
    } else {
      converted += reference;
    }
  }
  return converted;
}

std::string sectionLabel(const MessageTable* table, int section) {
  const char* name = sectionName(table, section);
  return name != nullptr ? name : "";
}

}  // namespace

bool setParameterMode(bool on) {
  const bool previous = parameterMode;
  parameterMode = on;
  return previous;
}

MessageTable* createTable() {
  auto* table = new (std::nothrow) MessageTable;
  if (table == nullptr) return nullptr;
  table->root = createPool(rootPoolSize);
  table->strings = table->root != nullptr ? createPool(stringPoolSize) : nullptr;
  if (table->strings == nullptr || reserve(table->root, rootHeader) != 0) {
    destroyPool(table->strings);
    destroyPool(table->root);
    delete table;
    return nullptr;
  }
  write(table->root, rootCount, std::int32_t{0});
  write(table->root, rootStrings, table->strings);
  return table;
}

void destroyTable(MessageTable* table) {
  if (table == nullptr) return;
  forgetResult(table);
  for (int section = 0; section < sectionTotal(table); ++section) destroyPool(sectionPool(table, section));
  destroyPool(table->strings);
  destroyPool(table->root);
  delete table;
}

int sectionCount(const MessageTable* table) { return table != nullptr ? sectionTotal(table) : 0; }

DynamicStorage* sectionPool(const MessageTable* table, int section) {
  if (table == nullptr || section < 0 || section >= sectionTotal(table)) return nullptr;
  return read<DynamicStorage*>(table->root, rootHeader + section * rootSlot);
}

const char* sectionName(const MessageTable* table, int section) {
  const DynamicStorage* pool = sectionPool(table, section);
  return pool != nullptr ? pool->data : nullptr;
}

int findSection(const MessageTable* table, std::string_view name) {
  if (table == nullptr) return -1;
  name = cutAtNul(name);
  if (name.size() >= static_cast<std::size_t>(nameField)) return -1;
  if (table->indexesUsable) {
    const auto it = table->sectionNumbers.find(std::string(name));
    return it != table->sectionNumbers.end() ? it->second : -1;
  }
  for (int section = 0; section < sectionTotal(table); ++section) {
    if (name == sectionName(table, section)) return section;
  }
  return -1;
}

int addSection(MessageTable* table, std::string_view name) {
  if (table == nullptr) return refusedSection;
  name = cutAtNul(name);
  if (name.size() >= static_cast<std::size_t>(nameField)) return refusedSection;
  const int section = sectionTotal(table);
  if (section >= maximumSections) {
    warning("Message table: too many sections, section [" + std::string(name) + "] refused");
    return refusedSection;
  }
  DynamicStorage* pool = createPool(sectionPoolSize);
  if (pool == nullptr) return refusedSection;
  if (reserve(pool, sectionHeader) != 0 || reserve(table->root, rootSlot) < 0) {
    destroyPool(pool);
    return refusedSection;
  }
  std::memcpy(pool->data, name.data(), name.size());
  write(pool, sectionCountField, std::int32_t{0});
  write(table->root, rootHeader + section * rootSlot, pool);
  write(table->root, rootCount, section + 1);
  updateIndex(table, [&] {
    table->indexes.resize(static_cast<std::size_t>(section) + 1);
    table->sectionNumbers.emplace(std::string(name), section);
  });
  return section;
}

int findOrAddSection(MessageTable* table, std::string_view name) {
  const int section = findSection(table, name);
  return section >= 0 ? section : addSection(table, name);
}

int entryCount(const MessageTable* table, int section) {
  const DynamicStorage* pool = sectionPool(table, section);
  return pool != nullptr ? read<std::int32_t>(pool, sectionCountField) : 0;
}

std::int32_t slotText(const DynamicStorage* section, std::int32_t index) {
  return read<std::int32_t>(section, sectionHeader + index * 4);
}

const char* entryText(const MessageTable* table, int section, int index) {
  const DynamicStorage* pool = sectionPool(table, section);
  if (pool == nullptr || index < 0 || index >= read<std::int32_t>(pool, sectionCountField)) return nullptr;
  return table->strings->data + slotText(pool, index);
}

int addEntry(MessageTable* table, int section, std::string_view text, std::int32_t originFile,
             std::uint16_t line) {
  DynamicStorage* pool = sectionPool(table, section);
  if (pool == nullptr) return -1;
  text = cutAtNul(text);
  const std::int32_t textOffset =
      storeRecord(table, text, EntryRecord{originFile, -1, line, static_cast<std::uint8_t>(parameterMode)});
  if (textOffset < 0 || reserve(pool, entryReservation) < 0) return -1;
  const std::int32_t slot = read<std::int32_t>(pool, sectionCountField);
  write(pool, sectionHeader + slot * 4, textOffset);
  write(pool, sectionCountField, slot + 1);
  updateIndex(table, [&] { indexSlot(table->indexes[static_cast<std::size_t>(section)], text, slot); });
  return 0;
}

int overloadEntry(MessageTable* table, int section, int index, std::string_view text,
                  std::int32_t originFile, std::uint16_t line) {
  DynamicStorage* pool = sectionPool(table, section);
  if (pool == nullptr || index < 0 || index >= read<std::int32_t>(pool, sectionCountField)) return -1;
  const std::int32_t older = slotText(pool, index);
  std::string converted;
  try {
    converted = withReferences(cutAtNul(text), older);
  } catch (const std::bad_alloc&) {
    warning("Dynamic storage: no more memory\n");
    return -1;
  }
  const std::int32_t textOffset =
      storeRecord(table, converted, EntryRecord{originFile, older, line, static_cast<std::uint8_t>(parameterMode)});
  if (textOffset < 0) return -1;
  const std::optional<std::string_view> oldKey = entryKey(storedText(table, older));
  write(pool, sectionHeader + index * 4, textOffset);
  // A new key in the slot (only a direct caller can do that) makes the
  // section's index stale: it is rebuilt at its next use.
  if (entryKey(converted) != oldKey && table->indexesUsable) {
    table->indexes[static_cast<std::size_t>(section)].valid = false;
  }
  return 0;
}

int setEntry(MessageTable* table, int section, std::string_view text, std::int32_t originFile,
             std::uint16_t line) {
  if (sectionPool(table, section) == nullptr) return -1;
  text = cutAtNul(text);
  std::size_t start = 0;
  while (start < text.size() && isBlank(text[start])) ++start;
  text.remove_prefix(start);
  const std::optional<std::string_view> key = entryKey(text);
  if (!key) {
    if (originFile >= 0) {
      warning("load_messages: [file '" + std::string(storedText(table, originFile)) + "' line " +
              std::to_string(line) + "] Warning - incorrect format (missing '='): [" +
              sectionLabel(table, section) + "] " + std::string(text) + "\n");
      return 0;
    }
    warning("set_parameter : The program is trying to modify a non-parameter message: [" +
            sectionLabel(table, section) + "] " + std::string(text) + "\n");
    return -1;
  }
  const std::int32_t slot = findSlot(table, section, *key, false);
  return slot >= 0 ? overloadEntry(table, section, slot, text, originFile, line)
                   : addEntry(table, section, text, originFile, line);
}

int set_parameter(MessageTable* table, int section, std::string_view text) {
  return setEntry(table, section, text, -1, 0);
}

std::int32_t storeFileName(MessageTable* table, std::string_view fileName) {
  if (table == nullptr) return -1;
  return addString(table->strings, cutAtNul(fileName));
}

void shrinkTable(MessageTable* table) {
  if (table == nullptr) return;
  for (int section = 0; section < sectionTotal(table); ++section) shrink(sectionPool(table, section));
  shrink(table->strings);
  shrink(table->root);
}

std::int32_t findSlot(MessageTable* table, int section, std::string_view key, bool foldedKey) {
  const DynamicStorage* pool = sectionPool(table, section);
  if (pool == nullptr) return -1;
  const std::int32_t count = read<std::int32_t>(pool, sectionCountField);
  if (table->indexesUsable) {
    SectionIndex& index = table->indexes[static_cast<std::size_t>(section)];
    if (!index.valid) {
      updateIndex(table, [&] {
        index = SectionIndex{};
        for (std::int32_t slot = 0; slot < count; ++slot) indexSlot(index, storedText(table, slotText(pool, slot)), slot);
      });
    }
    if (table->indexesUsable) {
      try {
        const auto& map = foldedKey ? index.folded : index.exact;
        const auto it = map.find(foldedKey ? foldCase(key) : std::string(key));
        return it != map.end() ? it->second : -1;
      } catch (const std::bad_alloc&) {
        table->indexesUsable = false;
      }
    }
  }
  const std::string folded = foldedKey ? foldCase(key) : std::string();
  for (std::int32_t slot = 0; slot < count; ++slot) {
    const auto slotKey = entryKey(storedText(table, slotText(pool, slot)));
    if (!slotKey || slotKey->size() != key.size()) continue;
    if (foldedKey ? foldCase(*slotKey) == folded : *slotKey == key) return slot;
  }
  return -1;
}

}  // namespace pc
