// The tool parameter file "$TMP/outil.par" through the parameter reader: line
// reading, free-form numbers and integers, texts, the unit scale.
#include <cstddef>
#include <cstdint>
#include <span>

#include "fuzz_support.h"
#include "tool/tool_parameters.h"

namespace {

int stockAllowance(int, std::span<char> text) {
  constexpr char kValue[] = "0.25";
  for (std::size_t i = 0; i < text.size(); ++i) text[i] = i + 1 < sizeof kValue ? kValue[i] : ' ';
  return 1;
}
void inchScale(float* scale) { *scale = 25.4f; }

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  pc::fuzz::quietConsole();
  pc::fuzz::scratchDirectory();
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  pc::fuzz::useAsFile("outil.par", data, size);
  pc::ToolParameters block;
  pc::allocateToolParameters(block, 0);
  const int slotCount = pc::kParameterSlots;
  pc::readToolParameters(block.values.get(), block.texts.get(), pc::kParameterTextWidth, &slotCount,
                         pc::ParameterSources{stockAllowance, inchScale});
  return 0;
}
