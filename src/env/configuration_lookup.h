// The expander's window on the environment configuration table: the sections
// "var" and "path" of the table loaded from the environ.cfg files. The table
// installs its lookup here; until one is installed every lookup finds nothing
// and only the process environment answers.
#pragma once

#include <optional>
#include <string>
#include <string_view>

namespace pc {

struct ConfigurationValue {
  std::string value;   // as stored, trailing blanks included
  std::string origin;  // "set by program", "from '<file>' line <n>", or ""
};

// Looks `key` up (without regard to letter case) in `section`, loading the
// configuration first when that has not happened yet.
using ConfigurationLookup = std::optional<ConfigurationValue> (*)(std::string_view section,
                                                                 std::string_view key);

// Installs `lookup` (nullptr: the built-in one that finds nothing) and
// returns the previous one.
ConfigurationLookup setConfigurationLookup(ConfigurationLookup lookup);

std::optional<ConfigurationValue> lookupConfiguration(std::string_view section, std::string_view key);

}  // namespace pc
