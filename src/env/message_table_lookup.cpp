// Lookups in the message table: the first entry of a key in slot order, its
// value with the `+` references resolved, and the origin of an entry.
#include <algorithm>
#include <cstdio>
#include <cstring>
#include <new>

#include "env/diagnostic_channels.h"
#include "env/message_table.h"
#include "env/message_table_internal.h"

namespace pc {

using namespace table_layout;

namespace {

// A resolved value may not pass this size; a value that doubles at every
// layer of files would otherwise exhaust memory.
constexpr std::size_t resolvedLimit = 1048576;
// Resolution steps of one lookup. Genuine references always point to older
// entries and every reference beyond the chain adds text, so only forged
// references that point back at themselves get near this.
constexpr std::size_t stepLimit = 1u << 20;
// Steps and characters traced in full per lookup; a hostile value would
// flood the trace.
constexpr std::size_t tracedSteps = 1000;
constexpr std::size_t tracedCharacters = 1u << 22;
constexpr std::size_t referenceLength = 12;  // "+(XXXXXXXX\)"
// Resolutions of more steps than this are kept for the next lookup of the
// same entry, up to a total size; a hostile file may ask for them often.
constexpr std::size_t keptFromSteps = 1000;
constexpr std::size_t keptBytes = 16u << 20;

// The process-wide result of the latest lookup that resolved references,
// and the entry it came from.
std::string resultBuffer;
const MessageTable* resultTable = nullptr;
std::int32_t resultEntry = -1;

// The text still to be scanned: one piece per inserted value, innermost last.
struct Piece {
  const char* text;
  std::size_t size;
  std::size_t position;
  std::int32_t entry;  // text offset of the entry the piece comes from
};

class Resolver {
 public:
  Resolver(const MessageTable* table, std::int32_t entry) : table_(table), trace_(traceActive()) {
    push(entryValue(storedText(table, entry)), entry);
  }

  // False when the value grows past the limit or never ends.
  bool run(std::string& out) {
    out.clear();
    while (!pieces_.empty()) {
      Piece& top = pieces_.back();
      if (top.position == top.size) {
        pieces_.pop_back();
        continue;
      }
      const char* start = top.text + top.position;
      const void* plus = std::memchr(start, '+', top.size - top.position);
      const std::size_t run = plus != nullptr ? static_cast<const char*>(plus) - start : top.size - top.position;
      out.append(start, run);
      top.position += run;
      if (out.size() > resolvedLimit) return false;
      if (plus == nullptr) continue;
      if (++steps_ > stepLimit) return false;
      step(out);
      if (out.size() > resolvedLimit) return false;
      if (traced()) {
        const std::string text = out + rest();
        tracedSize_ += text.size();
        trace(text);
        if (steps_ >= tracedSteps || tracedSize_ >= tracedCharacters) untracedFrom_ = steps_;
      }
    }
    if (untracedFrom_ > 0 && steps_ > untracedFrom_) {
      trace("   ... " + std::to_string(steps_ - untracedFrom_) + " further resolution steps not traced");
    }
    return true;
  }

  std::size_t steps() const { return steps_; }

 private:
  bool traced() const { return trace_ && untracedFrom_ == 0; }

  void push(std::string_view text, std::int32_t entry) {
    pieces_.push_back(Piece{text.data(), text.size(), 0, entry});
  }

  // The character `ahead` places after the scan position, across pieces; 0 past the end.
  char peek(std::size_t ahead) const {
    for (auto piece = pieces_.rbegin(); piece != pieces_.rend(); ++piece) {
      const std::size_t left = piece->size - piece->position;
      if (ahead < left) return piece->text[piece->position + ahead];
      ahead -= left;
    }
    return 0;
  }

  void consume(std::size_t count) {
    while (count > 0 && !pieces_.empty()) {
      Piece& top = pieces_.back();
      const std::size_t taken = std::min(count, top.size - top.position);
      top.position += taken;
      count -= taken;
      if (top.position == top.size) pieces_.pop_back();
    }
  }

