// The five entry points of path expansion and the warning that reports the
// codes their callers do not accept.
#include "env/path_expander.h"

#include <cstring>
#include <optional>
#include <string>

#include "env/diagnostic_channels.h"
#include "env/expansion_watch.h"
#include "env/fixed_field.h"
#include "env/reference_scanner.h"
#include "env/search_form.h"
#include "env/separators.h"
#include "platform/platform.h"

namespace pc {

namespace {

// `source` is nullopt when the caller gave no source at all.
void reportFailure(std::optional<std::string_view> source, int code, std::size_t size) {
  std::string line = "_Expand(";
  if (!source) {
    line += "<nullptr>";
  } else {
    line += '"';
    line += *source;
    line += '"';
  }
  line += ") = error " + std::to_string(code);
  switch (code) {
    case EXPAND_INVALID_ARGUMENT:
      line += " - invalid argument";
      break;
    case EXPAND_BUFFER_TOO_SMALL:
      line += " - buffer size " + std::to_string(size) + " too small";
      // Lets a developer stop where an undersized buffer is met.
      if (platform::getEnv("TRX_BUFFER_TOO_SMALL_OPTION") == "crash") platform::breakpointTrap();
      break;
    case EXPAND_SYNTAX:
      line += " - syntax error";
      break;
    case EXPAND_TOO_DEEP:
      line += " - references nested too deeply";
      break;
    default:
      break;
  }
  warning(line);
}

// Copies an accepted result into a fixed-length field, blank-padded.
int storeField(int code, const std::string& result, std::span<char> destination) {
  if (result.size() > destination.size()) return EXPAND_BUFFER_TOO_SMALL;
  setField(destination, result);
  return code;
}

int normalisedExpansion(std::string_view source, std::string& result) {
  const int code = substituteReferences(source, result);
  if (!isHardExpansionError(code)) normaliseSeparators(result);
  return code;
}

}  // namespace

int expandName(const char* source, char* destination, std::size_t size) {
  watchBufferSize(source, size, kCStringFormat);
  int code = EXPAND_INVALID_ARGUMENT;
  std::string result;
  if (source != nullptr && destination != nullptr) code = normalisedExpansion(source, result);
  if (!isHardExpansionError(code)) {
    // The whole result exists before the copy: `destination` may be `source`.
    if (result.size() + 1 > size) {
      code = EXPAND_BUFFER_TOO_SMALL;
    } else {
      std::memcpy(destination, result.c_str(), result.size() + 1);
      return code;
    }
  }
  reportFailure(source != nullptr ? std::optional<std::string_view>(source) : std::nullopt, code, size);
  return code;
}

int expandNameInPlace(char* buffer, std::size_t size) { return expandName(buffer, buffer, size); }

int expandFileName(std::string_view source, std::span<char> destination) {
  const std::string name(fieldText(source));
  watchBufferSize(name.c_str(), destination.size(), kFixedFieldFormat);
  std::string result;
  int code = expandSearchForm(name, result);
  // An undefined reference leaves `result` empty: the field becomes blanks.
  if (code == EXPAND_OK || code == EXPAND_UNDEFINED || code == EXPAND_NOT_FOUND) {
    code = storeField(code, result, destination);
  }
  if (code != EXPAND_OK && code != EXPAND_UNDEFINED && code != EXPAND_NOT_FOUND) {
    reportFailure(name, code, destination.size());
  }
  return code;
}

int expandText(std::string_view source, std::span<char> destination) {
  const std::string_view name = fieldText(source);
  std::string result;
  int code = substituteReferences(name, result);
  if (!isHardExpansionError(code)) code = storeField(code, result, destination);
  if (isHardExpansionError(code)) reportFailure(name, code, destination.size());
  return code;
}

int expandPath(std::string_view source, std::span<char> destination) {
  const std::string name(fieldText(source));
  watchBufferSize(name.c_str(), destination.size(), kFixedFieldFormat);
  std::string result;
  int code = normalisedExpansion(name, result);
  if (!isHardExpansionError(code)) code = storeField(code, result, destination);
  if (isHardExpansionError(code)) reportFailure(name, code, destination.size());
  return code;
}

}  // namespace pc
