// Where the value of a reference comes from: $NAME from the work zone (TMP),
// the process environment, then the configuration section "var"; ?NAME from
// the environment variable NAMEPATH, then the configuration section "path".
#pragma once

#include <optional>
#include <string>
#include <string_view>

namespace pc {

struct FoundValue {
  std::string value;
  std::string origin;  // how the trace line words where the value came from
};

std::optional<FoundValue> findVariable(std::string_view name);
std::optional<FoundValue> findPathList(std::string_view name);

// The same lookups without the origin.
std::optional<std::string> lookupVariable(std::string_view name);
std::optional<std::string> lookupPathList(std::string_view name);

// The text that replaces the undefined reference `name`, derived from
// $TRXNULL: empty when TRXNULL is undefined; with the first '$' of its value
// replaced by `name` when it holds one; else the value itself. The caller
// expands the result again when it holds references.
std::string undefinedValueText(std::string_view name);

}  // namespace pc