  // The referenced offset when a reference "(XXXXXXXX\)" follows the '+'.
  std::optional<std::uint32_t> reference() const {
    if (peek(1) != '(' || peek(10) != '\\' || peek(11) != ')') return std::nullopt;
    std::uint32_t offset = 0;
    for (std::size_t i = 2; i < 10; ++i) {
      const char c = peek(i);
      const int digit = c >= '0' && c <= '9' ? c - '0' : c >= 'A' && c <= 'F' ? c - 'A' + 10 : -1;
      if (digit < 0) return std::nullopt;
      offset = offset * 16 + static_cast<std::uint32_t>(digit);
    }
    return offset;
  }

  std::string originLabel(std::int32_t entry) const { return originOf(table_, entry).value_or(""); }

  void step(std::string& out) {
    const bool traced = this->traced();
    if (peek(1) == '+') {
      out += '+';
      consume(2);
      return;
    }
    const std::optional<std::uint32_t> offset = reference();
    if (!offset) {
      out += '+';
      consume(1);
      return;
    }
    const Piece& top = pieces_.back();
    const std::int32_t current = top.entry;
    const bool inside = *offset >= static_cast<std::uint32_t>(recordHeader) &&
                        *offset < static_cast<std::uint32_t>(usedSize(table_->strings));
    if (!inside) {
      if (traced) {
        trace("ref=[" + std::string(top.text + top.position + 1, top.size - top.position - 1) + "]\n");
      }
      consume(referenceLength);
      out += "$(TRXNULL)";
      return;
    }
    const auto older = static_cast<std::int32_t>(*offset);
    if (traced) {
      char head[32];
      std::snprintf(head, sizeof head, "   %08X -> ", *offset);
      trace("   - " + std::string(storedText(table_, current)) + " " + originLabel(current));
      trace(head + std::string(storedText(table_, older)) + " " + originLabel(older));
    }
    consume(referenceLength);
    push(entryValue(storedText(table_, older)), older);
  }

  // The text not scanned yet, for the trace.
  std::string rest() const {
    std::string text;
    for (auto piece = pieces_.rbegin(); piece != pieces_.rend(); ++piece) {
      text.append(piece->text + piece->position, piece->size - piece->position);
    }
    return text;
  }

