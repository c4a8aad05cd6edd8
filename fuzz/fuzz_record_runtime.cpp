// The record I/O runtime over one file: unformatted records of several
// sizes with rewinds and backspaces, then the same bytes as formatted lines
// opened by name (opensq) and read value by value in free form.
#include <cstddef>
#include <cstdint>
#include <string>

#include "fileio/list_directed.h"
#include "fileio/record_runtime.h"
#include "fileio/sequential_open.h"
#include "fuzz_support.h"

namespace {

using namespace pc::fileio;

constexpr int kUnit = 3;
constexpr int kMaxReads = 4096;

void readUnformatted(const std::string& path) {
  if (openUnit(kUnit, path, OpenDisposition::Old, FileForm::Unformatted, UnitUse::Read) != kIoOk) return;
  unsigned char record[64];
  for (const std::size_t size : {std::size_t{12}, std::size_t{0}, std::size_t{18}}) {
    int reads = 0;
    while (reads++ < kMaxReads && readRecord(kUnit, record, size) == kIoOk) {
    }
    backspaceUnit(kUnit);
    backspaceUnit(kUnit);
    readRecord(kUnit, record, 4);
    rewindUnit(kUnit);
  }
  closeUnit(kUnit);
}

void readFormatted() {
  if (opensq(kUnit, "$TMP/fuzz.dat", 1) != 0) return;
  std::string line;
  int reads = 0;
  while (reads++ < kMaxReads && readTextRecord(kUnit, line) == kIoOk) {
    std::size_t pos = 0;
    float real = 0.0f;
    while (pos < line.size() && readListReal(line, pos, real) == kListValue) {
    }
    pos = 0;
    std::int32_t integer = 0;
    while (pos < line.size() && readListInteger(line, pos, integer) == kListValue) {
    }
    if (reads == 3) backspaceUnit(kUnit);
  }
  closeUnit(kUnit);
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  pc::fuzz::quietConsole();
  pc::fuzz::scratchDirectory();
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  pc::fuzz::useAsFile("fuzz.dat", data, size);
  readUnformatted(pc::fuzz::placeholderFile("fuzz.dat"));
  readFormatted();
  return 0;
}
