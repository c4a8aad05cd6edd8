#include "env/configuration_lookup.h"

namespace pc {

namespace {

std::optional<ConfigurationValue> noConfiguration(std::string_view, std::string_view) { return std::nullopt; }

ConfigurationLookup installedLookup = noConfiguration;

}  // namespace

ConfigurationLookup setConfigurationLookup(ConfigurationLookup lookup) {
  const ConfigurationLookup previous = installedLookup;
  installedLookup = lookup != nullptr ? lookup : noConfiguration;
  return previous;
}

std::optional<ConfigurationValue> lookupConfiguration(std::string_view section, std::string_view key) {
  return installedLookup(section, key);
}

}  // namespace pc
