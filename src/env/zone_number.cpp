// Work-zone number files. Both are text files named "workzone.num":
//
//   line 1   the number, written as exactly eight lowercase hexadecimal
//            digits ("%08x") and a newline; read from a first line of at most
//            79 characters
//   rest     ignored (a rewrite of the counter only replaces its start)
//
// "$TRXZONE/workzone.num" holds the zone's own number; the counter,
// "$TRXCONF/workzone.num" (or "$TRXHOME/client/trxconf/workzone.num" when
// TRXCONF cannot be expanded), holds the last number handed out. The counter
// is read, advanced and rewritten without a lock: two zones that start at
// the same moment may get the same number.
#include "env/zone_number.h"

#include <cstdio>
#include <cstring>

#include "env/diagnostic_channels.h"
#include "env/path_expander.h"
#include "platform/platform.h"

namespace pc {

namespace {

constexpr std::size_t kNameBufferSize = 512;
constexpr int kFirstLineSize = 80;  // 79 characters and the terminator

// Expands a "$VAR/workzone.num" template. A variable that expands to
// nothing would put the file at the root of the file system, so that counts
// as a failed expansion too.
int expandNumberFile(const char* pattern, std::string& name) {
  char buffer[kNameBufferSize];
  std::snprintf(buffer, sizeof buffer, "%s", pattern);
  const int code = expandNameInPlace(buffer, sizeof buffer);
  if (code != EXPAND_OK) return code;
  name = buffer;
  if (name == std::string(1, platform::nativeSeparator()) + "workzone.num") return EXPAND_UNDEFINED;
  return EXPAND_OK;
}

// Reads the first line (at most 79 characters); false when there is none.
bool readFirstLine(std::FILE* file, std::string& line) {
  char buffer[kFirstLineSize];
  if (std::fgets(buffer, sizeof buffer, file) == nullptr) return false;
  line = buffer;  // an embedded NUL ends the line here
  return true;
}

std::string withoutTrailingBlanks(std::string text) {
  while (!text.empty() && static_cast<unsigned char>(text.back()) <= 0x20) text.pop_back();
  return text;
}

bool isHexDigit(char c) { return (c >= '0' && c <= '9') || (c >= 'a' && c <= 'f') || (c >= 'A' && c <= 'F'); }

int hexDigitValue(char c) {
  if (c >= '0' && c <= '9') return c - '0';
  if (c >= 'a' && c <= 'f') return c - 'a' + 10;
  return c - 'A' + 10;
}

std::string formatNumber(std::uint32_t number) {
  char digits[16];
  std::snprintf(digits, sizeof digits, "%08x", static_cast<unsigned>(number));
  return digits;
}

bool isZoneNumber(const std::string& text) {
  if (text.empty()) return false;
  for (char c : text) {
    if (!isHexDigit(c)) return false;
  }
  return true;
}

std::optional<std::string> readZoneFile(const std::string& zoneFile) {
  std::FILE* file = std::fopen(zoneFile.c_str(), "r");
  if (file == nullptr) {
    fatal("Error opening file '" + zoneFile + "' for read access\n");
    return std::nullopt;
  }
  std::string line;
  const bool read = readFirstLine(file, line);
  std::fclose(file);
  line = withoutTrailingBlanks(line);
  // The number becomes a directory name: anything but hexadecimal digits
  // (binary garbage, separators, references) could lead outside $TRXTMP.
  if (!read || !isZoneNumber(line)) {
    fatal("Error reading file '" + zoneFile + "'\n");
    return std::nullopt;
  }
  return line;
}

std::optional<std::string> counterFileName() {
  std::string name;
  const char* primary = "$TRXCONF/workzone.num";
  const int code = expandNumberFile(primary, name);
  if (code == EXPAND_OK) return name;
  trace(std::string(primary) + " expansion error : " + std::to_string(code));
  if (expandNumberFile("$TRXHOME/client/trxconf/workzone.num", name) == EXPAND_OK) return name;
  fatal("TRXHOME is not defined\n");
  return std::nullopt;
}

// Takes the next number from the counter and gives it to the zone.
std::optional<std::string> assignZoneNumber(const std::string& zoneFile) {
  const auto counterFile = counterFileName();
  if (!counterFile) return std::nullopt;
  std::FILE* counter = std::fopen(counterFile->c_str(), "r+");
  if (counter == nullptr) {
    fatal("Error opening '" + *counterFile + "' file\n");
    return std::nullopt;
  }
  std::string line;
  if (!readFirstLine(counter, line)) {
    std::fclose(counter);
    fatal("Error reading '" + *counterFile + "' file\n");
    return std::nullopt;
  }
  const std::string number = formatNumber(nextZoneNumber(counterValue(line)));
  std::rewind(counter);
  const bool written = std::fprintf(counter, "%s\n", number.c_str()) > 0;
  if (std::fclose(counter) != 0 || !written) {
    // A counter left behind would hand this number out again.
    fatal("Error writing '" + *counterFile + "' file\n");
    return std::nullopt;
  }

  std::FILE* zone = std::fopen(zoneFile.c_str(), "w");
  if (zone == nullptr) {
    fatal("Error creating '" + zoneFile + "' file\n");
    return std::nullopt;
  }
  const bool zoneWritten = std::fprintf(zone, "%s\n", number.c_str()) > 0;
  if (std::fclose(zone) != 0 || !zoneWritten) {
    fatal("Error creating '" + zoneFile + "' file\n");
    return std::nullopt;
  }
  return number;
}

}  // namespace

std::optional<std::uint32_t> counterValue(std::string_view line) {
  std::size_t i = 0;
  while (i < line.size() && (line[i] == ' ' || (line[i] >= '\t' && line[i] <= '\r'))) ++i;
  const std::string_view prefix = line.substr(i, 2);
  if ((prefix == "0x" || prefix == "0X") && i + 2 < line.size() && isHexDigit(line[i + 2])) i += 2;
  if (i >= line.size() || !isHexDigit(line[i])) return std::nullopt;
  std::uint64_t value = 0;
  for (; i < line.size() && isHexDigit(line[i]); ++i) {
    value = value * 16 + static_cast<std::uint64_t>(hexDigitValue(line[i]));
    if (value > 0xffffffffu) value = 0xffffffffu;
  }
  return static_cast<std::uint32_t>(value);
}

std::uint32_t nextZoneNumber(std::optional<std::uint32_t> previous) {
  if (!previous || *previous == 0xffffffffu) return 1;
  return *previous + 1;
}

std::optional<std::string> zoneNumber() {
  std::string zoneFile;
  if (expandNumberFile("$TRXZONE/workzone.num", zoneFile) != EXPAND_OK) {
    fatal("TRXZONE is not defined\n");
    return std::nullopt;
  }
  if (platform::pathExists(zoneFile)) return readZoneFile(zoneFile);
  return assignZoneNumber(zoneFile);
}

}  // namespace pc
