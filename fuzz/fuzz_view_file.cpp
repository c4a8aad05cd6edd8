// The view file of a frame: the reader of both layouts over the raw bytes,
// then the same bytes as the tool view file of toolpath 0 through the frame
// table (definition, unit scale, machine frame, relative matrices).
#include <cstddef>
#include <cstdint>
#include <cstdio>

#include "env/diagnostic_channels.h"
#include "fuzz_support.h"
#include "platform/platform.h"
#include "tool/frame_table.h"
#include "tool/tool_view.h"
#include "tool/view_file.h"

namespace {

void discard(const char*) {}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  pc::fuzz::quietConsole();
  pc::fuzz::scratchDirectory();
  // "read error" for most inputs: not worth a line on standard error each.
  pc::setWarningHandler(discard);
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static const std::uint8_t none = 0;
  if (std::FILE* stream = pc::platform::openMemoryStream(size > 0 ? data : &none, size)) {
    pc::readViewStream(stream);
    std::fclose(stream);
  }
  pc::fuzz::useAsFile("outil.mul", data, size);
  pc::resetFrameTable();
  pc::loadView(pc::kToolViewKind, 25.4, (pc::fuzz::scratchDirectory() + "/outil.mul").c_str());
  return 0;
}
