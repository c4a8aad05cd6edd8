// Interim expander: $TMP from TRXTMPDIR, $NAME from the environment, anything
// undefined gives EXPAND_UNDEFINED. Replaced by the full expander.
#include "env/path_expander.h"

#include <cstring>
#include <string>

#include "env/fixed_field.h"
#include "platform/platform.h"

namespace pc {

namespace {

bool isNameChar(char c) {
  return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || (c >= '0' && c <= '9') || c == '_';
}

int substitute(std::string_view text, std::string& out) {
  int code = EXPAND_OK;
  out.clear();
  for (std::size_t i = 0; i < text.size();) {
    const char c = text[i];
    if (c != '$') {
      out += c;
      ++i;
      continue;
    }
    if (i + 1 < text.size() && text[i + 1] == '$') {
      out += '$';
      i += 2;
      continue;
    }
    std::string name;
    if (i + 1 < text.size() && (text[i + 1] == '(' || text[i + 1] == '{')) {
      const char close = text[i + 1] == '(' ? ')' : '}';
      const std::size_t end = text.find(close, i + 2);
      if (end == std::string_view::npos) return EXPAND_SYNTAX;
      name = std::string(text.substr(i + 2, end - i - 2));
      i = end + 1;
    } else {
      std::size_t j = i + 1;
      while (j < text.size() && isNameChar(text[j])) ++j;
      name = std::string(text.substr(i + 1, j - i - 1));
      i = j;
    }
    const auto value = platform::getEnv(name == "TMP" ? "TRXTMPDIR" : name);
    if (value) {
      out += *value;
    } else {
      code = EXPAND_UNDEFINED;
    }
  }
  return code;
}

int expandField(std::string_view source, std::span<char> destination, bool searchForm) {
  std::string result;
  int code = substitute(fieldText(source), result);
  if (code != EXPAND_OK && code != EXPAND_UNDEFINED) return code;
  if (searchForm && code == EXPAND_UNDEFINED) {
    setField(destination, "");
    return code;
  }
  if (result.size() > destination.size()) return EXPAND_BUFFER_TOO_SMALL;
  setField(destination, result);
  if (searchForm && code == EXPAND_OK && !platform::pathExists(result)) code = EXPAND_NOT_FOUND;
  return code;
}

}  // namespace

int expandName(const char* source, char* destination, std::size_t size) {
  if (source == nullptr || destination == nullptr) return EXPAND_INVALID_ARGUMENT;
  std::string result;
  const int code = substitute(source, result);
  if (code != EXPAND_OK && code != EXPAND_UNDEFINED) return code;
  if (result.size() + 1 > size) return EXPAND_BUFFER_TOO_SMALL;
  std::memcpy(destination, result.c_str(), result.size() + 1);
  return code;
}

int expandNameInPlace(char* buffer, std::size_t size) { return expandName(buffer, buffer, size); }

int expandFileName(std::string_view source, std::span<char> destination) {
  return expandField(source, destination, true);
}

int expandText(std::string_view source, std::span<char> destination) {
  return expandField(source, destination, false);
}

int expandPath(std::string_view source, std::span<char> destination) {
  return expandField(source, destination, false);
}

}  // namespace pc
