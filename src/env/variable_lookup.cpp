#include "env/variable_lookup.h"

#include "env/configuration_lookup.h"
#include "env/work_zone.h"
#include "platform/platform.h"

namespace pc {

namespace {

// A name that the environment cannot hold: asking for it would find some
// other variable ("A=B" would match the entry "A=B=...").
bool usableEnvironmentName(std::string_view name) {
  return !name.empty() && name.find('=') == std::string_view::npos &&
         name.find('\0') == std::string_view::npos;
}

// Configuration values keep the blanks that followed them on their line.
std::string withoutTrailingBlanks(std::string value) {
  std::size_t end = value.size();
  while (end > 0 && static_cast<unsigned char>(value[end - 1]) >= 0x01 &&
         static_cast<unsigned char>(value[end - 1]) <= 0x20) {
    --end;
  }
  value.resize(end);
  return value;
}

std::optional<FoundValue> fromConfiguration(std::string_view section, std::string_view key) {
  auto entry = lookupConfiguration(section, key);
  if (!entry) return std::nullopt;
  return FoundValue{withoutTrailingBlanks(std::move(entry->value)), std::move(entry->origin)};
}

}  // namespace

std::optional<FoundValue> findVariable(std::string_view name) {
  if (name == "TMP") {
    const bool fromEnvironment = platform::getEnv("TRXTMPDIR").has_value();
    auto directory = temporaryDirectory();
    if (!directory) return std::nullopt;
    return FoundValue{std::move(*directory),
                      fromEnvironment ? "from environment variable TRXTMPDIR" : "from work zone"};
  }
  if (usableEnvironmentName(name)) {
    if (auto value = platform::getEnv(std::string(name))) return FoundValue{std::move(*value), "from environment"};
  }
  return fromConfiguration("var", name);
}

std::optional<FoundValue> findPathList(std::string_view name) {
  const std::string variable = std::string(name) + "PATH";
  if (usableEnvironmentName(variable)) {
    if (auto value = platform::getEnv(variable)) {
      return FoundValue{std::move(*value), "from environment '" + variable + "'"};
    }
  }
  return fromConfiguration("path", name);
}

std::optional<std::string> lookupVariable(std::string_view name) {
  auto found = findVariable(name);
  if (!found) return std::nullopt;
  return std::move(found->value);
}

std::optional<std::string> lookupPathList(std::string_view name) {
  auto found = findPathList(name);
  if (!found) return std::nullopt;
  return std::move(found->value);
}

std::string undefinedValueText(std::string_view name) {
  const auto pattern = lookupVariable("TRXNULL");
  if (!pattern) return {};
  const std::size_t sigil = pattern->find('$');
  if (sigil == std::string::npos) return *pattern;
  return pattern->substr(0, sigil) + std::string(name) + pattern->substr(sigil + 1);
}

}  // namespace pc
