// The environ.cfg parser on arbitrary bytes: the input is parsed as the
// contents of one configuration file into a table of its own, then every
// entry is looked up by its key, so that the + references and the
// conditions are resolved as a run would resolve them.
#include <cstddef>
#include <cstdint>
#include <string_view>

#include "env/configuration_loader.h"
#include "env/message_table.h"
#include "fuzz_support.h"

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  pc::fuzz::detachedDiagnostics();
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  pc::MessageTable* table = pc::createTable();
  if (table == nullptr) return 0;
  pc::MessageTable* loaded = pc::load_messages_from_buffer(table, "fuzz/environ.cfg", data, size);
  // The same text again as a second layer overloads every entry of the first.
  if (loaded != nullptr) loaded = pc::load_messages_from_buffer(loaded, "fuzz/user/environ.cfg", data, size);
  pc::MessageTable* result = loaded != nullptr ? loaded : table;
  for (int section = 0; section < pc::sectionCount(result); ++section) {
    const int entries = pc::entryCount(result, section);
    for (int index = 0; index < entries && index < 256; ++index) {
      const char* text = pc::entryText(result, section, index);
      if (text == nullptr) continue;
      const std::string_view entry(text);
      pc::lookup(result, section, entry.substr(0, entry.find('=')));
    }
  }
  if (loaded != nullptr && loaded != table) pc::destroyTable(loaded);
  pc::destroyTable(table);
  return 0;
}
