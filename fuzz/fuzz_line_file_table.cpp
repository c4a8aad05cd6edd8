// The line file table: a byte stream read line by line into buffers of the
// reader's width and of a few others.
#include <array>
#include <cstddef>
#include <cstdint>
#include <span>

#include "fuzz_support.h"
#include "tool/line_file_table.h"

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  pc::fuzz::quietConsole();
  pc::fuzz::scratchDirectory();
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  pc::fuzz::useAsFile("lines.txt", data, size);
  int handle = -1;
  int status = 0;
  pc::lineFileOpen(handle, pc::fuzz::placeholderFile("lines.txt"), 1, status);
  if (status != pc::kLineOk) return 0;
  std::array<char, 1100> buffer;
  constexpr std::size_t kWidths[] = {1000, 1, 0, 1100, 300};
  for (std::size_t line = 0; status == pc::kLineOk || status == pc::kLineTooLong; ++line) {
    pc::lineFileReadLine(handle, std::span<char>(buffer.data(), kWidths[line % 5]), status);
  }
  pc::lineFileClose(handle, status);
  return 0;
}
