#include "env/line_source.h"

#include "platform/platform.h"

namespace pc {

CL8BFile::CL8BFile(std::FILE* stream) {
  state_.stream = stream;
  if (stream == nullptr) {
    state_.atEnd = true;
    return;
  }
  // The mark is looked for in the first three bytes; anything else is kept
  // to be read as the start of the first line.
  while (state_.pendingCount < 3) {
    const int c = std::getc(stream);
    if (c == EOF) break;
    state_.pending[state_.pendingCount++] = static_cast<unsigned char>(c);
  }
  if (state_.pendingCount == 3 && state_.pending[0] == 0xEF && state_.pending[1] == 0xBB &&
      state_.pending[2] == 0xBF) {
    state_.utf8Mark = true;
    state_.pendingCount = 0;
  }
}

CL8BFile::~CL8BFile() {
  if (state_.ownsStream && state_.stream != nullptr) std::fclose(state_.stream);
}

int CL8BFile::nextByte() {
  if (state_.pendingNext < state_.pendingCount) return state_.pending[state_.pendingNext++];
  return std::getc(state_.stream);
}

std::int64_t CL8BFile::hasMore() { return state_.atEnd ? 0 : state_.linesRead + 1; }

std::size_t CL8BFile::readLine(char* buffer, std::size_t size) {
  lineEnd_ = 0;
  if (buffer != nullptr && size > 0) buffer[0] = '\0';
  if (state_.atEnd) return 0;
  std::size_t full = 0;
  std::size_t stored = 0;
  int previous = EOF;
  for (;;) {
    const int c = nextByte();
    if (c == EOF) {
      state_.atEnd = true;
      break;
    }
    ++full;
    if (buffer != nullptr && stored + 1 < size) buffer[stored++] = static_cast<char>(c);
    if (c == '\n') {
      lineEnd_ = previous == '\r' ? 2 : 1;
      break;
    }
    previous = c;
  }
  if (buffer != nullptr && size > 0) {
    buffer[stored] = '\0';
    if (state_.utf8Mark) platform::utf8ToProcessCodePage(buffer, stored, size);
  }
  if (full > 0) ++state_.linesRead;
  return full;
}

}  // namespace pc