  const MessageTable* table_;
  bool trace_;
  std::vector<Piece> pieces_;
  std::size_t steps_ = 0;
  std::size_t tracedSize_ = 0;
  std::size_t untracedFrom_ = 0;  // the step after which the trace went quiet
};

struct Found {
  const char* value;
  std::int32_t entry;
};

// The value of the first entry with `key`, resolved; nullopt when absent.
std::optional<Found> resolve(MessageTable* table, int section, std::string_view key) {
  const DynamicStorage* pool = sectionPool(table, section);
  if (pool == nullptr) return std::nullopt;
  const std::int32_t slot = findSlot(table, section, key, true);
  if (slot < 0) return std::nullopt;
  const std::int32_t entry = slotText(pool, slot);
  const std::string_view value = entryValue(storedText(table, entry));
  if (value.find('+') == std::string_view::npos) return Found{value.data(), entry};
  const std::string label = std::string(sectionName(table, section)) + "] " + std::string(key);
  try {
    const auto kept = table->resolved.find(entry);
    bool resolved = false;
    if (kept != table->resolved.end()) {
      resolved = kept->second.has_value();
      if (resolved) resultBuffer = *kept->second;
    } else {
      Resolver resolver(table, entry);
      resolved = resolver.run(resultBuffer);
      if (resolver.steps() > keptFromSteps) {
        if (table->resolvedBytes > keptBytes) {
          table->resolved.clear();
          table->resolvedBytes = 0;
        }
        table->resolved.emplace(entry, resolved ? std::optional<std::string>(resultBuffer) : std::nullopt);
        table->resolvedBytes += resolved ? resultBuffer.size() : 0;
      }
    }
    if (!resolved) {
      resultBuffer.clear();
      resultTable = nullptr;
      warning("Message table: the value of [" + label + " passes " + std::to_string(resolvedLimit) +
              " bytes once resolved; it is taken as undefined");
      return std::nullopt;
    }
  } catch (const std::bad_alloc&) {
    resultBuffer.clear();
    resultTable = nullptr;
    warning("Dynamic storage: no more memory\n");
    return std::nullopt;
  }
  resultTable = table;
  resultEntry = entry;
  return Found{resultBuffer.c_str(), entry};
}

}  // namespace

void forgetResult(const MessageTable* table) {
  if (resultTable == table) resultTable = nullptr;
}

std::optional<std::string_view> entryKey(std::string_view text) {
  std::size_t start = 0;
  while (start < text.size() && isBlank(text[start])) ++start;
  const std::size_t equals = text.find('=', start);
  if (equals == std::string_view::npos) return std::nullopt;
  std::size_t end = equals;
  while (end > start && isBlank(text[end - 1])) --end;
  return text.substr(start, end - start);
}

std::string_view entryValue(std::string_view text) {
  std::size_t start = text.find('=');
  if (start == std::string_view::npos) return text.substr(text.size());
  ++start;
  while (start < text.size() && isBlank(text[start])) ++start;
  return text.substr(start);
}

std::string foldCase(std::string_view text) {
  std::string folded(text);
  for (char& c : folded) {
    if (c >= 'A' && c <= 'Z') c = static_cast<char>(c - 'A' + 'a');
  }
  return folded;
}

std::string_view storedText(const MessageTable* table, std::int32_t offset) {
  if (table == nullptr || offset < 0 || offset >= usedSize(table->strings)) return {};
  const char* text = table->strings->data + offset;
  const auto room = static_cast<std::size_t>(usedSize(table->strings) - offset);
  const void* end = std::memchr(text, '\0', room);
  return std::string_view(text, end != nullptr ? static_cast<const char*>(end) - text : room);
}

std::optional<EntryRecord> recordOf(const MessageTable* table, std::int32_t textOffset) {
  if (table == nullptr || textOffset < recordHeader || textOffset >= usedSize(table->strings)) return std::nullopt;
  const std::int32_t record = textOffset - recordHeader;
  return EntryRecord{read<std::int32_t>(table->strings, record), read<std::int32_t>(table->strings, record + 4),
                     read<std::uint16_t>(table->strings, record + 8), read<std::uint8_t>(table->strings, record + 10)};
}

std::optional<std::string> originOf(const MessageTable* table, std::int32_t textOffset) {
  const std::optional<EntryRecord> record = recordOf(table, textOffset);
  if (!record) return std::nullopt;
  if (record->originFile == -1) return std::string("set by program");
  if (record->originFile < 0 || record->originFile >= usedSize(table->strings)) return std::nullopt;
  return "from '" + std::string(storedText(table, record->originFile)) + "' line " + std::to_string(record->line);
}

const char* lookup(MessageTable* table, int section, std::string_view key) {
  const std::optional<Found> found = resolve(table, section, key);
  return found ? found->value : nullptr;
}

std::optional<ConfigurationValue> lookupWithOrigin(MessageTable* table, int section, std::string_view key) {
  const std::optional<Found> found = resolve(table, section, key);
  if (!found) return std::nullopt;
  return ConfigurationValue{found->value, originOf(table, found->entry).value_or("")};
}

int originText(std::string& buffer, const MessageTable* table, const char* value) {
  buffer.clear();
  if (table == nullptr || value == nullptr) return -1;
  std::optional<std::string> origin;
  const char* pool = table->strings->data;
  const std::int32_t used = usedSize(table->strings);
  if (table == resultTable && value == resultBuffer.c_str()) {
    // A value assembled from references: the origin of the entry looked up.
    origin = originOf(table, resultEntry);
  } else if (value > pool && value < pool + used) {
    // Back from the value to the zero byte that ends the record header,
    // however long the entry.
    const char* scan = value - 1;
    while (scan > pool && *scan != '\0') --scan;
    if (*scan == '\0') origin = originOf(table, static_cast<std::int32_t>(scan - pool) + 1);
  }
  if (!origin) return -1;
  buffer = *origin;
  return 0;
}

MessageTable*& environmentTable() {
  static MessageTable* table = nullptr;
  return table;
}

MessageTable* fileNamesTable() { return nullptr; }

std::optional<std::string> lookupFileName(std::string_view key) {
  MessageTable* table = fileNamesTable();
  const std::optional<ConfigurationValue> found = lookupWithOrigin(table, findSection(table, "Tarnex files names"), key);
  if (!found) return std::nullopt;
  return found->value;
}

}  // namespace pc
