#include "env/reference_scanner.h"

#include <optional>

#include "env/diagnostic_channels.h"
#include "env/path_expander.h"
#include "env/variable_lookup.h"

namespace pc {

namespace {

// Shared by every level of one expansion, including expansions started
// from inside a lookup (the temporary directory expands its own name).
struct ExpansionBudget {
  int depth = 0;
  std::size_t references = 0;
  std::size_t bytes = 0;
};
ExpansionBudget budget;

class NestingLevel {
 public:
  NestingLevel() {
    if (budget.depth == 0) budget = ExpansionBudget{};
    ++budget.depth;
  }
  ~NestingLevel() { --budget.depth; }
  NestingLevel(const NestingLevel&) = delete;
  NestingLevel& operator=(const NestingLevel&) = delete;
};

bool isNameCharacter(char c) {
  return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || (c >= '0' && c <= '9') || c == '_';
}

bool holdsReference(std::string_view text) { return text.find_first_of("$?") != std::string_view::npos; }

// Counts `count` more bytes against the budget; false when it is spent.
bool spend(std::size_t count) {
  budget.bytes += count;
  return budget.bytes <= kMaxExpansionBytes;
}

void traceLookup(char sigil, std::string_view name, const std::optional<FoundValue>& found) {
  if (!traceActive()) return;
  std::string line(name);
  line += " = ";
  if (found) {
    line += '\'';
    line += found->value;
    line += "' ";
    line += found->origin;
  } else {
    line += sigil == '$' ? "<undefined variable>" : "<undefined path>";
  }
  trace(line);
}

int expandAt(std::string_view text, std::string& result);

// The value of one reference, expanded again when it holds references.
int expandReference(char sigil, std::string_view name, std::string& value) {
  if (++budget.references > kMaxReferencesPerExpansion) return EXPAND_TOO_DEEP;
  const auto found = sigil == '$' ? findVariable(name) : findPathList(name);
  traceLookup(sigil, name, found);
  int code = EXPAND_OK;
  if (found) {
    value = found->value;
  } else {
    value = undefinedValueText(name);
    code = EXPAND_UNDEFINED;
  }
  if (!holdsReference(value)) return code;
  std::string inner;
  const int innerCode = expandAt(value, inner);
  if (isHardExpansionError(innerCode)) return innerCode;
  // An undefined reference stays undefined even when the undefined-value
  // text expands cleanly: callers must learn that a name was missing.
  if (innerCode == EXPAND_UNDEFINED) code = EXPAND_UNDEFINED;
  value = std::move(inner);
  return code;
}

int expandAt(std::string_view text, std::string& result) {
  result.clear();
  if (budget.depth >= kMaxReferenceNesting) return EXPAND_TOO_DEEP;
  const NestingLevel level;
  std::string out;
  int code = EXPAND_OK;
  std::size_t i = 0;
  while (i < text.size()) {
    const std::size_t sigilAt = text.find_first_of("$?", i);
    const std::size_t literalEnd = sigilAt == std::string_view::npos ? text.size() : sigilAt;
    if (!spend(literalEnd - i)) return EXPAND_BUFFER_TOO_SMALL;
    out.append(text, i, literalEnd - i);
    if (sigilAt == std::string_view::npos) break;

    const char sigil = text[sigilAt];
    const std::size_t next = sigilAt + 1;
    std::string_view name;
    if (next < text.size() && text[next] == sigil) {
      if (!spend(1)) return EXPAND_BUFFER_TOO_SMALL;
      out += sigil;
      i = next + 1;
      continue;
    }
    if (next < text.size() && (text[next] == '(' || text[next] == '{')) {
      // Brackets do not nest: the name ends at the first closing bracket.
      const char closing = text[next] == '(' ? ')' : '}';
      const std::size_t end = text.find(closing, next + 1);
      if (end == std::string_view::npos) return EXPAND_SYNTAX;
      name = text.substr(next + 1, end - next - 1);
      i = end + 1;
    } else {
      std::size_t end = next;
      while (end < text.size() && isNameCharacter(text[end])) ++end;
      name = text.substr(next, end - next);
      i = end;
    }

    std::string value;
    const int referenceCode = expandReference(sigil, name, value);
    if (isHardExpansionError(referenceCode)) return referenceCode;
    if (referenceCode == EXPAND_UNDEFINED) code = EXPAND_UNDEFINED;
    if (!spend(value.size())) return EXPAND_BUFFER_TOO_SMALL;
    out += value;
  }
  result = std::move(out);
  return code;
}

}  // namespace

bool isHardExpansionError(int code) { return code != EXPAND_OK && code != EXPAND_UNDEFINED; }

int substituteReferences(std::string_view text, std::string& result) { return expandAt(text, result); }

}  // namespace pc
