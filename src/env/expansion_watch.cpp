#include "env/expansion_watch.h"

#include <cstdio>
#include <limits>
#include <optional>

#include "env/env_testing.h"
#include "platform/platform.h"

namespace pc {

namespace {

// Read like atoi: optional blanks and sign, then digits up to the first
// other character; garbage gives 0 and huge values are clamped.
std::int64_t decimalValue(const std::string& text) {
  std::size_t i = 0;
  while (i < text.size() && (text[i] == ' ' || (text[i] >= '\t' && text[i] <= '\r'))) ++i;
  bool negative = false;
  if (i < text.size() && (text[i] == '-' || text[i] == '+')) negative = text[i++] == '-';
  constexpr std::int64_t limit = std::numeric_limits<std::int32_t>::max();
  std::int64_t value = 0;
  for (; i < text.size() && text[i] >= '0' && text[i] <= '9'; ++i) {
    value = value * 10 + (text[i] - '0');
    if (value > limit) value = limit;
  }
  return negative ? -value : value;
}

std::vector<std::string> watchEntries(const std::string& text) {
  std::vector<std::string> entries;
  std::size_t start = 0;
  while (start <= text.size()) {
    std::size_t end = text.find_first_of(" |;", start);
    if (end == std::string::npos) end = text.size();
    if (end > start) entries.push_back(text.substr(start, end - start));
    start = end + 1;
  }
  return entries;
}

std::string baseName(const std::string& path) {
  const std::size_t cut = path.find_last_of(platform::nativeSeparator());
  return cut == std::string::npos ? path : path.substr(cut + 1);
}

ExpanderSettings computeSettings() {
  ExpanderSettings settings;
  if (auto minimum = platform::getEnv("TRX_EXPAND_MIN_BUFFER_SIZE")) settings.minimumBufferSize = decimalValue(*minimum);
  if (auto watch = platform::getEnv("TRX_EXPAND_WATCH")) settings.watchList = watchEntries(*watch);
  if (auto log = platform::getEnv("TRX_EXPAND_LOGFILE_NAME")) {
    settings.logFileName = *log;
  } else if (auto temp = platform::getEnv("TEMP")) {
    settings.logFileName = *temp + platform::nativeSeparator() + "tarnex_expand_log.txt";
  }
  if (auto executable = platform::executablePath()) settings.programName = baseName(*executable);
  return settings;
}

// Single-threaded program: a flag is the one-time guard.
std::optional<ExpanderSettings> settingsCache;

struct TimeStampCache {
  std::int64_t second = -1;
  std::string text;
};
TimeStampCache timeStampCache;

void appendToLog(const std::string& fileName, const std::string& line) {
  std::FILE* log = std::fopen(fileName.c_str(), "a");
  if (log == nullptr) return;  // a debugging aid must not disturb the run
  std::fputs(line.c_str(), log);
  std::fclose(log);
}

}  // namespace

const ExpanderSettings& expanderSettings() {
  if (!settingsCache) settingsCache = computeSettings();
  return *settingsCache;
}

std::string expansionTimeStamp() {
  const std::int64_t now = platform::currentTime();
  if (now != timeStampCache.second) {
    timeStampCache.second = now;
    const auto t = platform::localTime(now).value_or(platform::LocalTime{});
    char text[64];
    std::snprintf(text, sizeof text, "%04d-%02d-%02d@%02d:%02d:%02d", t.year, t.month, t.day, t.hour, t.minute,
                  t.second);
    timeStampCache.text = text;
  }
  return timeStampCache.text;
}

std::string expansionLogLine(const std::string& timeStamp, std::int64_t required, std::size_t size,
                             char format, const std::string& programName, const char* name) {
  std::string line = "[" + timeStamp + "] MinBufferSize=" + std::to_string(required) + " > " +
                     std::to_string(size) + " (";
  if (format == kFixedFieldFormat || format == kCStringFormat) {
    line += format;
  } else {
    line += "<UnknownStringFormat>";
  }
  line += ") " + programName + " expanding '" + (name != nullptr ? name : "<nullptr>") + "'\n";
  return line;
}

void watchBufferSize(const char* name, std::size_t size, char format) {
  const ExpanderSettings& settings = expanderSettings();
  if (settings.minimumBufferSize == 0) return;
  const std::int64_t magnitude =
      settings.minimumBufferSize < 0 ? -settings.minimumBufferSize : settings.minimumBufferSize;
  const std::int64_t required = magnitude + (format == kCStringFormat ? 1 : 0);
  if (static_cast<std::uint64_t>(required) <= size) return;
  if (!settings.logFileName.empty()) {
    appendToLog(settings.logFileName,
                expansionLogLine(expansionTimeStamp(), required, size, format, settings.programName, name));
  }
  if (settings.minimumBufferSize < 0) {
    platform::breakpointTrap();
    return;
  }
  if (name == nullptr) return;
  const std::string_view watched(name);
  for (const std::string& entry : settings.watchList) {
    if (watched.find(entry) != std::string_view::npos) {
      platform::breakpointTrap();
      return;
    }
  }
}

namespace env_testing {
void resetExpanderSettings() {
  settingsCache.reset();
  timeStampCache = TimeStampCache{};
}
}  // namespace env_testing

}  // namespace pc
