#include "tool/tool_naming.h"

#include <cstdio>
#include <string>

#include "env/fixed_field.h"
#include "env/path_expander.h"

namespace pc {

namespace {

constexpr int kRingSize = 5;
constexpr int kNumberTextSize = 10;

char numberRing[kRingSize][kNumberTextSize];
int ringIndex = 0;
char nameBuffer[160];
char pathBuffer[1024];

// A toolpath number packs an index (number mod 10000) and a sub-number
// (number / 10000), both truncated toward zero.
void writeNumberText(int number, char* out, std::size_t size) {
  const int index = number % 10000;
  const int sub = number / 10000;
  char text[32] = "";
  if (sub == 0 && number != 0) {
    std::snprintf(text, sizeof text, "%d", index);
  } else if (number != 0) {
    std::snprintf(text, sizeof text, "%d.%d", index, sub);
  }
  // Extreme numbers are cut to the caller's buffer instead of overrunning it.
  std::snprintf(out, size, "%.*s", static_cast<int>(size - 1), text);
}

char* nextRingBuffer() {
  char* buffer = numberRing[ringIndex];
  ringIndex = (ringIndex + 1) % kRingSize;
  return buffer;
}

const char* directoryOf(int number) { return number != 0 ? "$TRXZONE" : "$TMP"; }

}  // namespace

const char* toolNumberText(int number) {
  char* text = nextRingBuffer();
  writeNumberText(number, text, kNumberTextSize);
  return text;
}

const char* toolFilePath(int number, const char* extension) {
  const char* text = toolNumberText(number);
  std::snprintf(nameBuffer, sizeof nameBuffer, "outil%s%s", text, extension != nullptr ? extension : "");
  std::snprintf(pathBuffer, sizeof pathBuffer, "%s/%s", directoryOf(number), nameBuffer);
  expandNameInPlace(pathBuffer, sizeof pathBuffer);
  return pathBuffer;
}

int toolFilePathFixed(int number, std::span<char> out, std::string_view extension) {
  char text[32];
  writeNumberText(number, text, sizeof text);
  std::string name = std::string(directoryOf(number)) + "/outil" + text;
  name += fieldText(extension);
  const int code = expandFileName(name, out);
  // Left-justify: drop leading blanks of the expanded field.
  const std::string_view whole(out.data(), out.size());
  const auto first = whole.find_first_not_of(' ');
  if (first != std::string_view::npos && first > 0) {
    const std::string moved(whole.substr(first));
    setField(out, moved);
  }
  return code;
}

}  // namespace pc
