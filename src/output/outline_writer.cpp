#include "output/outline_writer.h"

#include <cstring>

#include "output/fixed_format.h"

namespace pc {

void writeResultLine(OutputFile& file, float x, float y, float z, std::int32_t code) {
  char* p = file.reserve(4 * kMaxFixedFieldChars);
  p = formatFixed3(p, x, 10);
  p = formatFixed3(p, y, 10);
  p = formatFixed3(p, z, 10);
  p = formatInteger(p, code, 6);
  *p++ = '\n';
  file.commit(p);
}

namespace {

// The end of a line, from the Z field on: the same for every point of an
// outline, so it is formatted once.
struct LineTail {
  char text[2 * kMaxFixedFieldChars];
  std::size_t length = 0;
  LineTail(float z, std::int32_t code) {
    char* p = formatInteger(formatFixed3(text, z, 10), code, 6);
    *p++ = '\n';
    length = static_cast<std::size_t>(p - text);
  }
};

void writeLine(OutputFile& file, float x, float y, const LineTail& tail) {
  char* p = file.reserve(2 * kMaxFixedFieldChars + sizeof tail.text);
  p = formatFixed3(formatFixed3(p, x, 10), y, 10);
  std::memcpy(p, tail.text, tail.length);
  file.commit(p + tail.length);
}

void writeSeparatorLine(OutputFile& file, SeparatorState& state, const LineTail& separatorTail) {
  if (state.lastWasSeparator) return;
  writeLine(file, kSeparatorValue, kSeparatorValue, separatorTail);
  state.lastWasSeparator = true;
}

}  // namespace

void writeOutlinePoints(OutputFile& file, const Point* points, std::int32_t count, float z, std::int32_t code,
                        SeparatorState& state) {
  const LineTail pointTail(z, code);
  const LineTail separatorTail(kSeparatorValue, kSeparatorLineCode);
  for (std::int32_t i = 0; i < count; ++i) {
    if (isPointEntry(points[i])) {
      writeLine(file, points[i].x, points[i].y, pointTail);
      state.lastWasSeparator = false;
    } else {
      writeSeparatorLine(file, state, separatorTail);
    }
  }
  writeSeparatorLine(file, state, separatorTail);
}

}  // namespace pc
